// The re-timer: owns the stretch engine, pulls synthesis frames from it as
// the reader needs them, keeps the stretched stream in its output FIFO and
// reads it back with cubic interpolation, so the output keeps the input's
// duration and timeline, delayed by Latency().
//
// Frame centres tie the two timelines together: synthesis centres are one
// hop apart in the stretched stream, and the analysis centres one hop over
// the ratio apart in the input, each decided as the input reaches it with
// the ratio of that moment. The stretched stream between two synthesis
// centres shows the input between their analysis centres, and every frame
// places its content by that same map. Output sample n shows input time
// n - Latency(), so it reads the stretched stream where the map puts that
// time: at the ratio, the pitch, while it holds, and in time whatever the
// ratio does. A change of ratio takes effect on the input from the moment
// it is made. The dry input is mixed in by the stretch engine's output
// stage.
//
// Configure allocates; Process is real-time safe. Settings changes come
// through ParametersChanged() on the processing thread (or under its lock).
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "FFT/Buffer.h"
#include "FFT/TimeMap.h"
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
    double Centre(std::int64_t frame) const { return m_centres[static_cast<std::size_t>(frame) & m_centreMask]; }
    // Stretched-stream position of frame `frame`'s synthesis centre.
    double SynthesisCentre(std::int64_t frame) const;
    // Decides the analysis centre of the next frame not yet decided.
    void DecideCentre(double ratio) noexcept;
    // Analyses the next frame, its content mapped through the centres around it.
    void RunFrame() noexcept;
    // The stretched-stream position that shows input time `time`.
    double ReadPosition(double time) noexcept;

    const interp::Param& m_interpParam;
    const rate_control::Param& m_rateParam;
    fft::stretch::pv::Engine m_stretch;
    interp::cubic m_Upsampler;
    rate_control m_rate;
    std::vector<fft::Buffer> m_FifoOutI;  // the stretched stream per channel
    std::vector<double> m_centres;        // analysis centres (input time) by frame, a ring
    std::size_t m_centreMask = 0;
    fft::TimeMap m_map;

    std::size_t m_channels = 0;
    bool m_configured = false;
    std::int64_t m_output = 0;     // output samples produced since reset
    std::int64_t m_emitted = 0;    // stretched samples final so far
    std::int64_t m_decided = 0;    // frames whose centre is decided
    std::int64_t m_nextFrame = 0;  // index of the next synthesis frame
    std::int64_t m_segment = 0;    // the reader lies between this frame's centre and the next
    double m_segmentSlope = 0.0;   // stretched samples per input sample there; 0: not found yet
};

}  // namespace ora::retimer
