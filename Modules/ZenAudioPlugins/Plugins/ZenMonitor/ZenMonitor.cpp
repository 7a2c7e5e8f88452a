#include "ZenMonitor.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenMonitor::kDescriptor = {
    "Monitor", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'M', 'n'),
    0, 32, "ZenMonitor", 0, 0, -1, nullptr};

namespace {

constexpr double kPi = 3.141592653589793;

}  // namespace

ZenMonitor::ZenMonitor() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenMonitor::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenMonitor",
        {
            ListParameter("SIGNAL", QT_TRANSLATE_NOOP("ZenMonitor", "Signal"),
                          {QT_TRANSLATE_NOOP("ZenMonitor", "Pink Noise"), QT_TRANSLATE_NOOP("ZenMonitor", "Sine"),
                           QT_TRANSLATE_NOOP("ZenMonitor", "Polarity Pulse")},
                          kPinkNoise),
            ListParameter("OUTPUT", QT_TRANSLATE_NOOP("ZenMonitor", "Output"),
                          {QT_TRANSLATE_NOOP("ZenMonitor", "Walk"), QT_TRANSLATE_NOOP("ZenMonitor", "All"),
                           "1",  "2",  "3",  "4",  "5",  "6",  "7",  "8",  "9",  "10", "11",
                           "12", "13", "14", "15", "16", "17", "18", "19", "20", "21", "22",
                           "23", "24", "25", "26", "27", "28", "29", "30", "31", "32"},
                          kWalk),
            ContinuousParameter("WALK_TIME", QT_TRANSLATE_NOOP("ZenMonitor", "Walk Time"), 0.5f, 10.0f, 2.0f, 0.1f,
                                "s"),
            LogarithmicParameter("FREQUENCY", QT_TRANSLATE_NOOP("ZenMonitor", "Frequency"), 20.0f, 20000.0f, 1000.0f,
                                 1.0f, "Hz")
                .SmoothedSingle(working::Identity),
            ContinuousParameter("LEVEL", QT_TRANSLATE_NOOP("ZenMonitor", "Level"), -60.0f, -10.0f, -20.0f, 0.1f,
                                "dBFS")
                .SmoothedSingle(working::DbToGain),
        });
    return table;
}

const zen::MeterTableDefinition& ZenMonitor::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenMonitor", {
                          ValueMeter("CHANNEL", QT_TRANSLATE_NOOP("ZenMonitor", "Channel"), "", 0.0f, 32.0f),
                          LevelMeter("PEAK", QT_TRANSLATE_NOOP("ZenMonitor", "Peak"), "dBFS", -60.0f, 0.0f),
                      });
    return table;
}

bool ZenMonitor::AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const {
    return inputs == 0 && outputs >= 1 && outputs <= kDescriptor.outputChannelLimit;
}

bool ZenMonitor::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    return false;  // a source: nothing passes through
}

void ZenMonitor::UpdateProcessingParameter(std::uint32_t index, float value) {
    switch (index) {
        case kSignal: m_signal = static_cast<Signal>(std::clamp<long>(std::lround(value), kPinkNoise, kPolarityPulse)); break;
        case kOutput: {
            const int output = static_cast<int>(std::lround(value));
            if (output == kWalk && m_output != kWalk) m_walkPosition = 0;  // a walk starts at channel 1
            m_output = output;
            break;
        }
        case kWalkTime:
            m_walkSamples = std::max<std::uint64_t>(1, static_cast<std::uint64_t>(std::llround(value * m_rate)));
            break;
        default: break;
    }
}

void ZenMonitor::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    m_rate = sampleRate;
    m_noise.Prepare(sampleRate, maxBlockSize);
    m_source.assign(maxBlockSize, 0.0f);
    const auto pulseLength = static_cast<std::size_t>(std::max(1L, std::lround(kPulseMs * 0.001 * sampleRate)));
    m_pulse.resize(pulseLength);
    for (std::size_t n = 0; n < pulseLength; ++n)
        m_pulse[n] = static_cast<float>(0.5 - 0.5 * std::cos(2.0 * kPi * (n + 0.5) / static_cast<double>(pulseLength)));
    m_pulsePeriod = static_cast<std::uint64_t>(std::llround(kPulsePeriodMs * 0.001 * sampleRate));
    m_gateStep = static_cast<float>(1.0 / std::max(1.0, kGateFadeMs * 0.001 * sampleRate));
    ResetProcessing();
    SetLatency(0);
}

void ZenMonitor::ResetProcessing() {
    m_noise.Reset();
    m_walkPosition = 0;
    m_pulsePosition = 0;
    m_phase = 0.0;
    m_gates.fill(0.0f);
}

int ZenMonitor::Sounding(std::uint32_t channelCount) const noexcept {
    if (m_output == kWalk) return static_cast<int>((m_walkPosition / m_walkSamples) % channelCount);
    if (m_output == kAll) return -1;
    return m_output - kFirstNumbered;
}

void ZenMonitor::ProcessBlock(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    // Cut at the walk's steps, so each part has one channel sounding.
    std::uint32_t done = 0;
    while (done < frames) {
        std::uint32_t n = frames - done;
        if (m_output == kWalk)
            n = static_cast<std::uint32_t>(std::min<std::uint64_t>(n, m_walkSamples - m_walkPosition % m_walkSamples));
        float* part[kMaxChannels];
        for (std::uint32_t c = 0; c < channelCount; ++c) part[c] = channels[c] + done;
        Generate(part, channelCount, n);
        m_walkPosition += n;
        done += n;
    }
    const int sounding = Sounding(channelCount);
    PublishMeter(kChannel, sounding >= 0 && sounding < static_cast<int>(channelCount) ? sounding + 1.0f : 0.0f);
    float peak = 0.0f;
    for (std::uint32_t c = 0; c < channelCount; ++c)
        for (std::uint32_t i = 0; i < frames; ++i) peak = std::max(peak, std::fabs(channels[c][i]));
    PublishMeter(kPeak, peak);
}

void ZenMonitor::Generate(float* const* channels, std::uint32_t channelCount, std::uint32_t frames) noexcept {
    float* source = m_source.data();
    auto level = Smoothed(kLevel).Track(0);
    auto frequency = Smoothed(kFrequency).Track(0);
    const double pulseLift = std::pow(10.0, kPulseAboveLevelDb / 20.0);
    for (std::uint32_t i = 0; i < frames; ++i) {
        const double gain = level.Next();
        const double hz = frequency.Next();
        switch (m_signal) {
            case kSine:
                source[i] = static_cast<float>(std::sqrt(2.0) * gain * std::sin(2.0 * kPi * m_phase));
                m_phase += hz / m_rate;
                m_phase -= std::floor(m_phase);
                break;
            case kPolarityPulse: {
                const double peak = std::min(1.0, gain * pulseLift);
                source[i] = m_pulsePosition < m_pulse.size() ? static_cast<float>(peak * m_pulse[m_pulsePosition]) : 0.0f;
                if (++m_pulsePosition == m_pulsePeriod) m_pulsePosition = 0;
                break;
            }
            default: source[i] = static_cast<float>(gain); break;
        }
    }
    const int sounding = Sounding(channelCount);
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        float* out = channels[c];
        const float target = sounding < 0 || static_cast<std::uint32_t>(sounding) == c ? 1.0f : 0.0f;
        float gate = m_gates[c];
        if (gate == 0.0f && target == 0.0f) {
            std::fill_n(out, frames, 0.0f);
            continue;
        }
        if (m_signal == kPinkNoise) {
            m_noise.Read(c, out, frames);
            for (std::uint32_t i = 0; i < frames; ++i) out[i] *= source[i];
        } else {
            std::copy_n(source, frames, out);
        }
        if (gate != target) {
            for (std::uint32_t i = 0; i < frames; ++i) {
                gate = target > gate ? std::min(target, gate + m_gateStep) : std::max(target, gate - m_gateStep);
                out[i] *= gate;
            }
            m_gates[c] = gate;
        }
    }
    m_noise.Advance(frames);
}

template class ZenAudioPlugin<ZenMonitor>;
