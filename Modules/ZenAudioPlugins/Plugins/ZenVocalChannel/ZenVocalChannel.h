// "Vocal Channel": a vocal strip, in this order:
//   low cut -> gate -> 3-band EQ -> compressor -> de-esser -> output level.
// The gate sits after the low cut, so rumble does not hold it open, and
// before the EQ and compressor, which would lift what it lets through. The
// de-esser follows the compressor, which raises sibilance as it lowers the
// peaks around it.
//
// Stages with a switch cross-fade when it moves; frequencies, gains and
// thresholds glide. Mono or stereo (linked); no latency.
#pragma once

#include <cstdint>

#include "Common/Algorithms/ButterworthHighPass.h"
#include "Common/Algorithms/Deesser.h"
#include "Common/Algorithms/NoiseGate.h"
#include "Common/Algorithms/RmsCompressor.h"
#include "Common/Algorithms/StripStage.h"
#include "Common/Algorithms/ThreeBandEq.h"
#include "Common/ZenStripPlugin.h"

class ZenVocalChannel : public ZenStripPlugin {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t {
        kLowCut,
        kLowCutFrequency,
        kLowCutSlope,
        kGate,
        kGateThreshold,
        kGateRange,
        kGateHold,
        kGateRelease,
        kLowGain,
        kLowFrequency,
        kMidGain,
        kMidFrequency,
        kMidQ,
        kHighGain,
        kHighFrequency,
        kCompressor,
        kCompressorThreshold,
        kCompressorRatio,
        kCompressorAttack,
        kCompressorRelease,
        kCompressorMakeup,
        kDeEss,
        kDeEssFrequency,
        kDeEssAmount,
        kOutputGain
    };
    // Rows of the meter table: each channel's input peak; what the low cut
    // removes (peak); the gate's gain (dB); the peak after the EQ; the gain
    // change of compressor and de-esser (dB, <= 0); each channel's output
    // peak.
    enum Meter : std::uint32_t {
        kInputPeakMeter,
        kLowCutMeter,
        kGateMeter,
        kEqMeter,
        kCompressorMeter,
        kDeEssMeter,
        kOutputPeakMeter
    };

    static constexpr float kCompressorKneeDb = 6.0f;
    static constexpr float kCompressorRmsMs = 10.0f;
    // The tail is the filters' ringing down by this much.
    static constexpr double kTailDecayDb = 120.0;

    ZenVocalChannel();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    std::uint32_t GetTailLength() const override;
    bool ApplyNeutralSetting() override;

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void ConfigureStages() override;
    void PublishStageMeters() noexcept override;

private:
    ButterworthHighPass m_lowCut;
    NoiseGate m_gate;
    ThreeBandEq m_eq;
    RmsCompressor m_compressor;
    Deesser m_deEsser;

    zen::StripStage m_lowCutStage{m_lowCut, zen::StripStage::Measure::kChange};
    zen::StripStage m_gateStage{m_gate};
    zen::StripStage m_eqStage{m_eq, zen::StripStage::Measure::kOutput};
    zen::StripStage m_compressorStage{m_compressor};
    zen::StripStage m_deEssStage{m_deEsser};
};
