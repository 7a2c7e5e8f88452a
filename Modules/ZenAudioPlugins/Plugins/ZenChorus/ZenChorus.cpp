#include "ZenChorus.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/Algorithms/NoteValue.h"
#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenChorus::kDescriptor = {
    "Chorus", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'e', 'n', 'y'),
    2, 2, "ZenChorus", 0, 0, -1, nullptr};

ZenChorus::ZenChorus() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenChorus::Definitions() {
    using namespace zen;
#define ZC(text) QT_TRANSLATE_NOOP("ZenChorus", text)
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenChorus",
        {
            ListParameter("VOICES", ZC("Voices"), {"1", "2", "3", "4"}, 1.0f),
            LogarithmicParameter("RATE", ZC("Rate"), 0.05f, 5.0f, 0.8f, 0.01f, "Hz"),
            NoteValueParameter("SYNC", ZC("Sync"), 0.0f),
            ContinuousParameter("TEMPO", ZC("Tempo"), 40.0f, 300.0f, 120.0f, 0.01f, "BPM"),
            ContinuousParameter("DELAY", ZC("Delay"), 6.0f, static_cast<float>(kMaxDelayMs), 12.0f, 0.01f, "ms")
                .Smoothed(working::Identity),
            ContinuousParameter("DEPTH", ZC("Depth"), 0.0f, static_cast<float>(kMaxDepthMs), 2.0f, 0.01f, "ms")
                .Smoothed(working::Identity),
            ListParameter("SHAPE", ZC("Shape"), {ZC("Sine"), ZC("Triangle"), ZC("Random")}, 0.0f),
            ContinuousParameter("SPREAD", ZC("Spread"), 0.0f, 100.0f, 70.0f, 0.1f, "%"),
            ContinuousParameter("MIX", ZC("Mix"), 0.0f, 100.0f, 50.0f, 0.1f, "%").Smoothed(working::PercentToFraction),
        });
#undef ZC
    return table;
}

const zen::MeterTableDefinition& ZenChorus::Meters() {
    static const zen::MeterTableDefinition table = zen::MakeMeterTable(
        "ZenChorus", {
                         zen::LevelMeter("OUTPUT_PEAK", QT_TRANSLATE_NOOP("ZenChorus", "Output Peak"), "dBFS", -60.0f,
                                         6.0f)
                             .PerChannel(),
                     });
    return table;
}

std::uint32_t ZenChorus::GetTailLength() const {
    const zen::ParameterTable& p = Parameters();
    const double ms = p[kDelay].GetValue() + p[kDepth].GetValue();
    return static_cast<std::uint32_t>(std::ceil(ms * GetSampleRate() / 1000.0)) + 4;
}

bool ZenChorus::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    return SetParameter(kMix, 0.0f);
}

void ZenChorus::UpdateRate() noexcept {
    for (ChorusVoiceSet& set : m_sets) set.SetRate(m_rate.Hertz());
}

void ZenChorus::Rearrange() noexcept {
    ChorusVoiceSet& current = m_sets[m_current];
    if (current.Voices() == m_voices && current.Spread() == m_spread && current.Shape() == m_shape) return;
    if (m_fresh) {
        current.Configure(m_voices, m_spread, m_shape);
        return;
    }
    if (m_fade.IsActive()) return;
    m_current ^= 1u;
    m_sets[m_current].Configure(m_voices, m_spread, m_shape);
    m_fade.Start();
}

void ZenChorus::UpdateProcessingParameter(std::uint32_t index, float value) {
    switch (index) {
        case kVoices: m_voices = static_cast<std::uint32_t>(std::lround(value)) + 1; Rearrange(); break;
        case kSpread: m_spread = value; Rearrange(); break;
        case kShape: m_shape = static_cast<Lfo::Shape>(std::lround(value)); Rearrange(); break;
        case kRate: m_rate.SetHertz(value); UpdateRate(); break;
        case kSync: m_rate.SetSync(value); UpdateRate(); break;
        case kTempo: m_rate.SetTempo(value); UpdateRate(); break;
        default: break;
    }
}

void ZenChorus::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    // Reads reach back over the block already written, too.
    for (ModulatedDelayLine& line : m_lines)
        line.Resize((kMaxDelayMs + kMaxDepthMs) * sampleRate / 1000.0 + 1.0 + maxBlockSize);
    m_centre.assign(maxBlockSize, 0.0);
    m_swing.assign(maxBlockSize, 0.0);
    m_mix.assign(maxBlockSize, 0.0f);
    m_wet.assign(maxBlockSize, 0.0f);
    m_fadingWet.assign(maxBlockSize, 0.0f);
    for (ChorusVoiceSet& set : m_sets) set.SetSampleRate(sampleRate);
    m_fade.Prepare(sampleRate);
    SetLatency(0);
    ResetProcessing();
}

void ZenChorus::ResetProcessing() {
    for (ModulatedDelayLine& line : m_lines) line.Clear();
    m_fade.Finish();
    m_fresh = true;
    m_sets[m_current].Configure(m_voices, m_spread, m_shape);
}

void ZenChorus::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    m_fresh = false;
    const double samplesPerMs = GetSampleRate() / 1000.0;
    const bool fading = m_fade.IsActive();
    for (std::uint32_t c = 0; c < channelCount && c < kMaxChannels; ++c) {
        auto delay = Smoothed(kDelay).Track(c);
        auto depth = Smoothed(kDepth).Track(c);
        auto mix = Smoothed(kMix).Track(c);
        for (std::uint32_t i = 0; i < frames; ++i) {
            m_centre[i] = delay.Next() * samplesPerMs;
            m_swing[i] = depth.Next() * samplesPerMs;
            m_mix[i] = static_cast<float>(mix.Next());
        }
        // The shortest delay (6 - 5 ms) is longer than two samples, so every
        // read of frame i, frames - i samples behind the head, is of input
        // that arrived by then.
        ModulatedDelayLine& line = m_lines[c];
        float* samples = channels[c];
        for (std::uint32_t i = 0; i < frames; ++i) line.Push(samples[i]);
        float* wet = m_wet.data();
        m_sets[m_current].Render(line, c, m_centre.data(), m_swing.data(), wet, frames);
        if (fading) {
            m_sets[m_current ^ 1u].Render(line, c, m_centre.data(), m_swing.data(), m_fadingWet.data(), frames);
            m_fade.Blend(m_fadingWet.data(), wet, frames);
        }
        float peak = 0.0f;
        for (std::uint32_t i = 0; i < frames; ++i) {
            samples[i] = (1.0f - m_mix[i]) * samples[i] + m_mix[i] * wet[i];
            peak = std::max(peak, std::fabs(samples[i]));
        }
        PublishMeter(kOutputPeak, c, peak);
    }
    if (fading) {
        m_fade.Advance(frames);
        if (!m_fade.IsActive()) Rearrange();
    }
}

template class ZenAudioPlugin<ZenChorus>;
