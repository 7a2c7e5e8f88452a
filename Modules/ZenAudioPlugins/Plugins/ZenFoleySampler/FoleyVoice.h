// One sounding take: reads its sound at any speed with four-point Hermite
// interpolation (a plain copy when it plays at its own speed) and adds it
// to the sampler's buses. A voice that is stolen fades out over a few
// milliseconds instead of stopping with a click.
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

    // Adds the next `frames` samples: a mono take into `mono`, a stereo take
    // into `left` and `right`.
    void Render(float* mono, float* left, float* right, std::uint32_t frames) noexcept;

private:
    // Source position in 32.32 fixed point: exact steps, and the whole part
    // and fraction without a float-to-integer conversion.
    static constexpr double kOne = 4294967296.0;

    std::uint32_t FramesLeft(std::uint32_t frames) const noexcept;

    const FoleySound* m_sound = nullptr;
    std::uint64_t m_position = 0;
    std::uint64_t m_increment = 1;
    float m_gain = 1.0f;
    float m_fade = 1.0f;
    float m_fadeStep = 0.0f;
    std::uint64_t m_order = 0;
};
