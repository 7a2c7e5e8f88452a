// One sounding take: reads its sound at any speed with four-point Hermite
// interpolation and adds it to the output. A voice that is stolen fades out
// over a few milliseconds instead of stopping with a click.
#pragma once

#include <cstdint>

#include "FoleySound.h"

class FoleyVoice {
public:
    // `increment`: source samples per output sample (> 0).
    void Start(const FoleySound* sound, double increment, float gain, std::uint64_t order) noexcept;
    // Fades to silence over `frames` output samples, then stops.
    void Release(std::uint32_t frames) noexcept;
    void Stop() noexcept { m_sound = nullptr; }

    bool IsActive() const noexcept { return m_sound != nullptr; }
    bool IsReleasing() const noexcept { return m_fadeStep > 0.0f; }
    // Trigger order: lower is older.
    std::uint64_t Order() const noexcept { return m_order; }

    // Adds the next `frames` samples into one or two output channels: a mono
    // take goes to both, a stereo take to one channel is summed at half level.
    void Render(float* const* out, std::uint32_t channels, std::uint32_t frames) noexcept;

private:
    const FoleySound* m_sound = nullptr;
    double m_position = 0.0;
    double m_increment = 1.0;
    float m_gain = 1.0f;
    float m_fade = 1.0f;
    float m_fadeStep = 0.0f;
    std::uint64_t m_order = 0;
};
