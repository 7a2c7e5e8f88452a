#include "AudioFile.h"

#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <cctype>
#include <fstream>
#include <map>

#include "ZenfxError.h"

namespace zenfx {

namespace {

std::string Extension(const std::string& path) {
    const std::size_t slash = path.find_last_of('/');
    const std::size_t dot = path.find_last_of('.');
    if (dot == std::string::npos || (slash != std::string::npos && dot < slash)) return {};
    std::string ext = path.substr(dot + 1);
    std::transform(ext.begin(), ext.end(), ext.begin(), [](unsigned char c) { return std::tolower(c); });
    return ext;
}

const std::map<std::string, int>& Containers() {
    static const std::map<std::string, int> containers = {
        {"wav", SF_FORMAT_WAV}, {"w64", SF_FORMAT_W64}, {"flac", SF_FORMAT_FLAC}, {"aif", SF_FORMAT_AIFF},
        {"aiff", SF_FORMAT_AIFF}, {"caf", SF_FORMAT_CAF}, {"au", SF_FORMAT_AU}, {"ogg", SF_FORMAT_OGG},
    };
    return containers;
}

const std::map<std::string, int>& SampleFormats() {
    static const std::map<std::string, int> formats = {
        {"pcm16", SF_FORMAT_PCM_16}, {"pcm24", SF_FORMAT_PCM_24}, {"pcm32", SF_FORMAT_PCM_32},
        {"float", SF_FORMAT_FLOAT},  {"double", SF_FORMAT_DOUBLE},
    };
    return formats;
}

std::string Lower(std::string text) {
    std::transform(text.begin(), text.end(), text.begin(), [](unsigned char c) { return std::tolower(c); });
    return text;
}

std::uint32_t LittleEndian32(const unsigned char* bytes) {
    return bytes[0] | (bytes[1] << 8) | (bytes[2] << 16) | (static_cast<std::uint32_t>(bytes[3]) << 24);
}

// Frames the 'data' chunk of a RIFF WAVE file declares, or -1 when the
// header does not say (a stream written without sizes, another layout).
std::int64_t DeclaredWaveFrames(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    unsigned char header[12];
    if (!file.read(reinterpret_cast<char*>(header), 12) || std::memcmp(header, "RIFF", 4) != 0 ||
        std::memcmp(header + 8, "WAVE", 4) != 0)
        return -1;
    std::uint32_t blockAlign = 0;
    unsigned char chunk[8];
    while (file.read(reinterpret_cast<char*>(chunk), 8)) {
        const std::uint32_t size = LittleEndian32(chunk + 4);
        if (std::memcmp(chunk, "data", 4) == 0) {
            if (blockAlign == 0 || size == 0 || size == 0xFFFFFFFFu) return -1;
            return size / blockAlign;
        }
        if (std::memcmp(chunk, "fmt ", 4) == 0 && size >= 14) {
            unsigned char format[14];
            if (!file.read(reinterpret_cast<char*>(format), 14)) return -1;
            blockAlign = static_cast<std::uint32_t>(format[12] | (format[13] << 8));
            file.seekg(size - 14 + (size & 1), std::ios::cur);
        } else {
            file.seekg(size + (size & 1), std::ios::cur);  // chunks are padded to even sizes
        }
    }
    return -1;
}

bool Storable(int format) {
    SF_INFO info{};
    info.samplerate = 48000;
    info.channels = 2;
    info.format = format;
    return sf_format_check(&info) != 0;
}

}  // namespace

AudioFileReader::AudioFileReader(const std::string& path) : m_path(path) {
    // libsndfile words a missing file as a system error; say it plainly.
    if (access(path.c_str(), R_OK) != 0) throw ZenfxError("cannot read '" + path + "': " + std::strerror(errno));
    m_file = sf_open(path.c_str(), SFM_READ, &m_info);
    if (m_file == nullptr) throw ZenfxError("cannot read '" + path + "': " + sf_strerror(nullptr));
    if (m_info.channels < 1) throw ZenfxError("cannot read '" + path + "': it has no audio channels");
    m_declaredFrames = m_info.frames;
    const int container = m_info.format & SF_FORMAT_TYPEMASK;
    if (container == SF_FORMAT_WAV || container == SF_FORMAT_WAVEX)
        m_declaredFrames = std::max<std::int64_t>(m_info.frames, DeclaredWaveFrames(path));
}

AudioFileReader::~AudioFileReader() {
    if (m_file != nullptr) sf_close(m_file);
}

std::int64_t AudioFileReader::Read(float* interleaved, std::int64_t frames) {
    return sf_readf_float(m_file, interleaved, frames);
}

AudioFileWriter::AudioFileWriter(const std::string& path, int sampleRate, int channels, int format)
    : m_path(path), m_file(path) {
    SF_INFO info{};
    info.samplerate = sampleRate;
    info.channels = channels;
    info.format = format;
    if (sf_format_check(&info) == 0)
        throw ZenfxError("cannot write '" + path + "': " + DescribeFormat(format) + " cannot hold " +
                         std::to_string(channels) + " channels at " + std::to_string(sampleRate) + " Hz");
    m_sound = sf_open_fd(m_file.Descriptor(), SFM_WRITE, &info, SF_TRUE);
    if (m_sound == nullptr) throw ZenfxError("cannot write '" + path + "': " + sf_strerror(nullptr));
    m_file.ReleaseDescriptor();
    // Integer formats clip instead of wrapping around.
    sf_command(m_sound, SFC_SET_CLIPPING, nullptr, SF_TRUE);
}

AudioFileWriter::~AudioFileWriter() {
    if (m_sound != nullptr) sf_close(m_sound);
}

void AudioFileWriter::Write(const float* interleaved, std::int64_t frames) {
    errno = 0;
    if (sf_writef_float(m_sound, interleaved, frames) != frames) {
        // libsndfile keeps the system's reason ("No space left on device") in its log, not its error text.
        const std::string reason = errno != 0 ? std::strerror(errno) : sf_strerror(m_sound);
        throw ZenfxError("cannot write '" + m_path + "': " + reason);
    }
}

void AudioFileWriter::Close() {
    if (m_sound == nullptr) return;
    errno = 0;
    const int status = sf_close(m_sound);
    m_sound = nullptr;
    if (status != 0)
        throw ZenfxError("cannot write '" + m_path + "': " + (errno != 0 ? std::strerror(errno) : sf_error_number(status)));
}

void AudioFileWriter::Commit() {
    Close();
    m_file.Commit();
}

int ChooseOutputFormat(const std::string& outputPath, int inputFormat, const std::string& formatOption) {
    const std::string ext = Extension(outputPath);
    if (ext.empty())
        throw ZenfxError("cannot write '" + outputPath +
                         "': it has no extension to tell the file type (use .wav, .flac, .aiff, .w64, .caf, .au or .ogg)");
    const auto container = Containers().find(ext);
    if (container == Containers().end())
        throw ZenfxError("cannot write '" + outputPath + "': unknown file type '." + ext +
                         "' (use .wav, .flac, .aiff, .w64, .caf, .au or .ogg)");
    if (container->second == SF_FORMAT_OGG) {
        if (!formatOption.empty()) throw ZenfxError("--format does not apply to Ogg Vorbis output");
        return SF_FORMAT_OGG | SF_FORMAT_VORBIS;
    }
    if (!formatOption.empty()) {
        const auto sample = SampleFormats().find(Lower(formatOption));
        if (sample == SampleFormats().end())
            throw ZenfxError("unknown --format '" + formatOption + "' (pcm16, pcm24, pcm32, float or double)");
        const int format = container->second | sample->second;
        if (!Storable(format))
            throw ZenfxError("cannot write '" + outputPath + "': ." + ext + " files cannot hold " + formatOption +
                             " samples");
        return format;
    }
    const int same = container->second | (inputFormat & SF_FORMAT_SUBMASK);
    if ((inputFormat & SF_FORMAT_SUBMASK) != 0 && Storable(same)) return same;
    return container->second | SF_FORMAT_PCM_24;
}

std::string DescribeFormat(int format) {
    SF_FORMAT_INFO info{};
    info.format = format & SF_FORMAT_TYPEMASK;
    std::string text = sf_command(nullptr, SFC_GET_FORMAT_INFO, &info, sizeof(info)) == 0 ? info.name : "audio";
    SF_FORMAT_INFO sub{};
    sub.format = format & SF_FORMAT_SUBMASK;
    if (sf_command(nullptr, SFC_GET_FORMAT_INFO, &sub, sizeof(sub)) == 0) text += std::string(", ") + sub.name;
    return text;
}

std::vector<float> ReadFrames(AudioSource& source, std::int64_t frames) {
    if (frames <= 0) return {};
    const auto channels = static_cast<std::size_t>(source.Channels());
    std::vector<float> samples(static_cast<std::size_t>(std::max<std::int64_t>(frames, 0)) * channels);
    const std::int64_t got = source.Read(samples.data(), frames);
    samples.resize(static_cast<std::size_t>(std::max<std::int64_t>(got, 0)) * channels);
    return samples;
}

}  // namespace zenfx
