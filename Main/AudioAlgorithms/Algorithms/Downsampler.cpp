#include "Algorithms/Downsampler.h"

#include <algorithm>
#include <stdexcept>

#include "Algorithms/PolyphaseDesign.h"

namespace ora::numeric {

namespace {

constexpr std::size_t kWidestVector = 8;

class Downsampler_ref final : public DownsamplerImpl {
public:
    void Process(DownsamplerState& st, const float* in, float* out, std::size_t frames) const noexcept override {
        const std::size_t M = st.factor, Q = st.taps, C = st.channels;
        const std::size_t kept = (Q - 1) * M;
        const std::size_t outputs = frames / M;
        for (std::size_t ch = 0; ch < C; ++ch) {
            float* history = st.history.data() + ch * kept;
            auto x = [&](std::size_t m) { return m < kept ? history[m] : in[(m - kept) * C + ch]; };
            for (std::size_t n = 0; n < outputs; ++n) {
                float acc = 0.0f;
                for (std::size_t p = 0; p < M; ++p)
                    for (std::size_t q = 0; q < Q; ++q) acc = st.table[p * Q + q] * x((n + Q - 1 - q) * M + M - 1 - p) + acc;
                out[n * C + ch] = acc;
            }
            const std::size_t total = kept + outputs * M;
            for (std::size_t m = 0; m < kept; ++m) history[m] = x(total - kept + m);
        }
    }
};

}  // namespace

DownsamplerImpl::~DownsamplerImpl() = default;

Downsampler::Downsampler(const DownsamplerConfig& config) { Build(config); }

Downsampler::~Downsampler() = default;

void Downsampler::Build(const DownsamplerConfig& config) {
    const std::size_t M = config.factor;
    if (M < 2 || config.channels == 0 || config.maxInputFrames == 0)
        throw std::invalid_argument("Downsampler: factor of at least 2 and at least one channel");
    std::vector<float> h = config.prototype.empty() ? DefaultPolyphasePrototype(M, config.tapsPerPhase) : config.prototype;
    const std::size_t Q = std::max<std::size_t>(1, (h.size() + M - 1) / M);
    h.resize(Q * M, 0.0f);

    const bool sameShape = m_impl && m_state.factor == M && m_state.taps == Q && m_state.channels == config.channels &&
                           m_state.maxInput == config.maxInputFrames;
    m_state.factor = M;
    m_state.taps = Q;
    m_state.channels = config.channels;
    m_state.maxInput = config.maxInputFrames;
    m_state.table.Resize(M * Q);
    for (std::size_t p = 0; p < M; ++p)
        for (std::size_t q = 0; q < Q; ++q) m_state.table[p * Q + q] = h[q * M + p];
    if (sameShape) return;

    m_state.history.Resize(config.channels * (Q - 1) * M);
    m_state.streamStride = Q - 1 + config.maxInputFrames / M + kWidestVector;
    m_state.scratch.Resize(M * m_state.streamStride);
    m_form = config.channels == 1 ? system::ChooseKernelForm() : system::KernelForm::Ref;
    switch (m_form) {
        case system::KernelForm::M256Fma: m_impl.reset(MakeDownsampler_m256_fma()); break;
        case system::KernelForm::M256: m_impl.reset(MakeDownsampler_m256()); break;
        case system::KernelForm::M128Fma: m_impl.reset(MakeDownsampler_m128_fma()); break;
        case system::KernelForm::M128: m_impl.reset(MakeDownsampler_m128()); break;
        case system::KernelForm::Ref: m_impl.reset(new Downsampler_ref()); break;
    }
}

void Downsampler::Reconfigure(const DownsamplerConfig& config) { Build(config); }

}  // namespace ora::numeric
