#include "ZenFlanger.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/Algorithms/NoteValue.h"
#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenFlanger::kDescriptor = {
    "Flanger", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'e', 'n', 'y'),
    2, 2, "ZenFlanger", 0x80, 0, -1, nullptr};

ZenFlanger::ZenFlanger() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenFlanger::Definitions() {
    using namespace zen;
#define ZF(text) QT_TRANSLATE_NOOP("ZenFlanger", text)
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenFlanger",
        {
            LogarithmicParameter("MANUAL", ZF("Manual"), 0.1f, static_cast<float>(kMaxManualMs), 0.5f, 0.01f, "ms")
                .Smoothed(working::Identity),
            ContinuousParameter("DEPTH", ZF("Depth"), 0.0f, static_cast<float>(kMaxDepthMs), 3.0f, 0.01f, "ms")
                .Smoothed(working::Identity),
            LogarithmicParameter("RATE", ZF("Rate"), 0.02f, 5.0f, 0.25f, 0.01f, "Hz"),
            NoteValueParameter("SYNC", ZF("Sync"), 0.0f),
            ContinuousParameter("TEMPO", ZF("Tempo"), 40.0f, 300.0f, 120.0f, 0.01f, "BPM"),
            ContinuousParameter("FEEDBACK", ZF("Feedback"), static_cast<float>(-kMaxFeedback),
                                static_cast<float>(kMaxFeedback), 50.0f, 0.1f, "%")
                .Smoothed(working::PercentToFraction),
            ListParameter("SHAPE", ZF("Shape"), {ZF("Sine"), ZF("Triangle"), ZF("Random")}, 1.0f),
            ContinuousParameter("SPREAD", ZF("Spread"), 0.0f, 100.0f, 25.0f, 0.1f, "%"),
            ContinuousParameter("MIX", ZF("Mix"), 0.0f, 100.0f, 50.0f, 0.1f, "%").Smoothed(working::PercentToFraction),
        });
#undef ZF
    return table;
}

const zen::MeterTableDefinition& ZenFlanger::Meters() {
    static const zen::MeterTableDefinition table = zen::MakeMeterTable(
        "ZenFlanger", {
                          zen::LevelMeter("OUTPUT_PEAK", QT_TRANSLATE_NOOP("ZenFlanger", "Output Peak"), "dBFS",
                                          -60.0f, 6.0f)
                              .PerChannel(),
                      });
    return table;
}

std::uint32_t ZenFlanger::GetTailLength() const {
    const zen::ParameterTable& p = Parameters();
    const double longestMs = p[kManual].GetValue() + p[kDepth].GetValue();
    const double feedback = std::fabs(p[kFeedback].GetValue()) / 100.0;
    const double repeats = feedback > 0.0 ? std::ceil(kTailDb / (-20.0 * std::log10(feedback))) : 1.0;
    // The loop's low cut rings for kTailDb after the last repeat.
    const double ringing = kTailDb * std::log(10.0) / 20.0 * 2.0 * FeedbackPath::kButterworthQ /
                           (2.0 * 3.141592653589793 * kLoopLowCut);
    const double seconds = repeats * longestMs / 1000.0 + (feedback > 0.0 ? ringing : 0.0);
    return static_cast<std::uint32_t>(std::ceil(seconds * GetSampleRate())) + 4;
}

bool ZenFlanger::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    return SetParameter(kMix, 0.0f);
}

void ZenFlanger::UpdateRate() noexcept {
    const double rate = m_rate.Hertz();
    for (Lfo& lfo : m_lfos) lfo.SetRate(rate);
}

void ZenFlanger::UpdatePhases() noexcept {
    for (std::uint32_t c = 0; c < kMaxChannels; ++c) {
        m_lfos[c].SetPhase(0.5 * c * m_spread / 100.0);
        m_lfos[c].Reset();
    }
}

void ZenFlanger::UpdateProcessingParameter(std::uint32_t index, float value) {
    switch (index) {
        case kSpread:
            if (value != m_spread) {  // the sweeps restart only on a real change
                m_spread = value;
                UpdatePhases();
            }
            break;
        case kShape:
            // Glides to the new shape, but not before the first block.
            for (Lfo& lfo : m_lfos) {
                lfo.SetShape(static_cast<Lfo::Shape>(std::lround(value)));
                if (m_fresh) lfo.SettleShape();
            }
            break;
        case kRate: m_rate.SetHertz(value); UpdateRate(); break;
        case kSync: m_rate.SetSync(value); UpdateRate(); break;
        case kTempo: m_rate.SetTempo(value); UpdateRate(); break;
        default: break;
    }
}

void ZenFlanger::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    (void)maxBlockSize;
    for (ModulatedDelayLine& line : m_lines) line.Resize((kMaxManualMs + kMaxDepthMs) * sampleRate / 1000.0 + 1.0);
    for (Lfo& lfo : m_lfos) lfo.SetSampleRate(sampleRate);
    m_feedbackPath.Prepare(sampleRate, kMaxChannels);
    m_feedbackPath.SetCuts(kLoopLowCut, 0.0);
    SetLatency(0);
    ResetProcessing();
}

void ZenFlanger::ResetProcessing() {
    m_fresh = true;
    for (ModulatedDelayLine& line : m_lines) line.Clear();
    m_feedbackPath.Reset();
    UpdatePhases();
}

void ZenFlanger::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    m_fresh = false;
    const double samplesPerMs = GetSampleRate() / 1000.0;
    for (std::uint32_t c = 0; c < channelCount && c < kMaxChannels; ++c) {
        auto manual = Smoothed(kManual).Track(c);
        auto depth = Smoothed(kDepth).Track(c);
        auto feedback = Smoothed(kFeedback).Track(c);
        auto mix = Smoothed(kMix).Track(c);
        ModulatedDelayLine& line = m_lines[c];
        Lfo& lfo = m_lfos[c];
        float* samples = channels[c];
        float peak = 0.0f;
        for (std::uint32_t i = 0; i < frames; ++i) {
            // From Manual up to Manual + Depth: the sweep never passes through zero.
            const double sweep = 0.5 * (1.0 + lfo.Next());
            const double delay = (manual.Next() + depth.Next() * sweep) * samplesPerMs;
            const auto g = static_cast<float>(feedback.Next());
            const auto m = static_cast<float>(mix.Next());
            const float y = line.Read(delay);
            const float x = samples[i];
            line.Push(x + g * m_feedbackPath.Process(c, y));
            samples[i] = (1.0f - m) * x + m * y;
            peak = std::max(peak, std::fabs(samples[i]));
        }
        PublishMeter(kOutputPeak, c, peak);
    }
}

template class ZenAudioPlugin<ZenFlanger>;
