// "Dialogue Processor": a clean-up strip for dialogue, in this order:
//   rumble high-pass -> de-pop -> de-esser -> downward expander
//   -> compressor -> harmonic exciter -> output level.
// Filters and repairs come first, so that the dynamics stages judge the
// cleaned voice; the expander sits before the compressor, which would
// otherwise lift the room noise the expander is meant to lower; the exciter
// comes last, so the compressor does not pump on the harmonics it adds.
//
// Each stage has a switch and, where it has one, an "Amount" from 0 to 1
// that maps onto the stage's own settings (the constants below). The names
// are the ones the "AI" plug-in's dialogue template sets. Switches
// cross-fade, amounts glide; both stay clean under automation. Mono or
// stereo (linked); no latency.
#pragma once

#include <cstdint>

#include "Common/Algorithms/ButterworthHighPass.h"
#include "Common/Algorithms/DePop.h"
#include "Common/Algorithms/Deesser.h"
#include "Common/Algorithms/Exciter.h"
#include "Common/Algorithms/Expander.h"
#include "Common/Algorithms/RmsCompressor.h"
#include "Common/Algorithms/StripStage.h"
#include "Common/ZenStripPlugin.h"

class ZenDialogProcessor : public ZenStripPlugin {
    Q_OBJECT

public:
    static const zen::PluginDescriptor kDescriptor;

    enum Parameter : std::uint32_t {
        kRumbleFilter,
        kRumbleFrequency,
        kDePop,
        kDePopAmount,
        kDeEss,
        kDeEssAmount,
        kDeEssFrequency,
        kExpander,
        kExpanderAmount,
        kExpanderThreshold,
        kExpanderSpeed,
        kCompressor,
        kCompressorAmount,
        kExciter,
        kExciterAmount,
        kOutputGain
    };
    // Rows of the meter table: each channel's input peak; what the rumble
    // filter removes (peak); the gain change of de-pop, de-esser, expander
    // and compressor (dB, <= 0); what the exciter adds (peak); each
    // channel's output peak.
    enum Meter : std::uint32_t {
        kInputPeakMeter,
        kRumbleMeter,
        kDePopMeter,
        kDeEssMeter,
        kExpanderMeter,
        kCompressorMeter,
        kExciterMeter,
        kOutputPeakMeter
    };

    // How an amount a (0..1) sets each stage.
    // De-pop: threshold -10 dB at 0 down to -24 dB at 1. Lower would
    // squeeze a deep voice's fundamental along with the pops.
    static constexpr float kDePopThresholdAtZeroDb = -10.0f;
    static constexpr float kDePopThresholdSpanDb = 14.0f;
    // De-esser: its "Amount" 0..100 %, a band boost of up to 16.7 dB, in the "Narrow" band.
    static constexpr float kDeEssPercentAtOne = 100.0f;
    // Expander: the range, 0 to 40 dB, at a ratio of 3.
    static constexpr float kExpanderRangeAtOneDb = 40.0f;
    static constexpr float kExpanderRatio = 3.0f;
    static constexpr float kExpanderAttackMs = 1.0f;
    // "Exp Speed" is how long the expander takes to close once speech
    // stops: five release time constants.
    static constexpr float kExpanderReleasePerSpeed = 0.2f;
    static constexpr float kExpanderHoldMs = 50.0f;
    // Compressor (RMS, soft knee): threshold -12 dB at 0 down to -30 dB at
    // 1, ratio 1.5 up to 4; the makeup brings dialogue at -18 dB RMS back
    // to its level.
    static constexpr float kCompressorThresholdAtZeroDb = -12.0f;
    static constexpr float kCompressorThresholdSpanDb = 18.0f;
    static constexpr float kCompressorRatioAtZero = 1.5f;
    static constexpr float kCompressorRatioSpan = 2.5f;
    static constexpr float kCompressorKneeDb = 6.0f;
    static constexpr float kCompressorAttackMs = 10.0f;
    static constexpr float kCompressorReleaseMs = 150.0f;
    static constexpr float kCompressorRmsMs = 10.0f;
    static constexpr float kCompressorMakeupReferenceDb = -18.0f;
    // Exciter: presence above 3 kHz, mixed at up to 40 %.
    static constexpr float kExciterFrequency = 3000.0f;
    static constexpr float kExciterDriveDb = 12.0f;
    static constexpr float kExciterEvenPercent = 50.0f;
    static constexpr float kExciterMixPercentAtOne = 40.0f;
    // The tail is the rumble filter's ringing down by this much.
    static constexpr double kTailDecayDb = 120.0;

    ZenDialogProcessor();

    static const zen::ParameterTableDefinition& Definitions();
    static const zen::MeterTableDefinition& Meters();

    std::uint32_t GetTailLength() const override;
    bool ApplyNeutralSetting() override;

protected:
    void UpdateProcessingParameter(std::uint32_t index, float value) override;
    void ConfigureStages() override;
    void PublishStageMeters() noexcept override;

private:
    ButterworthHighPass m_rumble;
    DePop m_dePop;
    Deesser m_deEsser;
    Expander m_expander;
    RmsCompressor m_compressor;
    Exciter m_exciter;

    zen::StripStage m_rumbleStage{m_rumble, zen::StripStage::Measure::kChange};
    zen::StripStage m_dePopStage{m_dePop};
    zen::StripStage m_deEssStage{m_deEsser};
    zen::StripStage m_expanderStage{m_expander};
    zen::StripStage m_compressorStage{m_compressor};
    zen::StripStage m_exciterStage{m_exciter, zen::StripStage::Measure::kChange};
};
