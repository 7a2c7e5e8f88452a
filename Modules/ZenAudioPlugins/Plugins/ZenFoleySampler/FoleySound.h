// One recorded or synthesised take: planar float samples at their own rate,
// padded with silence on both sides so a voice can interpolate across the
// ends without a bounds check.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

class FoleySound {
public:
    // Zeros kept before the first and after the last sample.
    static constexpr std::size_t kLeadPad = 1;
    static constexpr std::size_t kTailPad = 3;
    // Longer files are refused: a sampler of one-shots, not a playback deck.
    static constexpr double kMaxSeconds = 120.0;

    FoleySound() = default;
    // `channels` holds one or two equally long channels.
    FoleySound(std::string name, double sampleRate, const std::vector<std::vector<float>>& channels);

    // Decodes a WAV, FLAC or any file libsndfile reads. False with `error`
    // set (the reason, without the path) when it cannot.
    static bool Load(const std::string& path, FoleySound& out, std::string& error);

    const std::string& Name() const { return m_name; }
    double SampleRate() const { return m_sampleRate; }
    std::uint32_t Channels() const { return static_cast<std::uint32_t>(m_data.size()); }
    std::uint64_t Frames() const { return m_frames; }
    double Seconds() const { return static_cast<double>(m_frames) / m_sampleRate; }
    // Points at the lead pad: sample i of the sound is Data(c)[i + kLeadPad].
    const float* Data(std::uint32_t channel) const { return m_data[channel].data(); }

private:
    std::string m_name;
    double m_sampleRate = 48000.0;
    std::uint64_t m_frames = 0;
    std::vector<std::vector<float>> m_data;
};
