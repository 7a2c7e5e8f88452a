// FSIG to magnitude (SFEAT), squared magnitude (MAG2) and phase (PHASE_IN)
// of every reconstructed row. With a shared row, that row describes all
// channels together: its magnitude is their total, its phase that of their
// sum (of the first channel where the sum cancels); the channels' own rows
// are then left alone, as nothing after needs them (Polar2Rect turns each
// channel's bins by the shared row's change of phase).
#pragma once

#include "FFT/Plugin.h"

namespace ora::fft {

class Rect2Polar final : public Plugin {
public:
    // Below this share of the total magnitude the channels' sum has no
    // trustworthy phase (anti-phase material).
    static constexpr float kCancellation = 1e-3f;

    Rect2Polar() : Plugin(plugin::PROCESS) {}
    const char* Name() const override { return "Rect2Polar"; }
    bool Configure(Frame& frame, const Context& context) override;
    void Process(Frame& frame, Context& context) noexcept override;

    // The bin whose phase is the shared row's phase at bin k of
    // `channels` rows of `bins`, and the channels' total power there.
    static Complex SharedReference(const Complex* fsig, std::size_t channels, std::size_t bins, std::size_t k,
                                   float& power) noexcept {
        Complex sum{0.0f, 0.0f};
        power = 0.0f;
        for (std::size_t c = 0; c < channels; ++c) {
            const Complex x = fsig[c * bins + k];
            sum += x;
            power += x.real() * x.real() + x.imag() * x.imag();
        }
        const float sumPower = sum.real() * sum.real() + sum.imag() * sum.imag();
        return sumPower > kCancellation * kCancellation * power ? sum : fsig[k];
    }

private:
    AlignedBuffer<Complex> m_reference;  // the shared row's bins
};

}  // namespace ora::fft
