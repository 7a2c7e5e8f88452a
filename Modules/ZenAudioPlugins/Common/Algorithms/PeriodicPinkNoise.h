// Pink noise band-limited to 500 Hz - 2 kHz as a loop: one period built
// in the frequency domain (every bin in the band at 1/sqrt(f), so the
// power falls 3 dB per octave; random phases from a fixed seed; nothing
// outside the band) and scaled to an RMS of exactly 1 over the period. A
// loop has its stated level and slope over every whole period, with no
// filter settling. Each channel reads the loop from its own offset, so
// the channels are decorrelated.
//
// Process overwrites the channels with the noise.
#pragma once

#include <cstdint>
#include <vector>

#include "../ZenAudioAlgorithm.h"

class PeriodicPinkNoise : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    static constexpr double kLowHz = 500.0;
    static constexpr double kHighHz = 2000.0;
    // The period is the power of two at or above this (2^17 at 48 kHz).
    static constexpr double kMinPeriodSeconds = 2.5;
    // Channels read the loop this many equal steps apart.
    static constexpr std::uint32_t kOffsets = 32;
    static constexpr std::uint32_t kSeed = 20240517;

    PeriodicPinkNoise();

    // Builds the loop for the rate (an FFT of the period; allocates).
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    // Back to the start of the loop.
    void Reset() override;
    bool Process(float* const* channels, std::uint64_t count) override;
    // Channel `channel`'s next `count` samples; every channel advances together in Process only.
    void Read(std::uint64_t channel, float* out, std::uint64_t count) const noexcept;
    void Advance(std::uint64_t count) noexcept { m_position = (m_position + count) % m_loop.size(); }

    std::size_t GetPeriod() const { return m_loop.size(); }
    const std::vector<float>& Loop() const { return m_loop; }

private:
    std::vector<float> m_loop;
    std::size_t m_position = 0;
};
