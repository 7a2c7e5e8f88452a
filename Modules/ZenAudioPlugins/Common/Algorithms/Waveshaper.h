// The saturation curves of a distortion, memoryless but for one sample:
// each output is the curve's mean over the straight line from the previous
// driven input to this one, (F(u1) - F(u0)) / (u1 - u0) with F the curve's
// antiderivative. That mean is the curve low-passed by a one-sample box, so
// the corners of the hard and fold-back curves alias far less; it delays by
// half a sample. Run it oversampled (Oversampler with stageHalfSample).
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
    // The curve and its antiderivative (F(0) = 0 up to a constant).
    static double Apply(Curve curve, double u) noexcept;
    static double Antiderivative(Curve curve, double u) noexcept;
    static double TubeUpperLimit();

private:
    template <Curve C>
    float ShapeWith(double& last, float* samples, const float* pre, const float* post, std::uint64_t count) noexcept;

    Curve m_curve = kTube;
    std::vector<double> m_last;  // per channel, the previous driven input
};
