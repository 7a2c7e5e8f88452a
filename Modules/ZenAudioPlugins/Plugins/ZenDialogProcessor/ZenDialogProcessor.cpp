#include "ZenDialogProcessor.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenDialogProcessor::kDescriptor = {
    "Dialogue Processor", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'e', 'n', 'd'),
    2, 2, "ZenDialogProcessor", 0, 0, -1, nullptr};

namespace {

constexpr float kOn = 1.0f;
constexpr float kOff = 0.0f;
// Display ranges of the meters.
constexpr float kLevelFloorDb = -90.0f;
constexpr float kReductionFloorDb = -40.0f;

}  // namespace

ZenDialogProcessor::ZenDialogProcessor() {
    InitParameters(Definitions());
    InitMeters(Meters());
    InitStrip({kOutputGain, kInputPeakMeter, kOutputPeakMeter});
    AddStage(m_rumbleStage, kRumbleFilter);
    AddStage(m_dePopStage, kDePop);
    AddStage(m_deEssStage, kDeEss);
    AddStage(m_expanderStage, kExpander);
    AddStage(m_compressorStage, kCompressor);
    AddStage(m_exciterStage, kExciter);

    // What the controls set, at every control point where they moved.
    for (const zen::ControlMap::Link& link : std::initializer_list<zen::ControlMap::Link>{
             {kRumbleFrequency, &m_rumble, ButterworthHighPass::kFrequency},
             {kDePopAmount, &m_dePop, DePop::kThreshold, -kDePopThresholdSpanDb, kDePopThresholdAtZeroDb},
             {kDeEssAmount, &m_deEsser, Deesser::kAmount, kDeEssPercentAtOne},
             {kDeEssFrequency, &m_deEsser, Deesser::kRange},
             {kExpanderAmount, &m_expander, Expander::kRange, kExpanderRangeAtOneDb},
             {kExpanderThreshold, &m_expander, Expander::kThreshold},
             {kCompressorAmount, &m_compressor, RmsCompressor::kThreshold, -kCompressorThresholdSpanDb,
              kCompressorThresholdAtZeroDb},
             {kCompressorAmount, &m_compressor, RmsCompressor::kRatio, kCompressorRatioSpan, kCompressorRatioAtZero},
             {kExciterAmount, &m_exciter, Exciter::kMix, kExciterMixPercentAtOne},
         })
        AddControl(link);
}

const zen::ParameterTableDefinition& ZenDialogProcessor::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenDialogProcessor",
        {
            SwitchParameter("RUMBLE_FILT", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Rumble Filt"), kOn)
                .SmoothedSingle(working::Identity),
            LogarithmicParameter("RUMBLE_FREQ", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Rumble Freq"), 40.0f, 160.0f,
                                 90.0f, 1.0f, "Hz")
                .SmoothedSingle(working::Identity),
            SwitchParameter("DEPOP", QT_TRANSLATE_NOOP("ZenDialogProcessor", "De-Pop"), kOn)
                .SmoothedSingle(working::Identity),
            ContinuousParameter("DEPOP_AMOUNT", QT_TRANSLATE_NOOP("ZenDialogProcessor", "De-Pop Amount"), 0.0f, 1.0f,
                                0.5f, 0.01f)
                .SmoothedSingle(working::Identity),
            SwitchParameter("DEESS", QT_TRANSLATE_NOOP("ZenDialogProcessor", "De-Ess"), kOn)
                .SmoothedSingle(working::Identity),
            ContinuousParameter("DEESS_AMOUNT", QT_TRANSLATE_NOOP("ZenDialogProcessor", "De-Ess Amount"), 0.0f, 1.0f,
                                0.4f, 0.01f)
                .SmoothedSingle(working::Identity),
            LogarithmicParameter("DEESS_FREQ", QT_TRANSLATE_NOOP("ZenDialogProcessor", "De-Ess Freq"), 2000.0f,
                                 9000.0f, 6500.0f, 1.0f, "Hz")
                .SmoothedSingle(working::Identity),
            SwitchParameter("EXPANDER", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Expander"), kOff)
                .SmoothedSingle(working::Identity),
            ContinuousParameter("EXP_AMOUNT", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Exp Amount"), 0.0f, 1.0f, 0.3f,
                                0.01f)
                .SmoothedSingle(working::Identity),
            ContinuousParameter("EXP_THRESHOLD", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Exp Threshold"), -70.0f,
                                -20.0f, -40.0f, 0.1f, "dB")
                .SmoothedSingle(working::Identity),
            // Sets the expander's release, which does not click when it changes.
            ContinuousParameter("EXP_SPEED", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Exp Speed"), 50.0f, 4000.0f,
                                500.0f, 1.0f, "ms"),
            SwitchParameter("COMPRESSOR", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Compressor"), kOn)
                .SmoothedSingle(working::Identity),
            ContinuousParameter("COMP_AMOUNT", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Comp Amount"), 0.0f, 1.0f,
                                0.3f, 0.01f)
                .SmoothedSingle(working::Identity),
            SwitchParameter("EXCITER", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Exciter"), kOff)
                .SmoothedSingle(working::Identity),
            ContinuousParameter("EXCITER_AMOUNT", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Exciter Amount"), 0.0f,
                                1.0f, 0.3f, 0.01f)
                .SmoothedSingle(working::Identity),
            ContinuousParameter("OUTPUT_GAIN", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Output Level"), -18.0f, 12.0f,
                                0.0f, 0.1f, "dB")
                .SmoothedSingle(working::DbToGain),
        });
    return table;
}

const zen::MeterTableDefinition& ZenDialogProcessor::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenDialogProcessor",
        {
            LevelMeter("INPUT_PEAK", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Input Peak"), "dBFS", kLevelFloorDb, 6.0f)
                .PerChannel(),
            LevelMeter("RUMBLE_REMOVED", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Rumble Removed"), "dBFS", kLevelFloorDb, 0.0f),
            ValueMeter("DEPOP_REDUCTION", QT_TRANSLATE_NOOP("ZenDialogProcessor", "De-Pop Reduction"), "dB",
                       kReductionFloorDb, 0.0f),
            ValueMeter("DEESS_REDUCTION", QT_TRANSLATE_NOOP("ZenDialogProcessor", "De-Ess Reduction"), "dB",
                       kReductionFloorDb, 0.0f),
            ValueMeter("EXPANDER_REDUCTION", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Expander Reduction"), "dB",
                       kReductionFloorDb, 0.0f),
            ValueMeter("COMPRESSOR_REDUCTION", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Compressor Reduction"), "dB",
                       kReductionFloorDb, 0.0f),
            LevelMeter("EXCITER_ADDED", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Exciter Added"), "dBFS", kLevelFloorDb, 0.0f),
            // Output Level reaches +12 dB.
            LevelMeter("OUTPUT_PEAK", QT_TRANSLATE_NOOP("ZenDialogProcessor", "Output Peak"), "dBFS", kLevelFloorDb,
                       12.0f)
                .PerChannel(),
        });
    return table;
}

std::uint32_t ZenDialogProcessor::GetTailLength() const {
    // Only the filters ring on after the input stops; the gain stages
    // multiply silence.
    const zen::ParameterTable& p = Parameters();
    double seconds = 0.0;
    if (p[kRumbleFilter].GetValue() > 0.0f)
        seconds = ButterworthHighPass::RingSeconds(p[kRumbleFrequency].GetValue(), ButterworthHighPass::kTwentyFourDb,
                                                   kTailDecayDb);
    if (p[kExciter].GetValue() > 0.0f)
        seconds = std::max(seconds, ButterworthHighPass::RingSeconds(kExciterFrequency, ButterworthHighPass::kTwelveDb,
                                                                     kTailDecayDb));
    return static_cast<std::uint32_t>(std::ceil(seconds * GetSampleRate()));
}

bool ZenDialogProcessor::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    for (Parameter stage : {kRumbleFilter, kDePop, kDeEss, kExpander, kCompressor, kExciter}) SetParameter(stage, kOff);
    return true;
}

void ZenDialogProcessor::UpdateProcessingParameter(std::uint32_t index, float value) {
    if (index == kExpanderSpeed) m_expander.SetParameter(Expander::kRelease, kExpanderReleasePerSpeed * value);
}

void ZenDialogProcessor::ConfigureStages() {
    // What the amounts do not set; prepared, the algorithms are at their defaults.
    m_rumble.SetParameter(ButterworthHighPass::kSlope, ButterworthHighPass::kTwentyFourDb);
    m_deEsser.SetParameter(Deesser::kMode, Deesser::kNarrow);
    m_expander.SetParameter(Expander::kRatio, kExpanderRatio);
    m_expander.SetParameter(Expander::kAttack, kExpanderAttackMs);
    m_expander.SetParameter(Expander::kHold, kExpanderHoldMs);
    m_compressor.SetParameter(RmsCompressor::kKnee, kCompressorKneeDb);
    m_compressor.SetParameter(RmsCompressor::kAttack, kCompressorAttackMs);
    m_compressor.SetParameter(RmsCompressor::kRelease, kCompressorReleaseMs);
    m_compressor.SetParameter(RmsCompressor::kRmsSpeed, kCompressorRmsMs);
    m_compressor.SetParameter(RmsCompressor::kMakeupReference, kCompressorMakeupReferenceDb);
    m_compressor.SetParameter(RmsCompressor::kAutoMakeup, kOn);
    m_exciter.SetParameter(Exciter::kFrequency, kExciterFrequency);
    m_exciter.SetParameter(Exciter::kDrive, kExciterDriveDb);
    m_exciter.SetParameter(Exciter::kEven, kExciterEvenPercent);
}

void ZenDialogProcessor::PublishStageMeters() noexcept {
    PublishMeter(kRumbleMeter, m_rumbleStage.TakePeak());
    PublishMeter(kDePopMeter, m_dePopStage.IsRunning() ? m_dePop.GetMeter(DePop::kGainReductionMeter) : 0.0f);
    PublishMeter(kDeEssMeter, m_deEssStage.IsRunning() ? m_deEsser.GetMeter(Deesser::kReductionMeter) : 0.0f);
    PublishMeter(kExpanderMeter, m_expanderStage.IsRunning() ? m_expander.GetMeter(Expander::kGainMeter) : 0.0f);
    PublishMeter(kCompressorMeter,
                 m_compressorStage.IsRunning() ? m_compressor.GetMeter(RmsCompressor::kGainReductionMeter) : 0.0f);
    PublishMeter(kExciterMeter, m_exciterStage.TakePeak());
}

template class ZenAudioPlugin<ZenDialogProcessor>;
