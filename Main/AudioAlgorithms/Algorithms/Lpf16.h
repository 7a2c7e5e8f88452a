// Damping of the reverb's 16 delay lines: per lane a one-pole low-pass of
// unit DC gain followed by the lane's gain,
//   y = m + c (m - s);  s = y;  w = g y,
// with -1 < c <= 0. The stored state is flushed of would-be denormals by
// adding and subtracting 1e-18. The fused forms round c (m - s) + m once.
#pragma once

#include <cstddef>
#include <memory>

#include "Algorithms/LaneFrame.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

struct alignas(64) Lpf16State {
    float s[kLaneCount] = {};  // filter state, before the gain
    float c[kLaneCount] = {};  // coefficient per lane
    float g[kLaneCount] = {};  // gain per lane
};

// Forms are stateless; the front owns the state, so a rebuilt form carries on.
class Lpf16Impl {
public:
    virtual ~Lpf16Impl();
    virtual void Process(Lpf16State& state, const float* in, float* out, std::size_t frames) const noexcept = 0;
};

class Lpf16 {
public:
    // No damping, unit gain, cleared state; the form from the dispatch settings.
    Lpf16();
    ~Lpf16();
    Lpf16(const Lpf16&) = delete;
    Lpf16& operator=(const Lpf16&) = delete;

    // 16 coefficients and 16 gains; the state is kept.
    void SetCoefficients(const float* c, const float* g) noexcept;
    // `frames` 16-float frames; in and out may be the same.
    void Process(const float* in, float* out, std::size_t frames) noexcept { m_impl->Process(m_state, in, out, frames); }
    void Reset() noexcept;
    // Picks the form again (after the dispatch settings changed).
    void Rebuild();

    const Lpf16State& State() const { return m_state; }
    system::KernelForm Form() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    Lpf16State m_state;
    system::KernelForm m_form = system::KernelForm::Ref;
    std::unique_ptr<Lpf16Impl> m_impl;
};

Lpf16Impl* MakeLpf16_m128();
Lpf16Impl* MakeLpf16_m128_fma();
Lpf16Impl* MakeLpf16_m256();
Lpf16Impl* MakeLpf16_m256_fma();

}  // namespace ora::numeric
