// "Distortion": drives the signal into a saturation curve ("Tape", "Tube",
// "Hard", "Fold-back") whose output never exceeds "Ceiling", then a tilt
// "Tone", a dry/wet "Mix" and an "Output Level". The curve runs at eight
// times the host's rate, low-passed by its second antiderivative, so that
// even at full drive aliasing stays far below the harmonics; the dry signal
// is delayed to match the reported latency.
//
// "Ceiling" spans 24 dB below full scale and "Output Level" 24 dB either
// side of 0 dB: lowering the ceiling by a share of its range and raising
// the output level by half that share drives harder at the same peak.
#pragma once

#include <vector>

#include "Common/Algorithms/Delay.h"
#include "Common/Algorithms/Oversampler.h"
#include "Common/Algorithms/Waveshaper.h"
#include "Common/ZenAudioPluginImpl.h"

class ZenDistortion : public ZenAudioPluginImpl {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t { kDrive, kCurve, kCeiling, kTone, kMix, kOutputLevel };
    // Rows of the meter table: how far the curve is driven (peak of the
    // driven signal against the ceiling; above 0 dB it saturates), and each
    // channel's input and output peak.
    enum Meter : std::uint32_t { kSaturation, kInputPeak, kOutputPeak };

    static constexpr std::size_t kOversampling = 8;
    static constexpr float kCeilingRangeDb = 24.0f;
    // The tilt turns about this frequency; the wet path's DC blocker sits at kDcBlockHz.
    static constexpr double kTonePivotHz = 1000.0;
    static constexpr double kDcBlockHz = 5.0;
    // Inputs are held within +-kInputLimit (+60 dBFS): louder is not audio.
    static constexpr float kInputLimit = 1000.0f;

    ZenDistortion();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    // The tone's treble gain t for "Tone" in dB (the lows get 1/t), the
    // DC blocker's pole and the tilt's one-pole low-pass coefficient.
    static float TiltGain(float db);
    static double DcPole(double sampleRate);
    static double ToneCoefficient(double sampleRate);

    std::uint32_t GetTailLength() const override;
    bool ApplyNeutralSetting() override;

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) override;
    void ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept override;
    void ResetProcessing() override;

private:
    struct Filters {
        double dcIn = 0.0, dcOut = 0.0;  // DC blocker
        double low = 0.0;                // the tilt's one-pole low-pass
    };

    Oversampler m_oversampler;
    Waveshaper m_shaper;
    zen::Delay m_dryDelay;
    std::vector<Filters> m_filters;
    std::vector<float> m_dry;         // one block
    std::vector<float> m_pre, m_post;  // one block at the high rate
    double m_dcPole = 0.0;
    double m_toneCoefficient = 0.0;
};
