#include "ZenStereoDelay.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/Algorithms/EchoMix.h"
#include "Common/Algorithms/NoteValue.h"
#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenStereoDelay::kDescriptor = {
    "Delay", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'e', 'n', 'y'),
    2, 2, "ZenStereoDelay", 0, 0, -1, nullptr};

ZenStereoDelay::ZenStereoDelay() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenStereoDelay::Definitions() {
    using namespace zen;
#define ZD(text) QT_TRANSLATE_NOOP("ZenStereoDelay", text)
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenStereoDelay",
        {
            LogarithmicParameter("TIME_L", ZD("Time L"), 1.0f, static_cast<float>(kMaxTimeMs), 375.0f, 0.01f, "ms"),
            LogarithmicParameter("TIME_R", ZD("Time R"), 1.0f, static_cast<float>(kMaxTimeMs), 500.0f, 0.01f, "ms"),
            SwitchParameter("LINK", ZD("Link"), 0.0f),
            NoteValueParameter("SYNC_L", ZD("Sync L"), 0.0f),
            NoteValueParameter("SYNC_R", ZD("Sync R"), 0.0f),
            ContinuousParameter("TEMPO", ZD("Tempo"), 40.0f, 300.0f, 120.0f, 0.01f, "BPM"),
            ContinuousParameter("FEEDBACK", ZD("Feedback"), 0.0f, 100.0f, 35.0f, 0.1f, "%")
                .SmoothedSingle(working::PercentToFraction),
            SwitchParameter("PING_PONG", ZD("Ping-Pong"), 0.0f),
            LogarithmicParameter("LOW_CUT", ZD("Low Cut"), 20.0f, 2000.0f, 80.0f, 1.0f, "Hz"),
            LogarithmicParameter("HIGH_CUT", ZD("High Cut"), 1000.0f, 20000.0f, 12000.0f, 1.0f, "Hz"),
            ContinuousParameter("MIX", ZD("Mix"), 0.0f, 100.0f, 30.0f, 0.1f, "%").SmoothedSingle(working::PercentToFraction),
        });
#undef ZD
    return table;
}

const zen::MeterTableDefinition& ZenStereoDelay::Meters() {
    static const zen::MeterTableDefinition table = zen::MakeMeterTable(
        "ZenStereoDelay",
        {
            zen::LevelMeter("OUTPUT_PEAK", QT_TRANSLATE_NOOP("ZenStereoDelay", "Output Peak"), "dBFS", -60.0f, 6.0f)
                .PerChannel(),
        });
    return table;
}

double ZenStereoDelay::SideTimeMs(float time, float sync, float tempo) {
    const int note = static_cast<int>(std::lround(sync));
    const double ms = note > 0 ? zen::NoteValueMs(note, tempo) : time;
    return std::min(ms, kMaxTimeMs);
}

std::uint32_t ZenStereoDelay::GetTailLength() const {
    const zen::ParameterTable& p = Parameters();
    const bool link = p[kLink].GetValue() >= 0.5f;
    const float tempo = p[kTempo].GetValue();
    const double left = SideTimeMs(p[kTimeL].GetValue(), p[kSyncL].GetValue(), tempo);
    const double right = link ? left : SideTimeMs(p[kTimeR].GetValue(), p[kSyncR].GetValue(), tempo);
    const double feedback = p[kFeedback].GetValue() / 100.0;
    // Each repeat is the feedback times the one before, and the cuts only take away.
    const double perRepeatDb = feedback > 0.0 ? -20.0 * std::log10(feedback) : kTailDb;
    const double repeats = std::ceil(kTailDb / std::max(perRepeatDb, 1e-9));
    // The low cut rings longest: 2 pi f / (2 Q) nepers a second, followed for kTailDb.
    const double ringing = kTailDb * std::log(10.0) / 20.0 * 2.0 * FeedbackPath::kButterworthQ /
                           (2.0 * 3.141592653589793 * p[kLowCut].GetValue());
    // Each crossing of a line, also ping-pong's, is at most the longer time.
    const double seconds = std::min(repeats * std::max(left, right) / 1000.0 + ringing, kLongestTailSeconds);
    return static_cast<std::uint32_t>(std::ceil(seconds * GetSampleRate()));
}

bool ZenStereoDelay::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    return SetParameter(kMix, 0.0f);
}

void ZenStereoDelay::UpdateTimes() noexcept {
    const double rate = GetSampleRate();
    const double left = SideTimeMs(m_values[kTimeL], m_values[kSyncL], m_values[kTempo]);
    const double right =
        m_values[kLink] >= 0.5f ? left : SideTimeMs(m_values[kTimeR], m_values[kSyncR], m_values[kTempo]);
    m_glides[0].SetTarget(left * rate / 1000.0);
    m_glides[1].SetTarget(right * rate / 1000.0);
}

void ZenStereoDelay::UpdateProcessingParameter(std::uint32_t index, float value) {
    if (index >= m_values.size()) return;
    m_values[index] = value;
    switch (index) {
        case kPingPong: m_pingPong = value >= 0.5f; break;
        case kLowCut:
        case kHighCut: m_feedbackPath.SetCuts(m_values[kLowCut], m_values[kHighCut]); break;
        case kFeedback:
        case kMix: break;
        default: UpdateTimes(); break;
    }
}

void ZenStereoDelay::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    (void)maxBlockSize;
    const zen::ParameterTable& p = Parameters();
    for (std::uint32_t i = 0; i < m_values.size(); ++i) m_values[i] = p[i].GetValue();
    m_pingPong = m_values[kPingPong] >= 0.5f;
    for (ModulatedDelayLine& line : m_lines) line.Resize(kMaxTimeMs * sampleRate / 1000.0);
    for (TimeGlide& glide : m_glides) glide.SetSampleRate(sampleRate);
    m_feedbackPath.Prepare(sampleRate, 2);
    m_feedbackPath.SetCuts(m_values[kLowCut], m_values[kHighCut]);
    UpdateTimes();
    SetLatency(0);
    ResetProcessing();
}

void ZenStereoDelay::ResetProcessing() {
    for (ModulatedDelayLine& line : m_lines) line.Clear();
    for (TimeGlide& glide : m_glides) glide.Settle();
    m_feedbackPath.Reset();
}

void ZenStereoDelay::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    auto feedback = Smoothed(kFeedback).Track(0);
    auto mix = Smoothed(kMix).Track(0);
    const bool stereo = channelCount > 1;
    const bool pingPong = stereo && m_pingPong;
    float* left = channels[0];
    float* right = stereo ? channels[1] : nullptr;
    float peaks[2] = {0.0f, 0.0f};
    for (std::uint32_t i = 0; i < frames; ++i) {
        const auto g = static_cast<float>(feedback.Next());
        const auto m = static_cast<float>(mix.Next());
        const float dry = zen::EchoDryGain(m), wet = zen::EchoWetGain(m);
        const float xl = left[i];
        const float yl = m_lines[0].Read(m_glides[0].Next());
        const float fl = g * m_feedbackPath.Process(0, yl);
        const double timeR = m_glides[1].Next();
        if (stereo) {
            const float xr = right[i];
            const float yr = m_lines[1].Read(timeR);
            const float fr = g * m_feedbackPath.Process(1, yr);
            if (pingPong) {
                m_lines[0].Push(0.5f * (xl + xr) + fr);
                m_lines[1].Push(fl);
            } else {
                m_lines[0].Push(xl + fl);
                m_lines[1].Push(xr + fr);
            }
            right[i] = dry * xr + wet * yr;
            peaks[1] = std::max(peaks[1], std::fabs(right[i]));
        } else {
            m_lines[0].Push(xl + fl);
        }
        left[i] = dry * xl + wet * yl;
        peaks[0] = std::max(peaks[0], std::fabs(left[i]));
    }
    for (std::uint32_t c = 0; c < channelCount && c < 2; ++c) PublishMeter(kOutputPeak, c, peaks[c]);
}

template class ZenAudioPlugin<ZenStereoDelay>;
