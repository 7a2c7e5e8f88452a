// The re-timer: owns the stretch engine, pulls synthesis frames from it as
// the reader needs them, keeps the stretched stream in its output FIFO and
// reads it back with cubic interpolation at the pitch ratio, so the output
// keeps the input's duration and timeline (delayed by Latency()). The dry
// input is mixed in by the stretch engine's output stage.
//
// Configure allocates; Process is real-time safe. Settings changes come
// through ParametersChanged() on the processing thread (or under its lock).
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "FFT/Buffer.h"
#include "Retimer/Block.h"
#include "Retimer/CubicInterpolator.h"
#include "Retimer/InterpParam.h"
#include "Retimer/RateControl.h"
#include "Retimer/StretchEngine.h"

namespace ora::retimer {

class Engine {
public:
    // Samples of look-ahead the cubic interpolation reads beyond a position.
    static constexpr std::size_t kLookahead = 2;
    // Input pushed into the stretch engine at a time.
    static constexpr std::size_t kChunk = 1024;

    Engine(const fft::stretch::pv::EngineParam& stretchParam, const interp::Param& interpParam,
           const rate_control::Param& rateParam);
    Engine(const Engine&) = delete;
    Engine& operator=(const Engine&) = delete;

    // For `channels` and ratios within [minRatio, maxRatio].
    bool Configure(std::size_t channels, double minRatio, double maxRatio,
                   fft::Backend backend = fft::FFT::DefaultBackend());
    // False (traced) when the output FIFO cannot be cleared.
    bool Reset() noexcept;
    // Re-reads the interpolation settings (the ratio).
    void ParametersChanged() noexcept;

    // `in` and `out` distinct, same channel count as configured, and
    // out.GetLength() >= in.GetLength() * InvRate().
    bool Process(const Block& in, Block& out) noexcept;

    std::int64_t Latency() const { return m_rate.Latency(); }
    double InvRate() const { return m_Upsampler.InvRate(); }
    double Ratio() const { return m_rate.Target(); }
    bool IsConfigured() const { return m_configured; }
    fft::stretch::pv::Engine& Stretch() { return m_stretch; }

private:
    void RunFrame() noexcept;

    const interp::Param& m_interpParam;
    const rate_control::Param& m_rateParam;
    fft::stretch::pv::Engine m_stretch;
    interp::cubic m_Upsampler;
    rate_control m_rate;
    std::vector<fft::Buffer> m_FifoOutI;  // the stretched stream per channel

    std::size_t m_channels = 0;
    bool m_configured = false;
    std::int64_t m_output = 0;      // output samples produced since reset
    double m_read = 0.0;            // read position in the stretched stream
    std::int64_t m_emitted = 0;     // stretched samples final so far
    std::int64_t m_nextFrame = 0;   // index of the next synthesis frame
    std::int64_t m_lastStart = 0;   // analysis position of the last frame
};

}  // namespace ora::retimer
