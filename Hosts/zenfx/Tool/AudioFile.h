// Audio files through libsndfile: a reader, a writer that commits through an
// AtomicFile, and the choice of the output's format.
#pragma once

#include <sndfile.h>

#include <cstdint>
#include <string>
#include <vector>

#include "HostCore/Settings/AtomicFile.h"

namespace zenfx {

// Where samples come from: a file or the built-in demo material.
class AudioSource {
public:
    virtual ~AudioSource() = default;
    virtual int SampleRate() const = 0;
    virtual int Channels() const = 0;
    virtual std::int64_t Frames() const = 0;
    // What the file's header promises; more than Frames() when it was cut off.
    virtual std::int64_t DeclaredFrames() const { return Frames(); }
    virtual int Format() const = 0;  // libsndfile format of the source
    virtual std::string Description() const = 0;
    // Interleaved frames; returns the count read (0 at the end).
    virtual std::int64_t Read(float* interleaved, std::int64_t frames) = 0;
};

class AudioFileReader final : public AudioSource {
public:
    // Throws ZenfxError naming the file and libsndfile's reason.
    explicit AudioFileReader(const std::string& path);
    ~AudioFileReader() override;

    int SampleRate() const override { return m_info.samplerate; }
    int Channels() const override { return m_info.channels; }
    std::int64_t Frames() const override { return m_info.frames; }
    std::int64_t DeclaredFrames() const override { return m_declaredFrames; }
    int Format() const override { return m_info.format; }
    std::string Description() const override { return "'" + m_path + "'"; }
    std::int64_t Read(float* interleaved, std::int64_t frames) override;

private:
    std::string m_path;
    SF_INFO m_info{};
    SNDFILE* m_file = nullptr;
    std::int64_t m_declaredFrames = 0;
};

class AudioFileWriter {
public:
    // Opens a temporary file beside `path`; the output appears at `path`
    // only on Commit. Throws ZenfxError or HostError.
    AudioFileWriter(const std::string& path, int sampleRate, int channels, int format);
    ~AudioFileWriter();

    void Write(const float* interleaved, std::int64_t frames);
    // Completes the file (headers, flush) without putting it in place, so a
    // run can finish every output before it replaces any.
    void Close();
    // Closes if still open and renames the file into place.
    void Commit();

private:
    std::string m_path;
    zen::host::AtomicFile m_file;
    SNDFILE* m_sound = nullptr;
};

// The libsndfile format for an output path: the container from the
// extension (.wav .w64 .flac .aif/.aiff .caf .au .ogg) and the sample format
// from `formatOption` (pcm16, pcm24, pcm32, float, double) or, when empty,
// the input's own if the container stores it (float input stays float),
// else 24-bit. Format names take any case. Throws ZenfxError for a missing or
// unknown extension or a sample format the container cannot store.
int ChooseOutputFormat(const std::string& outputPath, int inputFormat, const std::string& formatOption);

// Up to `frames` interleaved frames from the source's current position.
std::vector<float> ReadFrames(AudioSource& source, std::int64_t frames);

// "WAV float", "FLAC 24-bit", ...
std::string DescribeFormat(int format);

}  // namespace zenfx
