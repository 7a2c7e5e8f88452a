#include "FoleySound.h"

#include <sndfile.h>

#include <algorithm>
#include <cmath>

FoleySound::FoleySound(std::string name, double sampleRate, const std::vector<std::vector<float>>& channels)
    : m_name(std::move(name)), m_sampleRate(sampleRate), m_frames(channels.empty() ? 0 : channels[0].size()) {
    for (const auto& channel : channels) {
        std::vector<float> padded(kLeadPad + m_frames + kTailPad, 0.0f);
        std::copy(channel.begin(), channel.end(), padded.begin() + kLeadPad);
        m_data.push_back(std::move(padded));
    }
}

bool FoleySound::Load(const std::string& path, FoleySound& out, std::string& error) {
    SF_INFO info{};
    SNDFILE* file = sf_open(path.c_str(), SFM_READ, &info);
    if (file == nullptr) {
        error = sf_strerror(nullptr);
        return false;
    }
    struct Closer {
        SNDFILE* file;
        ~Closer() { sf_close(file); }
    } closer{file};
    if (info.channels < 1 || info.channels > 2) {
        error = std::to_string(info.channels) + " channels (mono or stereo only)";
        return false;
    }
    if (info.frames <= 0) {
        error = "no samples";
        return false;
    }
    if (static_cast<double>(info.frames) > kMaxSeconds * info.samplerate) {
        error = "longer than " + std::to_string(static_cast<int>(kMaxSeconds)) + " s";
        return false;
    }
    const auto frames = static_cast<std::size_t>(info.frames);
    const auto channelCount = static_cast<std::size_t>(info.channels);
    std::vector<float> interleaved(frames * channelCount);
    const sf_count_t got = sf_readf_float(file, interleaved.data(), info.frames);
    if (got != info.frames) {
        error = "truncated after " + std::to_string(got) + " of " + std::to_string(info.frames) + " frames";
        return false;
    }
    std::vector<std::vector<float>> channels(channelCount, std::vector<float>(frames));
    for (std::size_t i = 0; i < frames; ++i) {
        for (std::size_t c = 0; c < channelCount; ++c) {
            const float x = interleaved[i * channelCount + c];
            if (!std::isfinite(x)) {
                error = "non-finite sample at frame " + std::to_string(i);
                return false;
            }
            channels[c][i] = x;
        }
    }
    const std::size_t slash = path.find_last_of('/');
    out = FoleySound(slash == std::string::npos ? path : path.substr(slash + 1), info.samplerate, channels);
    return true;
}
