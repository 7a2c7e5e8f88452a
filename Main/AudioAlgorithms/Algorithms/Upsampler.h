// Polyphase FIR interpolation by 2, 4 or 8: each input sample becomes
// `factor` output samples, out[n L + p] = sum_k L h[k L + p] x[n - k], with h
// a low-pass prototype at the high rate (unit DC gain). The group delay is
// (taps - 1) / 2 output samples.
//
// The vector forms run across output samples (phases side by side, input
// samples repeated per phase), so each output is summed in the same order as
// in the reference form: the plain forms agree with it bit for bit, the fused
// forms to a rounding per tap.
#pragma once

#include <cstddef>
#include <memory>
#include <vector>

#include "System/AlignedBuffer.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

struct UpsamplerConfig {
    std::size_t factor = 2;             // 2, 4 or 8
    std::size_t tapsPerPhase = 32;      // used when no prototype is given
    std::vector<float> prototype;       // empty: a Kaiser low-pass for the factor
    std::size_t channels = 1;           // interleaved; vector forms for 1
    std::size_t maxInputFrames = 1024;  // the longest block Process takes
};

struct UpsamplerState {
    std::size_t factor = 0;
    std::size_t taps = 0;         // per phase
    std::size_t channels = 0;
    std::size_t maxInput = 0;
    std::size_t tableWidth = 0;   // max(8, factor)
    AlignedBuffer<float> table;   // taps x tableWidth: table[k w + j] = L h[k L + j mod L]
    AlignedBuffer<float> history; // per channel, the last taps - 1 inputs, oldest first
    AlignedBuffer<float> scratch; // the vector forms' repeated input
};

class UpsamplerImpl {
public:
    virtual ~UpsamplerImpl();
    virtual void Process(UpsamplerState& state, const float* in, float* out, std::size_t frames) const noexcept = 0;
};

class Upsampler {
public:
    // Throws std::invalid_argument for a factor other than 2, 4, 8 or no
    // channels; allocates.
    explicit Upsampler(const UpsamplerConfig& config);
    virtual ~Upsampler();
    Upsampler(const Upsampler&) = delete;
    Upsampler& operator=(const Upsampler&) = delete;

    // `frames` input frames (at most InFrameSize()) become factor x frames
    // output frames. Input and output must not overlap.
    void Process(const float* in, float* out, std::size_t frames) noexcept { m_impl->Process(m_state, in, out, frames); }
    void Reset() noexcept { m_state.history.Clear(); }
    // Reconfigures in place for the same factor, taps and channels (new
    // coefficients, the history kept); otherwise rebuilds and clears.
    void Reconfigure(const UpsamplerConfig& config);

    std::size_t Factor() const { return m_state.factor; }
    std::size_t InFrameSize() const { return m_state.maxInput; }
    std::size_t TapsPerPhase() const { return m_state.taps; }
    // Group delay in output samples.
    double Delay() const { return 0.5 * static_cast<double>(m_state.taps * m_state.factor - 1); }
    system::KernelForm Form() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    void Build(const UpsamplerConfig& config);

    UpsamplerState m_state;
    system::KernelForm m_form = system::KernelForm::Ref;
    std::unique_ptr<UpsamplerImpl> m_impl;
};

template <std::size_t Factor>
class UpsamplerBy : public Upsampler {
public:
    explicit UpsamplerBy(UpsamplerConfig config = {}) : Upsampler(WithFactor(std::move(config))) {}

private:
    static UpsamplerConfig WithFactor(UpsamplerConfig config) {
        config.factor = Factor;
        return config;
    }
};

using Upsampler_x2 = UpsamplerBy<2>;
using Upsampler_x4 = UpsamplerBy<4>;
using Upsampler_x8 = UpsamplerBy<8>;

UpsamplerImpl* MakeUpsampler_m128();
UpsamplerImpl* MakeUpsampler_m128_fma();
UpsamplerImpl* MakeUpsampler_m256();
UpsamplerImpl* MakeUpsampler_m256_fma();

}  // namespace ora::numeric
