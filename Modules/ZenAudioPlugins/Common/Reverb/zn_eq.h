// The reverb's two-band tone control: a low shelf then a high shelf, each a
// BiQuad on every channel. A band is redesigned only when its values change;
// a change glides (gain in dB, frequency in octaves, at a bounded rate, the
// band redesigned every kGlideChunk samples) so that a jump in the settings
// does not click. BiQuad designs each band; both bands run on every channel
// at once on the BiquadPair kernel.
#pragma once

#include <cstdint>

#include "Algorithms/BiquadPair.h"
#include "Common/Algorithms/BiQuad.h"
#include "Common/ZenAudioAlgorithm.h"
#include "zn_eq_param.h"

namespace zen::reverb {

class zn_eq : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    static constexpr double kGlideDbPerSecond = 120.0;
    static constexpr double kGlideOctavesPerSecond = 12.0;
    static constexpr std::uint64_t kGlideChunk = 16;
    static constexpr std::uint64_t kMaxChannels = ora::numeric::BiquadPairState::kMaxLanes;
    static constexpr float kMinimumGain = 1e-6f;  // -120 dB

    zn_eq();

    // Both bands at the settings' values at once; filter state cleared.
    bool Prepare(float sampleRate, std::uint32_t maxBlock) override;
    void SetChannelCount(std::uint64_t channels) override;
    // New targets; the first settings after Prepare or Reset apply at once.
    void Configure(const zn_eq_param& param) noexcept;
    bool Process(float* const* channels, std::uint64_t count) override;
    void Reset() override;

    const zn_eq_param& Current() const { return m_current; }
    const BiQuad& LowBand() const { return m_low; }
    const BiQuad& HighBand() const { return m_high; }
    // Designs so far, for tests of "unchanged bands are not redesigned".
    std::uint64_t DesignCount() const { return m_designs; }

private:
    void Design(BiQuad& band, const zn_eq_param::Band& values);
    // Moves `current` toward `target` by at most the glide of `count` samples; true if it moved.
    bool Glide(zn_eq_param::Band& current, const zn_eq_param::Band& target, std::uint64_t count) const;

    BiQuad m_low;
    BiQuad m_high;
    ora::numeric::BiquadPair m_pair;
    ora::numeric::BiquadPairState m_state;
    zn_eq_param m_current;
    zn_eq_param m_target;
    bool m_settled = true;  // the next Configure applies at once
    std::uint64_t m_designs = 0;
};

}  // namespace zen::reverb
