// A device whose inputs are read from an audio file and whose outputs are
// written to one, through libsndfile. Without an input file the inputs are
// silent; the output file appears whole when Run returns, never in part
// (it is written beside the destination and renamed).
#pragma once

#include <memory>
#include <string>

#include "AudioDevice.h"

namespace zen::host {

class FileDevice : public AudioDevice {
public:
    // With an input file, its rate and channel count replace the format's.
    // The output's container follows its extension (.wav .w64 .caf .aiff
    // .au as 32-bit float, .flac as 24-bit). Throws HostError naming the
    // file and the reason.
    FileDevice(const std::string& inputPath, const std::string& outputPath, DeviceFormat format);
    ~FileDevice() override;

    std::string Name() const override { return "file"; }
    // Frames of the input file; 0 without one.
    std::uint64_t InputFrames() const;
    // Runs `frames` frames, 0 for the whole input file, and commits the
    // output file.
    std::uint64_t Run(AudioCallback& callback, std::uint64_t frames) override;

    // The libsndfile format for an output path; throws HostError.
    static int OutputFormat(const std::string& path);

private:
    struct Files;
    std::unique_ptr<Files> m_files;
    std::string m_outputPath;
};

}  // namespace zen::host
