#include "FileDevice.h"

#include <sndfile.h>
#include <strings.h>

#include <algorithm>
#include <vector>

#include "DeviceBuffers.h"
#include "HostCore/HostError.h"
#include "HostCore/Settings/AtomicFile.h"

namespace zen::host {

struct FileDevice::Files {
    SNDFILE* input = nullptr;
    SF_INFO inputInfo{};
    SNDFILE* output = nullptr;
    std::unique_ptr<AtomicFile> outputFile;

    ~Files() {
        if (input != nullptr) sf_close(input);
        if (output != nullptr) sf_close(output);
    }
};

namespace {

DeviceFormat WithInput(const std::string& inputPath, DeviceFormat format, SNDFILE*& file, SF_INFO& info) {
    if (inputPath.empty()) {
        format.inputs = 0;
        return format;
    }
    file = sf_open(inputPath.c_str(), SFM_READ, &info);
    if (file == nullptr) throw HostError("cannot read '" + inputPath + "': " + sf_strerror(nullptr));
    format.sampleRate = info.samplerate;
    format.inputs = static_cast<std::uint32_t>(info.channels);
    return format;
}

}  // namespace

int FileDevice::OutputFormat(const std::string& path) {
    const std::size_t dot = path.find_last_of('.');
    const std::string extension = dot == std::string::npos ? "" : path.substr(dot + 1);
    struct Container {
        const char* extension;
        int format;
    };
    static const Container kContainers[] = {
        {"wav", SF_FORMAT_WAV | SF_FORMAT_FLOAT},   {"w64", SF_FORMAT_W64 | SF_FORMAT_FLOAT},
        {"caf", SF_FORMAT_CAF | SF_FORMAT_FLOAT},   {"aiff", SF_FORMAT_AIFF | SF_FORMAT_FLOAT},
        {"aif", SF_FORMAT_AIFF | SF_FORMAT_FLOAT},  {"au", SF_FORMAT_AU | SF_FORMAT_FLOAT},
        {"flac", SF_FORMAT_FLAC | SF_FORMAT_PCM_24}};
    for (const Container& c : kContainers)
        if (strcasecmp(c.extension, extension.c_str()) == 0) return c.format;
    throw HostError("'" + path + "': unknown audio file type (.wav .w64 .caf .aiff .au .flac)");
}

FileDevice::FileDevice(const std::string& inputPath, const std::string& outputPath, DeviceFormat format)
    : AudioDevice(format), m_files(std::make_unique<Files>()), m_outputPath(outputPath) {
    m_format = WithInput(inputPath, format, m_files->input, m_files->inputInfo);
    if (outputPath.empty()) return;
    SF_INFO info{};
    info.samplerate = m_format.sampleRate;
    info.channels = static_cast<int>(m_format.outputs);
    info.format = OutputFormat(outputPath);
    if (m_format.outputs == 0 || !sf_format_check(&info))
        throw HostError("'" + outputPath + "' cannot hold " + std::to_string(m_format.outputs) + " channels at " +
                        std::to_string(m_format.sampleRate) + " Hz");
    m_files->outputFile = std::make_unique<AtomicFile>(outputPath);
    m_files->output = sf_open_fd(m_files->outputFile->Descriptor(), SFM_WRITE, &info, SF_TRUE);
    if (m_files->output == nullptr) throw HostError("cannot write '" + outputPath + "': " + sf_strerror(nullptr));
    m_files->outputFile->ReleaseDescriptor();
}

FileDevice::~FileDevice() = default;

std::uint64_t FileDevice::InputFrames() const {
    return m_files->input != nullptr ? static_cast<std::uint64_t>(m_files->inputInfo.frames) : 0;
}

std::uint64_t FileDevice::Run(AudioCallback& callback, std::uint64_t frames) {
    if (frames == 0) frames = InputFrames();
    const std::uint32_t block = m_format.blockSize;
    DeviceBuffers inputs(m_format.inputs, block), outputs(m_format.outputs, block);
    std::vector<float> interleaved(static_cast<std::size_t>(block) * std::max(m_format.inputs, m_format.outputs));
    std::uint64_t done = 0;
    while (done < frames) {
        const auto n = static_cast<std::uint32_t>(std::min<std::uint64_t>(block, frames - done));
        inputs.Clear(n);
        outputs.Clear(n);
        if (m_files->input != nullptr) {
            const sf_count_t read = sf_readf_float(m_files->input, interleaved.data(), n);
            for (sf_count_t i = 0; i < read; ++i)
                for (std::uint32_t c = 0; c < m_format.inputs; ++c)
                    inputs.Channel(c)[i] = interleaved[static_cast<std::size_t>(i) * m_format.inputs + c];
        }
        callback.ProcessBlock(inputs.ConstPointers(), outputs.Pointers(), n);
        if (m_files->output != nullptr) {
            for (std::uint32_t i = 0; i < n; ++i)
                for (std::uint32_t c = 0; c < m_format.outputs; ++c)
                    interleaved[static_cast<std::size_t>(i) * m_format.outputs + c] = outputs.Channel(c)[i];
            if (sf_writef_float(m_files->output, interleaved.data(), n) != n)
                throw HostError("cannot write '" + m_outputPath + "': " + sf_strerror(m_files->output));
        }
        done += n;
    }
    if (m_files->output != nullptr) {
        const int closed = sf_close(m_files->output);
        m_files->output = nullptr;
        if (closed != 0) throw HostError("cannot write '" + m_outputPath + "': " + sf_error_number(closed));
        m_files->outputFile->Commit();
    }
    return done;
}

}  // namespace zen::host
