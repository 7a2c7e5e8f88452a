#include "ZenModulation.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/Algorithms/NoteValue.h"
#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenModulation::kDescriptor = {
    "Modulation", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'M', 'l'),
    8, 8, "ZenModulation", 0, 0, -1, nullptr};

namespace {

constexpr double kPi = 3.141592653589793;

}  // namespace

ZenModulation::ZenModulation() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenModulation::Definitions() {
    using namespace zen;
#define ZM(text) QT_TRANSLATE_NOOP("ZenModulation", text)
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenModulation",
        {
            ListParameter("MODE", ZM("Mode"), {ZM("Phaser"), ZM("Tremolo"), ZM("Vibrato"), ZM("Auto-Pan")}, 0.0f),
            LogarithmicParameter("RATE", ZM("Rate"), 0.02f, 20.0f, 0.5f, 0.01f, "Hz"),
            NoteValueParameter("SYNC", ZM("Sync"), 0.0f),
            ContinuousParameter("TEMPO", ZM("Tempo"), 40.0f, 300.0f, 120.0f, 0.01f, "BPM"),
            ContinuousParameter("DEPTH", ZM("Depth"), 0.0f, 100.0f, 50.0f, 0.1f, "%").Smoothed(working::PercentToFraction),
            ListParameter("SHAPE", ZM("Shape"), {ZM("Sine"), ZM("Triangle"), ZM("Random")}, 0.0f),
            ContinuousParameter("SPREAD", ZM("Spread"), 0.0f, 100.0f, 50.0f, 0.1f, "%"),
            LogarithmicParameter("FREQUENCY", ZM("Frequency"), 100.0f, 4000.0f, 800.0f, 1.0f, "Hz")
                .Smoothed(working::Identity),
            ListParameter("STAGES", ZM("Stages"), {"2", "4", "6", "8", "12"}, 1.0f),
            ContinuousParameter("FEEDBACK", ZM("Feedback"), -90.0f, 90.0f, 40.0f, 0.1f, "%").Smoothed(working::PercentToFraction),
            ContinuousParameter("MIX", ZM("Mix"), 0.0f, 100.0f, 50.0f, 0.1f, "%").Smoothed(working::PercentToFraction),
        });
#undef ZM
    return table;
}

const zen::MeterTableDefinition& ZenModulation::Meters() {
    static const zen::MeterTableDefinition table = zen::MakeMeterTable(
        "ZenModulation",
        {
            zen::LevelMeter("OUTPUT_PEAK", QT_TRANSLATE_NOOP("ZenModulation", "Output Peak"), "dBFS", -60.0f, 6.0f)
                .PerChannel(),
        });
    return table;
}

double ZenModulation::AllpassCoefficient(double frequency, double sampleRate) {
    const double t = std::tan(kPi * frequency / sampleRate);
    return (t - 1.0) / (t + 1.0);
}

std::uint32_t ZenModulation::GetTailLength() const {
    const zen::ParameterTable& p = Parameters();
    const double rate = GetSampleRate();
    switch (static_cast<Mode>(std::lround(p[kMode].GetValue()))) {
        case kPhaser: {
            // Each section holds a low break frequency f for about 1 / (2 pi f);
            // the feedback goes round the whole chain.
            const auto stages = kStageCounts[std::min<long>(std::lround(p[kStages].GetValue()), 4)];
            const double lowest = p[kFrequency].GetValue() * std::exp2(-kPhaserOctaves * p[kDepth].GetValue() / 100.0);
            const double feedback = std::fabs(p[kFeedback].GetValue()) / 100.0;
            const double nepers = kTailDb * std::log(10.0) / 20.0;
            const double loops = feedback > 0.0 ? kTailDb / (-20.0 * std::log10(feedback)) : 0.0;
            const double seconds = (nepers + 2.0 * loops) * stages / (2.0 * kPi * lowest);
            return static_cast<std::uint32_t>(std::ceil(seconds * rate));
        }
        case kVibrato:
            return static_cast<std::uint32_t>(std::ceil((kVibratoCentreMs + kVibratoMs) * rate / 1000.0)) + 4;
        default: return 0;
    }
}

bool ZenModulation::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    return SetParameter(kMix, 0.0f);
}

void ZenModulation::UpdateRate() noexcept {
    const double rate = m_rate.Hertz();
    for (Lfo& lfo : m_lfos) lfo.SetRate(rate);
}

void ZenModulation::UpdatePhases() noexcept {
    for (std::uint32_t c = 0; c < kMaxChannels; ++c) {
        // A pair pans on its first channel's LFO.
        const std::uint32_t n = m_mode == kAutoPan ? c / 2 * 2 : c;
        m_lfos[c].SetPhase(m_spread / 100.0 * n / m_channelCount);
        m_lfos[c].Reset();
    }
}

void ZenModulation::UpdateProcessingParameter(std::uint32_t index, float value) {
    switch (index) {
        // The LFOs restart their cycles only when their spacing really changes.
        case kMode: {
            const auto mode = static_cast<Mode>(std::lround(value));
            if (mode != m_mode) {
                m_mode = mode;
                UpdatePhases();
            }
            break;
        }
        case kStages: m_stages = kStageCounts[std::min<long>(std::lround(value), 4)]; break;
        case kSpread:
            if (value != m_spread) {
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
        case kRate:
            m_rate.SetHertz(value);
            UpdateRate();
            break;
        case kSync:
            m_rate.SetSync(value);
            UpdateRate();
            break;
        case kTempo:
            m_rate.SetTempo(value);
            UpdateRate();
            break;
        default: break;
    }
}

void ZenModulation::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    (void)maxBlockSize;
    m_channelCount = std::max(1u, GetProcessChannelCount());
    for (ModulatedDelayLine& line : m_lines) line.Resize((kVibratoCentreMs + kVibratoMs) * sampleRate / 1000.0 + 1.0);
    for (Lfo& lfo : m_lfos) lfo.SetSampleRate(sampleRate);
    SetLatency(0);
    ResetProcessing();
}

void ZenModulation::ResetProcessing() {
    m_fresh = true;
    for (ModulatedDelayLine& line : m_lines) line.Clear();
    std::fill(m_phasers.begin(), m_phasers.end(), Phaser{});
    m_position = 0;
    UpdatePhases();
}

void ZenModulation::RunPhaser(std::uint32_t c, float* samples, std::uint32_t frames) noexcept {
    auto depth = Smoothed(kDepth).Track(c);
    auto frequency = Smoothed(kFrequency).Track(c);
    auto feedback = Smoothed(kFeedback).Track(c);
    auto mix = Smoothed(kMix).Track(c);
    Phaser& p = m_phasers[c];
    Lfo& lfo = m_lfos[c];
    const double nyquistGuard = 0.45 * GetSampleRate();
    for (std::uint32_t i = 0; i < frames; ++i) {
        const double centre = frequency.Next();
        const double swing = kPhaserOctaves * depth.Next() * lfo.Next();
        if ((m_position + i) % kRetuneStep == 0)
            p.a = AllpassCoefficient(std::min(centre * std::exp2(swing), nyquistGuard), GetSampleRate());
        const double a = p.a;
        const float x = samples[i];
        // Bad samples enter the chain as silence, huge ones clamped, so its state stays finite.
        const float clean =
            std::isfinite(x) ? std::clamp(x, -ModulatedDelayLine::kCeiling, ModulatedDelayLine::kCeiling) : 0.0f;
        double u = clean + feedback.Next() * p.last;
        for (std::uint32_t s = 0; s < m_stages; ++s) {
            const double y = a * u + p.state[s];
            p.state[s] = (u - a * y + 1e-18) - 1e-18;
            u = y;
        }
        p.last = u;
        const auto m = static_cast<float>(mix.Next());
        samples[i] = (1.0f - m) * x + m * static_cast<float>(u);
    }
}

void ZenModulation::RunTremolo(std::uint32_t c, float* samples, std::uint32_t frames) noexcept {
    auto depth = Smoothed(kDepth).Track(c);
    auto mix = Smoothed(kMix).Track(c);
    Lfo& lfo = m_lfos[c];
    for (std::uint32_t i = 0; i < frames; ++i) {
        // From whole at the LFO's top down to 1 - depth at its bottom.
        const auto gain = static_cast<float>(1.0 - depth.Next() * 0.5 * (1.0 - lfo.Next()));
        const auto m = static_cast<float>(mix.Next());
        samples[i] *= (1.0f - m) + m * gain;
    }
}

void ZenModulation::RunVibrato(std::uint32_t c, float* samples, std::uint32_t frames) noexcept {
    auto depth = Smoothed(kDepth).Track(c);
    auto mix = Smoothed(kMix).Track(c);
    Lfo& lfo = m_lfos[c];
    ModulatedDelayLine& line = m_lines[c];
    const double samplesPerMs = GetSampleRate() / 1000.0;
    for (std::uint32_t i = 0; i < frames; ++i) {
        const double delay = (kVibratoCentreMs + kVibratoMs * depth.Next() * lfo.Next()) * samplesPerMs;
        const float y = line.Read(delay);
        const float x = samples[i];
        line.Push(x);
        const auto m = static_cast<float>(mix.Next());
        samples[i] = (1.0f - m) * x + m * y;
    }
}

void ZenModulation::RunAutoPan(std::uint32_t c, float* left, float* right, std::uint32_t frames) noexcept {
    auto depth = Smoothed(kDepth).Track(c);
    auto mix = Smoothed(kMix).Track(c);
    Lfo& lfo = m_lfos[c];
    for (std::uint32_t i = 0; i < frames; ++i) {
        const auto position = static_cast<float>(depth.Next() * lfo.Next());  // -1 left .. +1 right
        const auto m = static_cast<float>(mix.Next());
        const float l = 1.0f - std::max(0.0f, position);
        const float r = 1.0f + std::min(0.0f, position);
        left[i] *= (1.0f - m) + m * l;
        right[i] *= (1.0f - m) + m * r;
    }
}

void ZenModulation::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    m_fresh = false;
    const std::uint32_t count = std::min(channelCount, kMaxChannels);
    for (std::uint32_t c = 0; c < count; ++c) {
        switch (m_mode) {
            case kPhaser: RunPhaser(c, channels[c], frames); break;
            case kTremolo: RunTremolo(c, channels[c], frames); break;
            case kVibrato: RunVibrato(c, channels[c], frames); break;
            case kAutoPan:
                if (c % 2 == 0 && c + 1 < count) RunAutoPan(c, channels[c], channels[c + 1], frames);
                break;
        }
    }
    m_position += frames;
    for (std::uint32_t c = 0; c < count; ++c) {
        float peak = 0.0f;
        for (std::uint32_t i = 0; i < frames; ++i) peak = std::max(peak, std::fabs(channels[c][i]));
        PublishMeter(kOutputPeak, c, peak);
    }
}

template class ZenAudioPlugin<ZenModulation>;
