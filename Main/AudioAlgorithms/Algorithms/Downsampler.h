// Polyphase FIR decimation by an integer factor M: every M input samples
// give one output, y[n] = sum_j h[j] x[n M + M - 1 - j], with h a low-pass
// prototype at the high rate (unit DC gain). The group delay is
// (taps - 1) / 2 input samples.
//
// The vector forms run across output samples over the input split into its M
// phases, and sum each output in the reference form's order (phase by phase,
// tap by tap): the plain forms agree with it bit for bit, the fused forms to
// a rounding per tap.
#pragma once

#include <cstddef>
#include <memory>
#include <vector>

#include "System/AlignedBuffer.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

struct DownsamplerConfig {
    std::size_t factor = 2;             // 2 or more
    std::size_t tapsPerPhase = 32;      // used when no prototype is given
    std::vector<float> prototype;       // empty: a Kaiser low-pass for the factor
    std::size_t channels = 1;           // interleaved; vector forms for 1
    std::size_t maxInputFrames = 2048;  // the longest block Process takes
};

struct DownsamplerState {
    std::size_t factor = 0;
    std::size_t taps = 0;          // per phase
    std::size_t channels = 0;
    std::size_t maxInput = 0;
    AlignedBuffer<float> table;    // factor x taps: table[p taps + q] = h[q M + p]
    AlignedBuffer<float> history;  // per channel, the last (taps - 1) M inputs, oldest first
    AlignedBuffer<float> scratch;  // the vector forms' phase streams
    std::size_t streamStride = 0;  // floats per phase stream in scratch
};

class DownsamplerImpl {
public:
    virtual ~DownsamplerImpl();
    virtual void Process(DownsamplerState& state, const float* in, float* out, std::size_t frames) const noexcept = 0;
};

class Downsampler {
public:
    // Throws std::invalid_argument for a factor below 2 or no channels; allocates.
    explicit Downsampler(const DownsamplerConfig& config);
    ~Downsampler();
    Downsampler(const Downsampler&) = delete;
    Downsampler& operator=(const Downsampler&) = delete;

    // `frames` input frames, a multiple of the factor and at most
    // InFrameSize(), become frames / factor output frames. Input and output
    // must not overlap.
    void Process(const float* in, float* out, std::size_t frames) noexcept { m_impl->Process(m_state, in, out, frames); }
    void Reset() noexcept { m_state.history.Clear(); }
    // In place for the same shape (the history kept); otherwise rebuilds and clears.
    void Reconfigure(const DownsamplerConfig& config);

    std::size_t Factor() const { return m_state.factor; }
    std::size_t InFrameSize() const { return m_state.maxInput; }
    std::size_t TapsPerPhase() const { return m_state.taps; }
    // Group delay in input samples.
    double Delay() const { return 0.5 * static_cast<double>(m_state.taps * m_state.factor - 1); }
    system::KernelForm Form() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    void Build(const DownsamplerConfig& config);

    DownsamplerState m_state;
    system::KernelForm m_form = system::KernelForm::Ref;
    std::unique_ptr<DownsamplerImpl> m_impl;
};

DownsamplerImpl* MakeDownsampler_m128();
DownsamplerImpl* MakeDownsampler_m128_fma();
DownsamplerImpl* MakeDownsampler_m256();
DownsamplerImpl* MakeDownsampler_m256_fma();

}  // namespace ora::numeric
