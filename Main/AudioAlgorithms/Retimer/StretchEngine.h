// Phase-vocoder time stretch on the FFT engine: frames of the input are
// analysed at positions the caller chooses and synthesised one hop apart,
// with their phases rebuilt by heap integration (PGHI) or by the
// peak-locked phase vocoder (PLPV). Pipeline:
//   In2Dft -> Rect2Polar -> PhaseGrad -> RtPghi | Plpv -> Polar2Rect -> Dft2Out
// Its output stage also mixes the dry input, taken from the same input
// history, into a finished block.
//
// Configure allocates; the rest is real-time safe. Settings are applied by
// the owner on the audio thread (or under its lock).
#pragma once

#include <cstddef>
#include <cstdint>

#include "FFT/Engine.h"
#include "FFT/Plugins/Dft2Out.h"
#include "FFT/Plugins/In2Dft.h"
#include "FFT/Plugins/PhaseGrad.h"
#include "FFT/Plugins/Plpv.h"
#include "FFT/Plugins/Polar2Rect.h"
#include "FFT/Plugins/Rect2Polar.h"
#include "FFT/Plugins/RtPghi.h"
#include "Retimer/StretchEngineParam.h"

namespace ora::fft::stretch::pv {

class Engine {
public:
    // Samples over which a change of the mix gains ramps (5 ms at 48 kHz).
    static constexpr std::size_t kMixRamp = 240;
    // Input is limited to +-this (+160 dBFS), non-finite input is silence:
    // far beyond any real signal, far within what the transforms' sums and
    // squares hold in single precision.
    static constexpr float kLargestInput = 1e8f;

    explicit Engine(const EngineParam& param);
    Engine(const Engine&) = delete;
    Engine& operator=(const Engine&) = delete;

    // Input history per channel must cover the oldest frame and dry sample
    // the caller will ask for. False when the settings or the FFT engine's
    // checks refuse.
    bool Configure(std::size_t channels, std::size_t inputCapacity, Backend backend = FFT::DefaultBackend());
    void Reset() noexcept;

    // Reconstruction settings from the parameter object.
    void ApplySettings() noexcept;
    void SetAlgorithm(Algorithm algorithm) noexcept;
    void SetMode(Mode mode) noexcept;
    void SetJoint(bool joint) noexcept { m_engine.SetJoint(joint); }
    void SetLog10Eps(float log10Eps) noexcept { m_plpv.SetLog10Threshold(log10Eps); }
    void SetMaxPeak(int count) noexcept { m_plpv.SetMaxPeaks(static_cast<std::size_t>(count > 0 ? count : 1)); }
    void SetLog10Tol(float log10Tol) noexcept { m_pghi.SetLog10Tolerance(log10Tol); }
    // The factor the output will be read faster than it is written: content
    // that would fold over on reading is left out of the synthesis.
    void SetReadRate(double rate) noexcept;
    // Output stage: out = wet * processed + dry * input.
    void SetMix(float dry, float wet) noexcept;
    float DryGain() const { return m_dryTarget; }
    float WetGain() const { return m_wetTarget; }

    void Write(const float* const* in, std::size_t frames) noexcept { m_engine.Write(in, frames); }
    std::int64_t Written() const { return m_engine.Written(); }
    // One frame centred on input time `centre`, `analysisHop` after the
    // previous one, its content placed by `map` (see fft::Engine); the next
    // synthesis hop is then final in Emitted().
    void RunFrame(double centre, double analysisHop, const TimeMap* map = nullptr) noexcept {
        m_engine.RunFrameAt(centre, analysisHop, map);
    }
    const float* Emitted(std::size_t channel) const { return m_engine.Emitted(channel); }

    // Mixes the dry input from position `inputStart` into the finished
    // processed block `out`.
    void MixOutput(float* const* out, std::int64_t inputStart, std::size_t frames) noexcept;

    std::size_t Channels() const { return m_channels; }
    std::size_t FrameLength() const { return m_param.FrameLength(); }
    std::size_t Hop() const { return m_param.Hop(); }
    // Bit per reconstructed row: phase-gradient estimates used in the last frame.
    std::int64_t LastGradientMask();
    const Plpv& PeakLocker() const { return m_plpv; }
    fft::Engine& FftEngine() { return m_engine; }

private:
    const EngineParam& m_param;
    fft::Engine m_engine;
    In2Dft m_in2dft;
    Rect2Polar m_rect2polar;
    PhaseGrad m_phaseGrad;
    RtPghi m_pghi;
    Plpv m_plpv;
    Polar2Rect m_polar2rect;
    Dft2Out m_dft2out;
    std::size_t m_channels = 0;

    float m_dryTarget = 0.0f;
    float m_wetTarget = 1.0f;
    float m_dry = 0.0f;
    float m_wet = 1.0f;
    float m_dryStep = 0.0f;
    float m_wetStep = 0.0f;
    std::size_t m_rampLeft = 0;
};

}  // namespace ora::fft::stretch::pv
