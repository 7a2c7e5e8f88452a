#include "Algorithms/Upsampler.h"

#include <algorithm>
#include <stdexcept>

#include "Algorithms/PolyphaseDesign.h"

namespace ora::numeric {

namespace {

constexpr std::size_t kWidestVector = 8;

class Upsampler_ref final : public UpsamplerImpl {
public:
    void Process(UpsamplerState& st, const float* in, float* out, std::size_t frames) const noexcept override {
        const std::size_t L = st.factor, P = st.taps, C = st.channels, w = st.tableWidth;
        for (std::size_t ch = 0; ch < C; ++ch) {
            float* history = st.history.data() + ch * (P - 1);
            // Input sample m of the history followed by the block.
            auto x = [&](std::size_t m) { return m < P - 1 ? history[m] : in[(m - (P - 1)) * C + ch]; };
            for (std::size_t n = 0; n < frames; ++n) {
                for (std::size_t p = 0; p < L; ++p) {
                    float acc = 0.0f;
                    for (std::size_t k = 0; k < P; ++k) acc = st.table[k * w + p] * x(n + P - 1 - k) + acc;
                    out[(n * L + p) * C + ch] = acc;
                }
            }
            // Keep the last P - 1 inputs.
            const std::size_t total = P - 1 + frames;
            for (std::size_t m = 0; m < P - 1; ++m) history[m] = x(total - (P - 1) + m);
        }
    }
};

}  // namespace

UpsamplerImpl::~UpsamplerImpl() = default;

Upsampler::Upsampler(const UpsamplerConfig& config) { Build(config); }

Upsampler::~Upsampler() = default;

void Upsampler::Build(const UpsamplerConfig& config) {
    const std::size_t L = config.factor;
    if ((L != 2 && L != 4 && L != 8) || config.channels == 0 || config.maxInputFrames == 0)
        throw std::invalid_argument("Upsampler: factor 2, 4 or 8 and at least one channel");
    std::vector<float> h = config.prototype.empty() ? DefaultPolyphasePrototype(L, config.tapsPerPhase) : config.prototype;
    const std::size_t P = std::max<std::size_t>(1, (h.size() + L - 1) / L);
    h.resize(P * L, 0.0f);

    const bool sameShape = m_impl && m_state.factor == L && m_state.taps == P && m_state.channels == config.channels &&
                           m_state.maxInput == config.maxInputFrames;
    m_state.factor = L;
    m_state.taps = P;
    m_state.channels = config.channels;
    m_state.maxInput = config.maxInputFrames;
    m_state.tableWidth = std::max(kWidestVector, L);
    const std::size_t w = m_state.tableWidth;
    m_state.table.Resize(P * w);
    for (std::size_t k = 0; k < P; ++k)
        for (std::size_t j = 0; j < w; ++j) m_state.table[k * w + j] = static_cast<float>(L) * h[k * L + j % L];
    if (sameShape) return;

    m_state.history.Resize(config.channels * (P - 1));
    m_state.scratch.Resize((P - 1 + config.maxInputFrames) * L + kWidestVector);
    m_form = config.channels == 1 ? system::ChooseKernelForm() : system::KernelForm::Ref;
    switch (m_form) {
        case system::KernelForm::M256Fma: m_impl.reset(MakeUpsampler_m256_fma()); break;
        case system::KernelForm::M256: m_impl.reset(MakeUpsampler_m256()); break;
        case system::KernelForm::M128Fma: m_impl.reset(MakeUpsampler_m128_fma()); break;
        case system::KernelForm::M128: m_impl.reset(MakeUpsampler_m128()); break;
        case system::KernelForm::Ref: m_impl.reset(new Upsampler_ref()); break;
    }
}

void Upsampler::Reconfigure(const UpsamplerConfig& config) { Build(config); }

}  // namespace ora::numeric
