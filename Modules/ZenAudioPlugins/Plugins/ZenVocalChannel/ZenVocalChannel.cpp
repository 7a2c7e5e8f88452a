#include "ZenVocalChannel.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenVocalChannel::kDescriptor = {
    "Vocal Channel", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'e', 'n', 'y'),
    2, 2, "ZenVocalChannel", 0, 0, -1, nullptr};

namespace {

constexpr float kOn = 1.0f;
constexpr float kOff = 0.0f;
// Display ranges of the meters.
constexpr float kLevelFloorDb = -90.0f;
constexpr float kReductionFloorDb = -40.0f;
constexpr float kGateFloorDb = -80.0f;

}  // namespace

ZenVocalChannel::ZenVocalChannel() {
    InitParameters(Definitions());
    InitMeters(Meters());
    InitStrip({kOutputGain, kInputPeakMeter, kOutputPeakMeter});
    AddStage(m_lowCutStage, kLowCut);
    AddStage(m_gateStage, kGate);
    AddStage(m_eqStage, kAlwaysOn);  // bands at 0 dB are wires
    AddStage(m_compressorStage, kCompressor);
    AddStage(m_deEssStage, kDeEss);

    // What the controls set, at every control point where they moved.
    for (const zen::ControlMap::Link& link : std::initializer_list<zen::ControlMap::Link>{
             {kLowCutFrequency, &m_lowCut, ButterworthHighPass::kFrequency},
             {kGateThreshold, &m_gate, NoiseGate::kThreshold},
             {kGateRange, &m_gate, NoiseGate::kRange},
             {kLowGain, &m_eq, ThreeBandEq::kLowGain},
             {kLowFrequency, &m_eq, ThreeBandEq::kLowFrequency},
             {kMidGain, &m_eq, ThreeBandEq::kMidGain},
             {kMidFrequency, &m_eq, ThreeBandEq::kMidFrequency},
             {kMidQ, &m_eq, ThreeBandEq::kMidQ},
             {kHighGain, &m_eq, ThreeBandEq::kHighGain},
             {kHighFrequency, &m_eq, ThreeBandEq::kHighFrequency},
             {kCompressorThreshold, &m_compressor, RmsCompressor::kThreshold},
             {kCompressorRatio, &m_compressor, RmsCompressor::kRatio},
             {kCompressorMakeup, &m_compressor, RmsCompressor::kMakeup},
             {kDeEssFrequency, &m_deEsser, Deesser::kRange},
             {kDeEssAmount, &m_deEsser, Deesser::kAmount},
         })
        AddControl(link);
}

const zen::ParameterTableDefinition& ZenVocalChannel::Definitions() {
    using namespace zen;
    auto smooth = [](ParameterDefinition row) { return row.SmoothedSingle(working::Identity); };
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenVocalChannel",
        {
            smooth(SwitchParameter("LOW_CUT", QT_TRANSLATE_NOOP("ZenVocalChannel", "Low Cut"), kOn)),
            smooth(LogarithmicParameter("LOW_CUT_FREQ", QT_TRANSLATE_NOOP("ZenVocalChannel", "Low Cut Freq"), 20.0f,
                                        400.0f, 80.0f, 1.0f, "Hz")),
            ListParameter("LOW_CUT_SLOPE", QT_TRANSLATE_NOOP("ZenVocalChannel", "Low Cut Slope"),
                          {QT_TRANSLATE_NOOP("ZenVocalChannel", "12 dB/oct"),
                           QT_TRANSLATE_NOOP("ZenVocalChannel", "24 dB/oct")},
                          ButterworthHighPass::kTwelveDb),
            smooth(SwitchParameter("GATE", QT_TRANSLATE_NOOP("ZenVocalChannel", "Gate"), kOff)),
            smooth(ContinuousParameter("GATE_THRESHOLD", QT_TRANSLATE_NOOP("ZenVocalChannel", "Gate Threshold"),
                                       -80.0f, -10.0f, -50.0f, 0.1f, "dB")),
            smooth(ContinuousParameter("GATE_RANGE", QT_TRANSLATE_NOOP("ZenVocalChannel", "Gate Range"), 0.0f, 80.0f,
                                       30.0f, 0.1f, "dB")),
            ContinuousParameter("GATE_HOLD", QT_TRANSLATE_NOOP("ZenVocalChannel", "Gate Hold"), 0.0f, 500.0f, 50.0f,
                                1.0f, "ms"),
            ContinuousParameter("GATE_RELEASE", QT_TRANSLATE_NOOP("ZenVocalChannel", "Gate Release"), 10.0f, 2000.0f,
                                150.0f, 1.0f, "ms"),
            smooth(ContinuousParameter("LOW_GAIN", QT_TRANSLATE_NOOP("ZenVocalChannel", "Low Gain"), -18.0f, 18.0f,
                                       0.0f, 0.1f, "dB")),
            smooth(LogarithmicParameter("LOW_FREQ", QT_TRANSLATE_NOOP("ZenVocalChannel", "Low Freq"), 40.0f, 500.0f,
                                        120.0f, 1.0f, "Hz")),
            smooth(ContinuousParameter("MID_GAIN", QT_TRANSLATE_NOOP("ZenVocalChannel", "Mid Gain"), -18.0f, 18.0f,
                                       0.0f, 0.1f, "dB")),
            smooth(LogarithmicParameter("MID_FREQ", QT_TRANSLATE_NOOP("ZenVocalChannel", "Mid Freq"), 200.0f, 8000.0f,
                                        2500.0f, 1.0f, "Hz")),
            smooth(ContinuousParameter("MID_Q", QT_TRANSLATE_NOOP("ZenVocalChannel", "Mid Q"), 0.3f, 6.0f, 1.0f,
                                       0.01f)),
            smooth(ContinuousParameter("HIGH_GAIN", QT_TRANSLATE_NOOP("ZenVocalChannel", "High Gain"), -18.0f, 18.0f,
                                       0.0f, 0.1f, "dB")),
            smooth(LogarithmicParameter("HIGH_FREQ", QT_TRANSLATE_NOOP("ZenVocalChannel", "High Freq"), 1500.0f,
                                        16000.0f, 10000.0f, 1.0f, "Hz")),
            smooth(SwitchParameter("COMPRESSOR", QT_TRANSLATE_NOOP("ZenVocalChannel", "Compressor"), kOn)),
            smooth(ContinuousParameter("COMP_THRESHOLD", QT_TRANSLATE_NOOP("ZenVocalChannel", "Comp Threshold"),
                                       -50.0f, 0.0f, -18.0f, 0.1f, "dB")),
            smooth(ContinuousParameter("COMP_RATIO", QT_TRANSLATE_NOOP("ZenVocalChannel", "Comp Ratio"), 1.2f, 20.0f,
                                       3.0f, 0.1f)),
            ContinuousParameter("COMP_ATTACK", QT_TRANSLATE_NOOP("ZenVocalChannel", "Comp Attack"), 0.1f, 100.0f,
                                5.0f, 0.1f, "ms"),
            ContinuousParameter("COMP_RELEASE", QT_TRANSLATE_NOOP("ZenVocalChannel", "Comp Release"), 50.0f, 4000.0f,
                                120.0f, 1.0f, "ms"),
            smooth(ContinuousParameter("COMP_MAKEUP", QT_TRANSLATE_NOOP("ZenVocalChannel", "Comp Makeup"), 0.0f,
                                       20.0f, 3.0f, 0.1f, "dB")),
            smooth(SwitchParameter("DEESS", QT_TRANSLATE_NOOP("ZenVocalChannel", "De-Ess"), kOn)),
            smooth(LogarithmicParameter("DEESS_FREQ", QT_TRANSLATE_NOOP("ZenVocalChannel", "De-Ess Freq"), 2000.0f,
                                        9000.0f, 6500.0f, 1.0f, "Hz")),
            smooth(ContinuousParameter("DEESS_AMOUNT", QT_TRANSLATE_NOOP("ZenVocalChannel", "De-Ess Amount"), 0.0f,
                                       100.0f, 40.0f, 0.1f, "%")),
            ContinuousParameter("OUTPUT_GAIN", QT_TRANSLATE_NOOP("ZenVocalChannel", "Output Level"), -24.0f, 12.0f,
                                0.0f, 0.1f, "dB")
                .SmoothedSingle(working::DbToGain),
        });
    return table;
}

const zen::MeterTableDefinition& ZenVocalChannel::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenVocalChannel",
        {
            LevelMeter("INPUT_PEAK", QT_TRANSLATE_NOOP("ZenVocalChannel", "Input Peak"), "dBFS", kLevelFloorDb, 6.0f)
                .PerChannel(),
            LevelMeter("LOW_CUT_REMOVED", QT_TRANSLATE_NOOP("ZenVocalChannel", "Low Cut Removed"), "dBFS", kLevelFloorDb, 0.0f),
            ValueMeter("GATE_GAIN", QT_TRANSLATE_NOOP("ZenVocalChannel", "Gate Gain"), "dB", kGateFloorDb, 0.0f),
            // EQ boosts reach +18 dB.
            LevelMeter("EQ_PEAK", QT_TRANSLATE_NOOP("ZenVocalChannel", "EQ Peak"), "dBFS", kLevelFloorDb, 18.0f),
            ValueMeter("COMP_REDUCTION", QT_TRANSLATE_NOOP("ZenVocalChannel", "Comp Reduction"), "dB",
                       kReductionFloorDb, 0.0f),
            ValueMeter("DEESS_REDUCTION", QT_TRANSLATE_NOOP("ZenVocalChannel", "De-Ess Reduction"), "dB",
                       kReductionFloorDb, 0.0f),
            LevelMeter("OUTPUT_PEAK", QT_TRANSLATE_NOOP("ZenVocalChannel", "Output Peak"), "dBFS", kLevelFloorDb,
                       18.0f)
                .PerChannel(),
        });
    return table;
}

std::uint32_t ZenVocalChannel::GetTailLength() const {
    // Only the filters ring on after the input stops; the gain stages
    // multiply silence.
    const zen::ParameterTable& p = Parameters();
    double seconds = 0.0;
    if (p[kLowCut].GetValue() > 0.0f)
        seconds = ButterworthHighPass::RingSeconds(p[kLowCutFrequency].GetValue(),
                                                   static_cast<int>(p[kLowCutSlope].GetValue()), kTailDecayDb);
    const struct {
        Parameter gain, frequency;
        float q;
    } bands[] = {{kLowGain, kLowFrequency, ThreeBandEq::kShelfQ},
                 {kMidGain, kMidFrequency, p[kMidQ].GetValue()},
                 {kHighGain, kHighFrequency, ThreeBandEq::kShelfQ}};
    for (const auto& band : bands)
        if (p[band.gain].GetValue() != 0.0f)
            seconds = std::max(seconds, ThreeBandEq::RingSeconds(p[band.gain].GetValue(),
                                                                 p[band.frequency].GetValue(), band.q, kTailDecayDb));
    return static_cast<std::uint32_t>(std::ceil(seconds * GetSampleRate()));
}

bool ZenVocalChannel::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    for (Parameter stage : {kLowCut, kGate, kCompressor, kDeEss}) SetParameter(stage, kOff);
    return true;
}

void ZenVocalChannel::UpdateProcessingParameter(std::uint32_t index, float value) {
    switch (index) {
        case kLowCutSlope: m_lowCut.SetParameter(ButterworthHighPass::kSlope, value); break;
        case kGateHold: m_gate.SetParameter(NoiseGate::kHold, value); break;
        case kGateRelease: m_gate.SetParameter(NoiseGate::kRelease, value); break;
        case kCompressorAttack: m_compressor.SetParameter(RmsCompressor::kAttack, value); break;
        case kCompressorRelease: m_compressor.SetParameter(RmsCompressor::kRelease, value); break;
        default: break;
    }
}

void ZenVocalChannel::ConfigureStages() {
    // What the parameters do not set; prepared, the algorithms are at their defaults.
    m_compressor.SetParameter(RmsCompressor::kKnee, kCompressorKneeDb);
    m_compressor.SetParameter(RmsCompressor::kRmsSpeed, kCompressorRmsMs);
    m_deEsser.SetParameter(Deesser::kMode, Deesser::kNarrow);
}

void ZenVocalChannel::PublishStageMeters() noexcept {
    PublishMeter(kLowCutMeter, m_lowCutStage.TakePeak());
    PublishMeter(kGateMeter, m_gateStage.IsRunning() ? m_gate.GetMeter(NoiseGate::kGainMeter) : 0.0f);
    PublishMeter(kEqMeter, m_eqStage.TakePeak());
    PublishMeter(kCompressorMeter,
                 m_compressorStage.IsRunning() ? m_compressor.GetMeter(RmsCompressor::kGainReductionMeter) : 0.0f);
    PublishMeter(kDeEssMeter, m_deEssStage.IsRunning() ? m_deEsser.GetMeter(Deesser::kReductionMeter) : 0.0f);
}

template class ZenAudioPlugin<ZenVocalChannel>;
