// Tone correction of the reverb's output channels, one channel per lane of
// a 16-float frame: per lane a one-pole low-pass of unit DC gain,
//   y = x + c (x - s);  s = y,
// with -1 < c <= 0 (gain at Nyquist (1 + c) / (1 - c)). The stored state is
// flushed of would-be denormals by adding and subtracting 1e-18. The fused
// forms round c (x - s) + x once.
#pragma once

#include <cstddef>
#include <memory>

#include "Algorithms/LaneFrame.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

struct alignas(64) Lpfm16State {
    float s[kLaneCount] = {};  // filter state, before the gain
    float c[kLaneCount] = {};  // coefficient per lane
};

// Forms are stateless; the front owns the state, so a rebuilt form carries on.
class Lpfm16Impl {
public:
    virtual ~Lpfm16Impl();
    virtual void Process(Lpfm16State& state, const float* in, float* out, std::size_t frames) const noexcept = 0;
};

class Lpfm16 {
public:
    // A wire on every lane, cleared state; the form from the dispatch settings.
    Lpfm16();
    ~Lpfm16();
    Lpfm16(const Lpfm16&) = delete;
    Lpfm16& operator=(const Lpfm16&) = delete;

    // 16 coefficients; the state is kept.
    void SetCoefficients(const float* c) noexcept;
    // `frames` 16-float frames; in and out may be the same.
    void Process(const float* in, float* out, std::size_t frames) noexcept { m_impl->Process(m_state, in, out, frames); }
    void Reset() noexcept;
    // Picks the form again (after the dispatch settings changed).
    void Rebuild();

    const Lpfm16State& State() const { return m_state; }
    system::KernelForm Form() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    Lpfm16State m_state;
    system::KernelForm m_form = system::KernelForm::Ref;
    std::unique_ptr<Lpfm16Impl> m_impl;
};

Lpfm16Impl* MakeLpfm16_m128();
Lpfm16Impl* MakeLpfm16_m128_fma();
Lpfm16Impl* MakeLpfm16_m256();
Lpfm16Impl* MakeLpfm16_m256_fma();

}  // namespace ora::numeric
