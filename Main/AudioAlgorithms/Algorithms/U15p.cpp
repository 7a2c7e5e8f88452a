#include "Algorithms/U15p.h"

namespace ora::numeric {

namespace {

class U15p_ref final : public U15pImpl {
public:
    void Process(const float* d, const float* u, float* m, std::size_t frames) const noexcept override {
        for (std::size_t f = 0; f < frames; ++f, d += kLaneCount, u += kLaneCount, m += kLaneCount) {
            float x[kLaneCount];
            for (std::size_t i = 0; i < U15p::kOrder; ++i) x[i] = d[i] + u[i];
            x[15] = 0.0f;
            // The pairwise tree of the vector forms: 16 -> 8 -> 4 -> 2 -> 1.
            float t8[8], t4[4];
            for (int i = 0; i < 8; ++i) t8[i] = x[i] + x[i + 8];
            for (int i = 0; i < 4; ++i) t4[i] = t8[i] + t8[i + 4];
            const float total = (t4[0] + t4[2]) + (t4[1] + t4[3]);
            const float all = U15p::kAllOnesWeight * total;
            for (std::size_t r = 0; r < U15p::kOrder; ++r) {
                float s = x[(U15p::kColumns[0] + r) % U15p::kOrder];
                for (std::size_t c = 1; c < U15p::kRowOnes; ++c) s += x[(U15p::kColumns[c] + r) % U15p::kOrder];
                m[r] = U15p::kIncidenceWeight * s - all;
            }
        }
    }
};

}  // namespace

U15pImpl::~U15pImpl() = default;

// No fused forms: the matrix has no products worth fusing.
U15p::U15p() {
    switch (system::ChooseKernelForm()) {
        case system::KernelForm::M256Fma:
        case system::KernelForm::M256:
            m_form = system::KernelForm::M256;
            m_impl.reset(MakeU15p_m256());
            break;
        case system::KernelForm::M128Fma:
        case system::KernelForm::M128:
            m_form = system::KernelForm::M128;
            m_impl.reset(MakeU15p_m128());
            break;
        case system::KernelForm::Ref:
            m_form = system::KernelForm::Ref;
            m_impl.reset(new U15p_ref());
            break;
    }
}

U15p::~U15p() = default;

}  // namespace ora::numeric
