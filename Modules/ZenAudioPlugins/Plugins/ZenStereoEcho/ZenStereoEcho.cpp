#include "ZenStereoEcho.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/Algorithms/EchoMix.h"
#include "Common/Algorithms/NoteValue.h"
#include "Common/Decibels.h"
#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenStereoEcho::kDescriptor = {
    "Echo", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'e', 'n', 'y'),
    2, 2, "ZenStereoEcho", 0, 0, -1, nullptr};

double ZenStereoEcho::TimeMs(float time, int sync, float tempo) {
    const double ms = sync > 0 ? zen::NoteValueMs(sync, tempo) : time;
    return std::min(std::max(ms, kMinTimeMs), kMaxTimeMs);
}

ZenStereoEcho::ZenStereoEcho() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenStereoEcho::Definitions() {
    using namespace zen;
#define ZE(text) QT_TRANSLATE_NOOP("ZenStereoEcho", text)
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenStereoEcho",
        {
            LogarithmicParameter("TIME", ZE("Time"), static_cast<float>(kMinTimeMs), static_cast<float>(kMaxTimeMs),
                                 350.0f, 0.01f, "ms"),
            NoteValueParameter("SYNC", ZE("Sync"), 0.0f),
            ContinuousParameter("TEMPO", ZE("Tempo"), 40.0f, 300.0f, 120.0f, 0.01f, "BPM"),
            ContinuousParameter("FEEDBACK", ZE("Feedback"), 0.0f, 110.0f, 45.0f, 0.1f, "%")
                .SmoothedSingle(working::PercentToFraction),
            ContinuousParameter("DRIVE", ZE("Drive"), 0.0f, 24.0f, 3.0f, 0.1f, "dB").SmoothedSingle(working::DbToGain),
            LogarithmicParameter("TONE", ZE("Tone"), 1000.0f, 12000.0f, 3500.0f, 1.0f, "Hz"),
            ContinuousParameter("WOW", ZE("Wow"), 0.0f, 100.0f, 25.0f, 0.1f, "%").SmoothedSingle(working::PercentToFraction),
            ContinuousParameter("FLUTTER", ZE("Flutter"), 0.0f, 100.0f, 15.0f, 0.1f, "%")
                .SmoothedSingle(working::PercentToFraction),
            ContinuousParameter("MIX", ZE("Mix"), 0.0f, 100.0f, 30.0f, 0.1f, "%").SmoothedSingle(working::PercentToFraction),
        });
#undef ZE
    return table;
}

const zen::MeterTableDefinition& ZenStereoEcho::Meters() {
    static const zen::MeterTableDefinition table = zen::MakeMeterTable(
        "ZenStereoEcho",
        {
            zen::LevelMeter("OUTPUT_PEAK", QT_TRANSLATE_NOOP("ZenStereoEcho", "Output Peak"), "dBFS", -60.0f, 6.0f)
                .PerChannel(),
        });
    return table;
}

std::uint32_t ZenStereoEcho::GetTailLength() const {
    const zen::ParameterTable& p = Parameters();
    const double ms =
        TimeMs(p[kTime].GetValue(), static_cast<int>(std::lround(p[kSync].GetValue())), p[kTempo].GetValue()) + kWowMs +
        kFlutterMs;
    const double feedback = p[kFeedback].GetValue() / 100.0;
    double seconds = kLongestTailSeconds;
    if (feedback < 1.0) {
        // Saturation and the cuts only take away from the feedback's own decay.
        const double repeats = feedback > 0.0 ? std::ceil(kTailDb / (-20.0 * std::log10(feedback))) : 1.0;
        const double ringing =
            kTailDb * std::log(10.0) / 20.0 * 2.0 * FeedbackPath::kButterworthQ / (2.0 * 3.141592653589793 * kLowCut);
        seconds = std::min(repeats * ms / 1000.0 + ringing, kLongestTailSeconds);
    }
    return static_cast<std::uint32_t>(std::ceil(seconds * GetSampleRate()));
}

bool ZenStereoEcho::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    return SetParameter(kMix, 0.0f);
}

void ZenStereoEcho::UpdateTime() noexcept {
    m_glide.SetTarget(TimeMs(m_time, m_sync, m_tempo) * GetSampleRate() / 1000.0);
}

void ZenStereoEcho::UpdateProcessingParameter(std::uint32_t index, float value) {
    switch (index) {
        case kTime:
            m_time = value;
            UpdateTime();
            break;
        case kSync:
            m_sync = static_cast<int>(std::lround(value));
            UpdateTime();
            break;
        case kTempo:
            m_tempo = value;
            UpdateTime();
            break;
        case kTone: m_feedbackPath.SetCuts(kLowCut, value); break;
        default: break;
    }
}

void ZenStereoEcho::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    (void)maxBlockSize;
    const zen::ParameterTable& p = Parameters();
    m_time = p[kTime].GetValue();
    m_sync = static_cast<int>(std::lround(p[kSync].GetValue()));
    m_tempo = p[kTempo].GetValue();
    for (ModulatedDelayLine& line : m_lines)
        line.Resize((kMaxTimeMs + kWowMs + kFlutterMs) * sampleRate / 1000.0 + 1.0);
    m_glide.SetSampleRate(sampleRate);
    UpdateTime();
    m_wow.SetSampleRate(sampleRate);
    m_wow.SetShape(Lfo::kRandom);
    m_wow.SetRate(kWowHz);
    m_flutter.SetSampleRate(sampleRate);
    m_flutter.SetRate(kFlutterHz);
    m_feedbackPath.Prepare(sampleRate, kMaxChannels);
    m_feedbackPath.SetCuts(kLowCut, p[kTone].GetValue());
    SetLatency(0);
    ResetProcessing();
}

void ZenStereoEcho::ResetProcessing() {
    for (ModulatedDelayLine& line : m_lines) line.Clear();
    m_glide.Settle();
    m_wow.Reset();
    m_flutter.Reset();
    m_feedbackPath.Reset();
}

void ZenStereoEcho::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    auto feedback = Smoothed(kFeedback).Track(0);
    auto drive = Smoothed(kDrive).Track(0);
    auto wow = Smoothed(kWow).Track(0);
    auto flutter = Smoothed(kFlutter).Track(0);
    auto mix = Smoothed(kMix).Track(0);
    const double samplesPerMs = GetSampleRate() / 1000.0;
    const std::uint32_t count = std::min(channelCount, kMaxChannels);
    float peaks[kMaxChannels] = {0.0f, 0.0f};
    for (std::uint32_t i = 0; i < frames; ++i) {
        const double swing =
            (kWowMs * wow.Next() * m_wow.Next() + kFlutterMs * flutter.Next() * m_flutter.Next()) * samplesPerMs;
        const double delay = m_glide.Next() + swing;
        const auto g = static_cast<float>(feedback.Next());
        const auto k = static_cast<float>(drive.Next());
        const auto m = static_cast<float>(mix.Next());
        const float dry = zen::EchoDryGain(m), wet = zen::EchoWetGain(m);
        for (std::uint32_t c = 0; c < count; ++c) {
            const float y = m_lines[c].Read(delay);
            const float x = channels[c][i];
            m_lines[c].Push(Saturate(x + g * m_feedbackPath.Process(c, y), k));
            const float out = dry * x + wet * y;
            channels[c][i] = out;
            peaks[c] = std::max(peaks[c], std::fabs(out));
        }
    }
    for (std::uint32_t c = 0; c < count; ++c) PublishMeter(kOutputPeak, c, peaks[c]);
}

template class ZenAudioPlugin<ZenStereoEcho>;
