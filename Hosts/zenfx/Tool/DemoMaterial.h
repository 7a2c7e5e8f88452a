// Built-in demo material, made in code: a few seconds of speech-like sound
// (voiced syllables with moving formants, sibilants and plosives) followed by
// music-like sound (a chord with bass, kick, snare and hi-hat), stereo.
#pragma once

#include <cstdint>
#include <vector>

#include "AudioFile.h"

namespace zenfx {

class DemoMaterial final : public AudioSource {
public:
    static constexpr int kSampleRate = 48000;
    static constexpr int kChannels = 2;
    static constexpr double kSpeechSeconds = 3.0;
    static constexpr double kMusicSeconds = 3.0;

    DemoMaterial();

    int SampleRate() const override { return kSampleRate; }
    int Channels() const override { return kChannels; }
    std::int64_t Frames() const override { return static_cast<std::int64_t>(m_samples.size() / kChannels); }
    int Format() const override;
    std::string Description() const override { return "the built-in demo material"; }
    std::int64_t Read(float* interleaved, std::int64_t frames) override;

    const std::vector<float>& Interleaved() const { return m_samples; }

private:
    std::vector<float> m_samples;  // interleaved
    std::size_t m_position = 0;    // in samples
};

}  // namespace zenfx
