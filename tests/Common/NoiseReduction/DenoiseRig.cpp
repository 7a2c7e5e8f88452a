#include "DenoiseRig.h"

#include <algorithm>
#include <cmath>

#include "Common/NoiseReduction/zn_denoiser.h"
#include "Common/NoiseReduction/zn_stft.h"

namespace zentest {

namespace nr = zen::noise_reduction;

namespace {

// A frame step that multiplies each frame's spectrum by a gain per bin: a
// sequence given in advance, or spectral subtraction.
class GainStep final : public ora::fft::Plugin {
public:
    GainStep() : Plugin(ora::fft::plugin::PROCESS) {}
    const char* Name() const override { return "GainStep"; }
    bool Configure(ora::fft::Frame& frame, const ora::fft::Context& context) override {
        m_bins = context.bins;
        return frame.RequireVector(ora::fft::variable::FSIG, ora::fft::type::FREQ_CPLX_VECTOR, context.channels,
                                   context.bins);
    }
    void Reset() noexcept override { m_frame = 0; }
    void Process(ora::fft::Frame& frame, ora::fft::Context&) noexcept override {
        ora::fft::Complex* x = frame.Cplx(ora::fft::variable::FSIG, ora::fft::type::FREQ_CPLX_VECTOR);
        for (std::size_t k = 0; k < m_bins; ++k) {
            float g = 1.0f;
            if (sequence != nullptr) {
                g = m_frame < sequence->size() ? (*sequence)[m_frame][k] : 1.0f;
            } else {
                const float power = std::norm(x[k]);
                g = std::sqrt(std::max(1.0f - noise[k] / std::max(power, 1e-30f), floor * floor));
            }
            x[k] *= g;
        }
        ++m_frame;
    }

    const std::vector<std::vector<float>>* sequence = nullptr;
    std::vector<float> noise;
    float floor = 0.0f;

private:
    std::size_t m_bins = 0;
    std::size_t m_frame = 0;
};

std::vector<float> RunStft(const std::vector<float>& input, double sampleRate, GainStep& step) {
    nr::zn_stft stft;
    stft.Configure(1, sampleRate, &step);
    const std::size_t latency = stft.Latency();
    std::vector<float> x(input);
    x.resize(input.size() + latency, 0.0f);
    float* channels[] = {x.data()};
    stft.Process(channels, 0, x.size());
    return std::vector<float>(x.begin() + static_cast<std::ptrdiff_t>(latency), x.end());
}

}  // namespace

Denoised RunDenoiser(const std::vector<float>& input, double sampleRate, const nr::zn_denoise_settings& settings,
                     std::size_t learnFrames) {
    nr::zn_denoiser denoiser;
    denoiser.SetChannelCount(1);
    denoiser.Prepare(static_cast<float>(sampleRate), 4096);
    if (learnFrames > 0) {
        nr::zn_denoise_settings learn = settings;
        learn.learning = true;
        denoiser.Configure(learn);
        std::vector<float> region(input.begin(), input.begin() + static_cast<std::ptrdiff_t>(learnFrames));
        float* channels[] = {region.data()};
        denoiser.Process(channels, region.size());
        denoiser.Configure(settings);
        denoiser.Reset();
    } else {
        denoiser.Configure(settings);
    }
    const std::size_t latency = denoiser.Latency();
    std::vector<float> x(input);
    x.resize(input.size() + latency, 0.0f);
    Denoised result;
    // One frame per call, so that every frame's gains can be read.
    for (std::size_t done = 0; done < x.size();) {
        const std::size_t n = std::min(x.size() - done, denoiser.Stft().ToNextFrame());
        float* channels[] = {x.data() + done};
        denoiser.Process(channels, n);
        done += n;
        if (denoiser.Stft().ToNextFrame() == denoiser.Stft().Hop()) {
            const float* g = denoiser.Frame().GainSpectrum();
            result.gains.emplace_back(g, g + denoiser.Frame().Bins());
        }
    }
    result.output.assign(x.begin() + static_cast<std::ptrdiff_t>(latency), x.end());
    return result;
}

std::vector<float> ApplyGains(const std::vector<float>& input, double sampleRate,
                              const std::vector<std::vector<float>>& gains) {
    GainStep step;
    step.sequence = &gains;
    return RunStft(input, sampleRate, step);
}

std::vector<float> SpectralSubtraction(const std::vector<float>& input, const std::vector<float>& noise,
                                       double sampleRate, float floor) {
    // The noise's mean periodogram on the same frames.
    nr::zn_stft stft;
    const std::size_t bins = nr::zn_stft::FrameLengthFor(sampleRate) / 2 + 1;
    std::vector<float> mean(bins, 0.0f);
    {
        class Mean final : public ora::fft::Plugin {
        public:
            explicit Mean(std::vector<float>& m) : Plugin(ora::fft::plugin::PROCESS), sum(m) {}
            const char* Name() const override { return "Mean"; }
            bool Configure(ora::fft::Frame& frame, const ora::fft::Context& context) override {
                return frame.RequireVector(ora::fft::variable::FSIG, ora::fft::type::FREQ_CPLX_VECTOR,
                                           context.channels, context.bins);
            }
            void Process(ora::fft::Frame& frame, ora::fft::Context& context) noexcept override {
                // Frames that begin before the noise does are left out.
                if (context.frameIndex < nr::zn_stft::kOverlap) return;
                const ora::fft::Complex* x = frame.Cplx(ora::fft::variable::FSIG, ora::fft::type::FREQ_CPLX_VECTOR);
                for (std::size_t k = 0; k < context.bins; ++k) sum[k] += std::norm(x[k]);
                ++frames;
            }
            std::vector<float>& sum;
            std::size_t frames = 0;
        } step(mean);
        stft.Configure(1, sampleRate, &step);
        std::vector<float> x(noise);
        float* channels[] = {x.data()};
        stft.Process(channels, 0, x.size());
        for (float& v : mean) v /= static_cast<float>(std::max<std::size_t>(step.frames, 1));
    }
    GainStep subtract;
    subtract.noise = mean;
    subtract.floor = floor;
    return RunStft(input, sampleRate, subtract);
}

}  // namespace zentest
