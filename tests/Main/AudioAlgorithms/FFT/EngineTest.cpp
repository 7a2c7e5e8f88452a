// The FFT engine: its configuration checks, and perfect reconstruction
// through analysis and synthesis (directly, through polar form and
// zero-padded) after its latency in any block split, on every FFT back end.
#include <gtest/gtest.h>

#include <algorithm>
#include <vector>

#include "../System/CheckRecorder.h"
#include "FFT/Engine.h"
#include "FFT/Plugins/Dft2Out.h"
#include "FFT/Plugins/In2Dft.h"
#include "FFT/Plugins/Polar2Rect.h"
#include "FFT/Plugins/Rect2Polar.h"
#include "Support/Signals.h"

using namespace ora::fft;
using zentest::CheckRecorder;

namespace {

// Resynthesises with the analysis phases unchanged.
class KeepPhase final : public Plugin {
public:
    KeepPhase() : Plugin(plugin::PROCESS) {}
    const char* Name() const override { return "KeepPhase"; }
    bool Configure(Frame& frame, const Context& c) override {
        return frame.RequireVector(variable::PHASE_IN, type::FREQ_REAL_VECTOR, c.rows, c.bins) &&
               frame.RequireVector(variable::PHASE_START, type::FREQ_REAL_VECTOR, c.rows, c.bins);
    }
    void Process(Frame& frame, Context& c) noexcept override {
        const float* in = frame.Real(variable::PHASE_IN, type::FREQ_REAL_VECTOR);
        float* out = frame.Real(variable::PHASE_START, type::FREQ_REAL_VECTOR);
        std::copy(in, in + c.rows * c.bins, out);
    }
};

std::vector<std::vector<float>> Stream(Engine& engine, const std::vector<std::vector<float>>& in, std::size_t block) {
    const std::size_t channels = in.size(), length = in[0].size();
    std::vector<std::vector<float>> out(channels, std::vector<float>(length));
    std::vector<const float*> ip(channels);
    std::vector<float*> op(channels);
    for (std::size_t done = 0; done < length;) {
        const std::size_t n = std::min(block, length - done);
        for (std::size_t c = 0; c < channels; ++c) {
            ip[c] = in[c].data() + done;
            op[c] = out[c].data() + done;
        }
        EXPECT_EQ(engine.Push(ip.data(), op.data(), n), n);
        done += n;
    }
    return out;
}

std::vector<Backend> Backends() {
    std::vector<Backend> all{Backend::Kiss};
    if (FFT::IsAvailable(Backend::Fftw)) all.push_back(Backend::Fftw);
    return all;
}

class FftEngineBackends : public ::testing::TestWithParam<Backend> {};

}  // namespace

TEST_P(FftEngineBackends, AnalysisThenSynthesisGivesBackTheInputAfterItsLatencyInAnyBlockSplit) {
    In2Dft in;
    Rect2Polar toPolar;
    KeepPhase keep;
    Polar2Rect toRect;
    Dft2Out out;
    struct Case {
        std::size_t frame, fft, hop;  // a transform longer than the frame is zero-padded
        bool polar;
    };
    const std::vector<std::vector<float>> x = {zentest::Noise(6000, 0.5, 1), zentest::Noise(6000, 0.5, 2)};
    for (const Case& c : {Case{1024, 1024, 256, false}, Case{1024, 1024, 256, true}, Case{512, 1024, 128, false}}) {
        std::vector<std::vector<std::vector<float>>> results;
        for (std::size_t block : {300u, 1u, 77u, 8192u}) {
            Engine engine;
            EngineConfig config;
            config.channels = 2;
            config.frameLength = c.frame;
            config.fftLength = c.fft;
            config.hop = c.hop;
            config.backend = GetParam();
            config.pipeline = c.polar ? std::vector<Plugin*>{&in, &toPolar, &keep, &toRect, &out}
                                      : std::vector<Plugin*>{&in, &out};
            ASSERT_TRUE(engine.Configure(config));
            EXPECT_EQ(engine.PushLatency(), c.frame - 1);
            results.push_back(Stream(engine, x, block));
            EXPECT_EQ(results.back(), results[0]) << "frame " << c.frame << " polar " << c.polar << " block " << block;
        }
        for (std::size_t ch = 0; ch < 2; ++ch) {
            const auto& y = results[0][ch];
            for (std::size_t i = 0; i < c.frame - 1; ++i) ASSERT_NEAR(y[i], 0.0f, 1e-6f) << i;
            for (std::size_t i = c.frame - 1; i < y.size(); ++i)
                ASSERT_NEAR(y[i], x[ch][i - (c.frame - 1)], 2e-5f) << "frame " << c.frame << " polar " << c.polar << " at " << i;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(AllBackends, FftEngineBackends, ::testing::ValuesIn(Backends()),
                         [](const ::testing::TestParamInfo<Backend>& p) { return std::string(FFT::BackendName(p.param)); });

TEST(FftEngine, RefusesPipelinesAndBuffersItCannotRun) {
    In2Dft in;
    Rect2Polar toPolar;
    Dft2Out out;
    Engine engine;
    EngineConfig config;
    config.frameLength = 256;
    config.fftLength = 256;
    config.hop = 64;
    auto refused = [&](const char* check) {
        CheckRecorder checks;
        EXPECT_FALSE(engine.Configure(config));
        ASSERT_FALSE(checks.Checks().empty());
        if (check) EXPECT_EQ(checks.Checks().back(), check);
        else EXPECT_EQ(checks.Checks().size(), 1u);
    };
    refused("!m_pipeline.empty()");
    config.pipeline = {&in, &toPolar};
    refused("last.m_traits == plugin::OUTPUT");
    config.pipeline = {&in, &out};
    config.hop = 0;
    refused(nullptr);
    config.hop = 64;
    config.fftLength = 128;  // shorter than a frame
    refused(nullptr);
    config.fftLength = 256;
    ASSERT_TRUE(engine.Configure(config));
    EXPECT_TRUE(engine.GetContext().out->at(0).is_linearized());
    EXPECT_FALSE(engine.GetContext().in->at(0).is_linearized());
    // In place is refused: the output would overwrite input not yet read.
    std::vector<float> buffer(64, 0.0f);
    float* io[1] = {buffer.data()};
    CheckRecorder checks;
    EXPECT_EQ(engine.Push(io, io, 64), 0u);
    ASSERT_EQ(checks.Checks().size(), 1u);
    EXPECT_EQ(checks.Checks()[0], "out_c != in_c");
}
