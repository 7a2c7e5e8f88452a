#include "Algorithms/Lpf16.h"

#include <algorithm>

namespace ora::numeric {

namespace {

class Lpf16_ref final : public Lpf16Impl {
public:
    void Process(Lpf16State& state, const float* in, float* out, std::size_t frames) const noexcept override {
        for (std::size_t f = 0; f < frames; ++f, in += kLaneCount, out += kLaneCount) {
            for (std::size_t i = 0; i < kLaneCount; ++i) {
                const float m = in[i];
                float y = state.c[i] * (m - state.s[i]) + m;
                y = (y + kDenormalGuard) - kDenormalGuard;
                state.s[i] = y;
                out[i] = y * state.g[i];
            }
        }
    }
};

}  // namespace

Lpf16Impl::~Lpf16Impl() = default;

Lpf16::Lpf16() {
    std::fill(std::begin(m_state.g), std::end(m_state.g), 1.0f);
    Rebuild();
}

Lpf16::~Lpf16() = default;

void Lpf16::SetCoefficients(const float* c, const float* g) noexcept {
    std::copy(c, c + kLaneCount, m_state.c);
    std::copy(g, g + kLaneCount, m_state.g);
}

void Lpf16::Reset() noexcept { std::fill(std::begin(m_state.s), std::end(m_state.s), 0.0f); }

void Lpf16::Rebuild() {
    m_form = system::ChooseKernelForm();
    switch (m_form) {
        case system::KernelForm::M256Fma: m_impl.reset(MakeLpf16_m256_fma()); break;
        case system::KernelForm::M256: m_impl.reset(MakeLpf16_m256()); break;
        case system::KernelForm::M128Fma: m_impl.reset(MakeLpf16_m128_fma()); break;
        case system::KernelForm::M128: m_impl.reset(MakeLpf16_m128()); break;
        case system::KernelForm::Ref: m_impl.reset(new Lpf16_ref()); break;
    }
}

}  // namespace ora::numeric
