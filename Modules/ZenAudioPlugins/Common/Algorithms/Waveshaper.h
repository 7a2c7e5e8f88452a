// The saturation curves of a distortion, memoryless but for two samples:
// each output is the curve's mean along the straight lines through the last
// three driven inputs, weighted by a triangle two steps wide. With F2 the
// curve's second antiderivative and D(a, b) = (F2(a) - F2(b)) / (a - b),
// y = 2 (D(u0, u1) - D(u1, u2)) / (u0 - u2). That mean is the curve
// low-passed by a triangle (a box twice over), so what the curve makes
// above the sampling rate folds back far weaker: it falls as the square of
// the one-box form's. It delays by one sample. Run it oversampled
// (Oversampler with a stage delay of two half samples).
//
// Curves, for a driven input u, full output at +-1:
//   "Tape"      u / sqrt(1 + u^2): symmetric, gradual, odd harmonics;
//   "Tube"      the same curve biased, so the two halves saturate unevenly
//               (even harmonics); small signals keep unit gain, the lower
//               half reaches -1, the upper kTubeUpperLimit;
//   "Hard"      clipped at +-1;
//   "Fold-back" sin(u): past its peaks at +-pi/2 the output folds back
//               toward zero and beyond, smoothly, so that its harmonics
//               stay within a band set by the drive.
//
// Shape() drives and scales per sample: y = post x curve(pre x x), so an
// owner sets the drive into a ceiling as pre = drive / ceiling and post =
// ceiling. Arithmetic in double; finite input gives finite output.
#pragma once

#include <cstdint>
#include <vector>

#include "../ZenAudioAlgorithm.h"
#include "Algorithms/ShaperIntegrals.h"

class Waveshaper : public ZenAudioAlgorithm {
    Q_OBJECT

public:
    enum Parameter : std::uint64_t { kCurve };
    enum Curve { kTape, kTube, kHard, kFoldBack };

    static constexpr double kTubeBias = 0.2;

    Waveshaper();

    static const zen::ParameterTableDefinition& Definitions();

    bool SetParameter(std::uint64_t index, float value) override;
    void SetChannelCount(std::uint64_t channels) override;
    void Reset() override;
    // Unit drive and ceiling.
    bool ProcessChannel(std::uint64_t channel, float* samples, std::uint64_t count) override;
    bool Process(float* const* channels, std::uint64_t count) override;

    // In place; `pre` and `post` hold one value per sample. Returns the
    // largest |pre x x| of the block.
    float Shape(std::uint64_t channel, float* samples, const float* pre, const float* post,
                std::uint64_t count) noexcept;

    Curve GetCurve() const { return m_curve; }
    // The curve, its antiderivative and its second antiderivative (each up to a constant).
    static double Apply(Curve curve, double u) noexcept;
    static double Antiderivative(Curve curve, double u) noexcept;
    static double SecondAntiderivative(Curve curve, double u) noexcept;
    static ora::numeric::ShaperShape IntegralShape(Curve curve);
    static double TubeUpperLimit();

    // How far the output lags the input, in half samples.
    static constexpr std::size_t kDelayHalfSamples = 2;

private:
    static constexpr std::size_t kChunk = 256;  // high-rate samples evaluated at once

    struct History {
        double u1 = 0.0, u2 = 0.0;  // the last two driven inputs
    };

    template <Curve C>
    float ShapeWith(History& h, float* samples, const float* pre, const float* post, std::uint64_t count) noexcept;

    Curve m_curve = kTube;
    ora::numeric::ShaperShape m_shape = IntegralShape(kTube);
    ora::numeric::ShaperIntegrals m_integrals;
    std::vector<History> m_history;  // per channel
};
