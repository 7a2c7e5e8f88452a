#include "ZenMultiBandCompressor.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>
#include <limits>
#include <string>

#include "Common/Algorithms/EnvelopeCoefficients.h"
#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenMultiBandCompressor::kDescriptor = {
    "Multiband Compressor", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'e', 'n', 'k'),
    10, 10, "ZenMultiBandCompressor", 0, 0, -1, nullptr};

namespace {

// Four bands by default; a fifth takes the top octave when asked for.
constexpr float kDefaultBands = 4.0f;
constexpr float kDefaultCrossovers[] = {120.0f, 1000.0f, 5000.0f, 10000.0f};

// Per band: slower and firmer at the bottom, where a fast gain would
// distort the waveform, quicker toward the top.
struct BandDefaults {
    float threshold, ratio, attack, release;
};
constexpr BandDefaults kBandDefaults[] = {
    {-24.0f, 3.0f, 20.0f, 250.0f}, {-24.0f, 2.5f, 12.0f, 180.0f}, {-24.0f, 2.5f, 6.0f, 120.0f},
    {-24.0f, 2.5f, 3.0f, 90.0f},   {-24.0f, 2.0f, 2.0f, 70.0f},
};
constexpr float kDefaultKneeDb = 6.0f;

float SlopeOfRatio(float ratio) { return SoftKneeCompressor::SlopeOfRatio(ratio); }
float LogUnits(float db) { return zen::DbToLogUnits(db); }

std::string Numbered(const char* text, std::uint32_t band) { return std::string(text) + std::to_string(band + 1); }

}  // namespace

ZenMultiBandCompressor::ZenMultiBandCompressor() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenMultiBandCompressor::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = [] {
        std::vector<ParameterDefinition> rows = {
            ContinuousParameter("BANDS", QT_TRANSLATE_NOOP("ZenMultiBandCompressor", "Bands"), 1.0f,
                                static_cast<float>(kMaxBands), kDefaultBands, 1.0f),
        };
        for (std::uint32_t s = 0; s < kMaxSplits; ++s)
            rows.push_back(LogarithmicParameter(Numbered("CROSSOVER_", s).c_str(), Numbered("Crossover ", s).c_str(),
                                                20.0f, 20000.0f, kDefaultCrossovers[s], 1.0f, "Hz")
                               .SmoothedSingle(working::Identity));
        rows.push_back(SwitchParameter("SIDECHAIN", QT_TRANSLATE_NOOP("ZenMultiBandCompressor", "Side-Chain"), 0.0f));
        rows.push_back(ContinuousParameter("LOOKAHEAD", QT_TRANSLATE_NOOP("ZenMultiBandCompressor", "Lookahead"), 0.0f,
                                           kMaxLookaheadMs, 0.0f, 0.1f, "ms"));
        rows.push_back(ContinuousParameter("OUTPUT", QT_TRANSLATE_NOOP("ZenMultiBandCompressor", "Output"), -24.0f,
                                           12.0f, 0.0f, 0.1f, "dB")
                           .SmoothedSingle(working::DbToGain));
        for (std::uint32_t b = 0; b < kMaxBands; ++b) {
            const BandDefaults& d = kBandDefaults[b];
            const std::string band = Numbered("Band ", b) + " ";
            auto label = [&](const char* what) { return band + what; };
            rows.push_back(ContinuousParameter(Numbered("THRESHOLD_", b).c_str(), label("Threshold").c_str(), -60.0f,
                                               0.0f, d.threshold, 0.1f, "dB")
                               .SmoothedSingle(LogUnits));
            rows.push_back(ContinuousParameter(Numbered("RATIO_", b).c_str(), label("Ratio").c_str(), 1.0f, 20.0f,
                                               d.ratio, 0.1f)
                               .SmoothedSingle(SlopeOfRatio));
            rows.push_back(ContinuousParameter(Numbered("ATTACK_", b).c_str(), label("Attack").c_str(), 0.1f, 100.0f,
                                               d.attack, 0.1f, "ms"));
            rows.push_back(ContinuousParameter(Numbered("RELEASE_", b).c_str(), label("Release").c_str(), 10.0f,
                                               4000.0f, d.release, 1.0f, "ms"));
            rows.push_back(ContinuousParameter(Numbered("KNEE_", b).c_str(), label("Knee").c_str(), 0.0f, 24.0f,
                                               kDefaultKneeDb, 0.1f, "dB")
                               .SmoothedSingle(LogUnits));
            rows.push_back(ContinuousParameter(Numbered("MAKEUP_", b).c_str(), label("Makeup").c_str(), -20.0f, 20.0f,
                                               0.0f, 0.1f, "dB")
                               .SmoothedSingle(LogUnits));
            rows.push_back(SwitchParameter(Numbered("SOLO_", b).c_str(), label("Solo").c_str(), 0.0f));
            rows.push_back(SwitchParameter(Numbered("BYPASS_", b).c_str(), label("Bypass").c_str(), 0.0f));
        }
        return MakeParameterTable("ZenMultiBandCompressor", rows);
    }();
    return table;
}

const zen::MeterTableDefinition& ZenMultiBandCompressor::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = [] {
        std::vector<MeterDefinition> rows;
        for (std::uint32_t b = 0; b < kMaxBands; ++b)
            rows.push_back(ValueMeter(Numbered("GAIN_REDUCTION_", b).c_str(),
                                      (Numbered("Band ", b) + " Gain Reduction").c_str(), "dB", -30.0f, 0.0f));
        rows.push_back(LevelMeter("INPUT_PEAK", QT_TRANSLATE_NOOP("ZenMultiBandCompressor", "Input Peak"), "dBFS",
                                  -60.0f, 6.0f)
                           .PerChannel());
        // Makeup and output reach +32 dB.
        rows.push_back(LevelMeter("OUTPUT_PEAK", QT_TRANSLATE_NOOP("ZenMultiBandCompressor", "Output Peak"), "dBFS",
                                  -60.0f, 24.0f)
                           .PerChannel());
        return MakeMeterTable("ZenMultiBandCompressor", rows);
    }();
    return table;
}

bool ZenMultiBandCompressor::AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const {
    return inputs == outputs && inputs >= 1 && inputs <= kDescriptor.inputChannelLimit;
}

std::uint32_t ZenMultiBandCompressor::GetTailLength() const {
    // The lowest split rings longest: its poles decay at 2 pi f / sqrt 2 per second.
    const zen::ParameterTable& p = Parameters();
    const auto bands = static_cast<std::uint32_t>(std::clamp(std::lround(p[kBands].GetValue()), 1L, long{kMaxBands}));
    if (bands < 2) return 0;
    double lowest = std::numeric_limits<double>::max();
    for (std::uint32_t s = 0; s + 1 < bands; ++s) lowest = std::min(lowest, double{p[kCrossover1 + s].GetValue()});
    const double decay = 2.0 * 3.141592653589793 * lowest * LinkwitzRileyCrossover::kButterworthQ;
    return static_cast<std::uint32_t>(std::ceil(kTailNepers / decay * GetSampleRate()));
}

bool ZenMultiBandCompressor::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    // One band is a wire through the crossover; ratio 1 never reduces.
    SetParameter(kBands, 1.0f);
    return SetParameter(Index(0, kRatio), 1.0f);
}

void ZenMultiBandCompressor::UpdateProcessingParameter(std::uint32_t index, float value) {
    if (index == kBands) {
        const auto bands = static_cast<std::uint32_t>(
            std::clamp(std::lround(value), 1L, static_cast<long>(kMaxBands)));
        // Splits that join start where their frequencies stand.
        for (std::uint32_t s = 0; bands != m_bands && s < kMaxSplits; ++s) {
            m_designed[s] = static_cast<float>(Smoothed(kCrossover1 + s)[0].current.load(std::memory_order_relaxed));
            m_crossover.SetParameter(LinkwitzRileyCrossover::kFrequency1 + s, m_designed[s]);
        }
        m_crossover.SetParameter(LinkwitzRileyCrossover::kBands, value);
        m_bands = static_cast<std::uint32_t>(m_crossover.GetBandCount());
    } else if (index == kSideChain) {
        m_sideChain = value != 0.0f;
    } else if (index >= kFirstBandParameter) {
        const std::uint32_t band = (index - kFirstBandParameter) / kBandParameterCount;
        switch ((index - kFirstBandParameter) % kBandParameterCount) {
            case kAttack: m_compressors[band].SetParameter(SoftKneeCompressor::kAttack, value); break;
            case kRelease: m_compressors[band].SetParameter(SoftKneeCompressor::kRelease, value); break;
            case kSolo: m_solo[band] = value != 0.0f; break;
            case kBypass: m_bypass[band] = value != 0.0f; break;
            default: break;
        }
    }
    UpdateFadeTargets();
}

void ZenMultiBandCompressor::UpdateFadeTargets() {
    bool anySolo = false;
    for (std::uint32_t b = 0; b < m_bands; ++b) anySolo = anySolo || m_solo[b];
    for (std::uint32_t b = 0; b < kMaxBands; ++b) {
        m_audible[b].target = !anySolo || m_solo[b] ? 1.0f : 0.0f;
        m_bypassed[b].target = m_bypass[b] ? 1.0f : 0.0f;
    }
}

void ZenMultiBandCompressor::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    const std::uint32_t channels = GetProcessChannelCount();
    m_crossover.SetChannelCount(channels);
    m_crossover.Prepare(sampleRate, maxBlockSize);
    m_bands = static_cast<std::uint32_t>(m_crossover.GetBandCount());
    for (SoftKneeCompressor& compressor : m_compressors) compressor.Prepare(sampleRate, maxBlockSize);
    // The latency is the look-ahead set when preparing.
    const float lookaheadMs = std::clamp(Parameters()[kLookahead].GetValue(), 0.0f, kMaxLookaheadMs);
    const auto lookahead = static_cast<std::uint32_t>(std::lround(lookaheadMs / 1000.0f * sampleRate));
    m_lookahead.Dimension(std::uint64_t{kMaxBands} * channels, maxBlockSize, lookahead);
    SetLatency(lookahead);

    m_laws.assign(kMaxBands, std::vector<SoftKneeCompressor::Law>(maxBlockSize));
    m_gains.assign(kMaxBands, std::vector<float>(maxBlockSize, 1.0f));
    m_outputGain.assign(maxBlockSize, 1.0f);
    m_detectors.assign(channels, nullptr);
    m_spanInput.assign(channels, nullptr);
    m_fadeStep = static_cast<float>(1.0 / std::max(1.0, kSwitchFadeSeconds * sampleRate));
    m_designed.fill(std::numeric_limits<float>::quiet_NaN());  // designed again before the first block
    m_position = 0;
    ResetProcessing();
}

void ZenMultiBandCompressor::ResetProcessing() {
    m_crossover.Reset();
    for (std::uint32_t b = 0; b < kMaxBands; ++b) m_compressors[b].Reset(CurrentLaw(b));
    m_lookahead.Reset();
    m_settleFades = true;
}

SoftKneeCompressor::Law ZenMultiBandCompressor::CurrentLaw(std::uint32_t band) noexcept {
    auto now = [this, band](BandParameter p) {
        return static_cast<float>(Smoothed(Index(band, p))[0].current.load(std::memory_order_relaxed));
    };
    return {now(kThreshold), now(kRatio), now(kKnee), now(kMakeup)};
}

void ZenMultiBandCompressor::FillLaws(std::uint32_t frames) noexcept {
    for (std::uint32_t b = 0; b < m_bands; ++b) {
        bool settled = true;
        for (BandParameter p : {kThreshold, kRatio, kKnee, kMakeup}) {
            const zen::SmoothedValueGroup::Element& e = Smoothed(Index(b, p))[0];
            settled = settled && e.current.load(std::memory_order_relaxed) ==
                                     double{e.target.load(std::memory_order_relaxed)};
        }
        m_lawSettled[b] = settled;
        if (settled) {
            m_laws[b][0] = CurrentLaw(b);
            continue;
        }
        auto threshold = Smoothed(Index(b, kThreshold)).Track(0);
        auto slope = Smoothed(Index(b, kRatio)).Track(0);
        auto knee = Smoothed(Index(b, kKnee)).Track(0);
        auto makeup = Smoothed(Index(b, kMakeup)).Track(0);
        SoftKneeCompressor::Law* law = m_laws[b].data();
        for (std::uint32_t i = 0; i < frames; ++i)
            law[i] = {static_cast<float>(threshold.Next()), static_cast<float>(slope.Next()),
                      static_cast<float>(knee.Next()), static_cast<float>(makeup.Next())};
    }
    const zen::SmoothedValueGroup::Element& e = Smoothed(kOutput)[0];
    m_outputSettled = e.current.load(std::memory_order_relaxed) == double{e.target.load(std::memory_order_relaxed)};
    if (m_outputSettled) {
        m_outputGain[0] = static_cast<float>(e.current.load(std::memory_order_relaxed));
        return;
    }
    auto output = Smoothed(kOutput).Track(0);
    for (std::uint32_t i = 0; i < frames; ++i) m_outputGain[i] = static_cast<float>(output.Next());
}

void ZenMultiBandCompressor::DesignSplits(const float* frequencies) noexcept {
    for (std::uint32_t s = 0; s + 1 < m_bands; ++s)
        if (!(frequencies[s] == m_designed[s])) {
            m_crossover.SetParameter(LinkwitzRileyCrossover::kFrequency1 + s, frequencies[s]);
            m_designed[s] = frequencies[s];
        }
}

void ZenMultiBandCompressor::ApplyFades(std::uint32_t band, float* gains, std::uint32_t frames) noexcept {
    Fade& audible = m_audible[band];
    Fade& bypassed = m_bypassed[band];
    if (audible.Settled() && bypassed.Settled()) {
        if (audible.value == 1.0f && bypassed.value == 0.0f) return;
        for (std::uint32_t i = 0; i < frames; ++i)
            gains[i] = audible.value * (bypassed.value + (1.0f - bypassed.value) * gains[i]);
        return;
    }
    auto toward = [this](Fade& f) {
        f.value = f.target > f.value ? std::min(f.value + m_fadeStep, f.target) : std::max(f.value - m_fadeStep, f.target);
        return f.value;
    };
    for (std::uint32_t i = 0; i < frames; ++i) {
        const float a = toward(audible), m = toward(bypassed);
        gains[i] = a * (m + (1.0f - m) * gains[i]);
    }
}

void ZenMultiBandCompressor::ProcessSpan(float* const* channels, std::uint32_t channelCount, std::uint32_t offset,
                                         std::uint32_t frames) noexcept {
    const std::uint32_t keys = KeyChannels(channelCount, m_sideChain);
    const std::uint32_t mains = channelCount - keys;
    for (std::uint32_t c = 0; c < channelCount; ++c) m_spanInput[c] = channels[c] + offset;
    m_crossover.Split(m_spanInput.data(), frames);

    for (std::uint32_t b = 0; b < m_bands; ++b) {
        float* const* band = m_crossover.Band(b);
        const std::uint32_t first = keys > 0 ? mains : 0;
        const std::uint32_t count = keys > 0 ? keys : mains;
        for (std::uint32_t c = 0; c < count; ++c) m_detectors[c] = band[first + c];
        if (m_lawSettled[b])
            m_compressors[b].ComputeGains(m_detectors.data(), count, m_gains[b].data(), frames, m_laws[b][0]);
        else
            m_compressors[b].ComputeGains(m_detectors.data(), count, m_gains[b].data(), frames,
                                          m_laws[b].data() + offset);
        ApplyFades(b, m_gains[b].data(), frames);
        if (m_lookahead.GetDelay() > 0)
            for (std::uint32_t c = 0; c < mains; ++c) m_lookahead.ProcessChannel(b * channelCount + c, band[c], frames);
    }

    const float* output = m_outputGain.data() + (m_outputSettled ? 0 : offset);
    const float fixedOutput = m_outputGain[0];
    for (std::uint32_t c = 0; c < mains; ++c) {
        float* y = channels[c] + offset;
        const float* g = m_gains[0].data();
        const float* x = m_crossover.Band(0)[c];
        for (std::uint32_t i = 0; i < frames; ++i) y[i] = g[i] * x[i];
        for (std::uint32_t b = 1; b < m_bands; ++b) {
            g = m_gains[b].data();
            x = m_crossover.Band(b)[c];
            for (std::uint32_t i = 0; i < frames; ++i) y[i] += g[i] * x[i];
        }
        if (m_outputSettled) {
            if (fixedOutput != 1.0f)
                for (std::uint32_t i = 0; i < frames; ++i) y[i] *= fixedOutput;
        } else {
            for (std::uint32_t i = 0; i < frames; ++i) y[i] *= output[i];
        }
    }
}

void ZenMultiBandCompressor::ProcessBlock(float* const* channels, std::uint32_t channelCount,
                                          std::uint32_t frames) noexcept {
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        float peak = 0.0f;
        for (std::uint32_t i = 0; i < frames; ++i) peak = std::max(peak, std::fabs(channels[c][i]));
        PublishMeter(kInputPeak, c, peak);
    }
    // After a reset the switches apply at once (they reach us after Prepare too).
    if (m_settleFades) {
        for (std::uint32_t b = 0; b < kMaxBands; ++b) {
            m_audible[b].value = m_audible[b].target;
            m_bypassed[b].value = m_bypassed[b].target;
        }
        m_settleFades = false;
    }
    FillLaws(frames);

    bool gliding = false, designed = true;
    float frequencies[kMaxSplits];
    for (std::uint32_t s = 0; s < kMaxSplits; ++s) {
        const zen::SmoothedValueGroup::Element& e = Smoothed(kCrossover1 + s)[0];
        const double current = e.current.load(std::memory_order_relaxed);
        frequencies[s] = static_cast<float>(current);
        if (s + 1 >= m_bands) continue;
        gliding = gliding || current != double{e.target.load(std::memory_order_relaxed)};
        designed = designed && frequencies[s] == m_designed[s];
    }
    if (!gliding && designed) {
        ProcessSpan(channels, channelCount, 0, frames);
        m_position += frames;
    } else {
        // Redesigned only at fixed sample positions, so the host's block size does not matter.
        auto c1 = Smoothed(kCrossover1).Track(0);
        auto c2 = Smoothed(kCrossover1 + 1).Track(0);
        auto c3 = Smoothed(kCrossover1 + 2).Track(0);
        auto c4 = Smoothed(kCrossover1 + 3).Track(0);
        zen::SmoothedValueGroup::Cursor* cursors[kMaxSplits] = {&c1, &c2, &c3, &c4};
        for (std::uint32_t done = 0; done < frames;) {
            const auto n = static_cast<std::uint32_t>(
                std::min<std::uint64_t>(frames - done, kGlideStep - m_position % kGlideStep));
            for (std::uint32_t s = 0; gliding && s < kMaxSplits; ++s) {
                frequencies[s] = static_cast<float>(cursors[s]->Next());
                for (std::uint32_t i = 1; i < n; ++i) cursors[s]->Next();
            }
            if (m_position % kGlideStep == 0) DesignSplits(frequencies);
            ProcessSpan(channels, channelCount, done, n);
            done += n;
            m_position += n;
        }
    }

    for (std::uint32_t b = 0; b < kMaxBands; ++b) {
        const bool active = b < m_bands && !m_bypass[b];
        PublishMeter(kGainReduction1 + b,
                     active ? m_compressors[b].GetMeter(SoftKneeCompressor::kGainReductionMeter) : 0.0f);
    }
    for (std::uint32_t c = 0; c < channelCount; ++c) {
        float peak = 0.0f;
        for (std::uint32_t i = 0; i < frames; ++i) peak = std::max(peak, std::fabs(channels[c][i]));
        PublishMeter(kOutputPeak, c, peak);
    }
}

template class ZenAudioPlugin<ZenMultiBandCompressor>;
