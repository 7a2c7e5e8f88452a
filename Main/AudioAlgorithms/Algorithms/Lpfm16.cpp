#include "Algorithms/Lpfm16.h"

#include <algorithm>

namespace ora::numeric {

namespace {

class Lpfm16_ref final : public Lpfm16Impl {
public:
    void Process(Lpfm16State& state, const float* in, float* out, std::size_t frames) const noexcept override {
        for (std::size_t f = 0; f < frames; ++f, in += kLaneCount, out += kLaneCount) {
            for (std::size_t i = 0; i < kLaneCount; ++i) {
                const float x = in[i];
                float y = state.c[i] * (x - state.s[i]) + x;
                y = (y + kDenormalGuard) - kDenormalGuard;
                state.s[i] = y;
                out[i] = y;
            }
        }
    }
};

}  // namespace

Lpfm16Impl::~Lpfm16Impl() = default;

Lpfm16::Lpfm16() { Rebuild(); }

Lpfm16::~Lpfm16() = default;

void Lpfm16::SetCoefficients(const float* c) noexcept { std::copy(c, c + kLaneCount, m_state.c); }

void Lpfm16::Reset() noexcept { std::fill(std::begin(m_state.s), std::end(m_state.s), 0.0f); }

void Lpfm16::Rebuild() {
    m_form = system::ChooseKernelForm();
    switch (m_form) {
        case system::KernelForm::M256Fma: m_impl.reset(MakeLpfm16_m256_fma()); break;
        case system::KernelForm::M256: m_impl.reset(MakeLpfm16_m256()); break;
        case system::KernelForm::M128Fma: m_impl.reset(MakeLpfm16_m128_fma()); break;
        case system::KernelForm::M128: m_impl.reset(MakeLpfm16_m128()); break;
        case system::KernelForm::Ref: m_impl.reset(new Lpfm16_ref()); break;
    }
}

}  // namespace ora::numeric
