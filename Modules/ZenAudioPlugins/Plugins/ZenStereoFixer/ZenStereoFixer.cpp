#include "ZenStereoFixer.h"

#include <QCoreApplication>
#include <algorithm>
#include <cfloat>
#include <cmath>

#include "Common/Algorithms/PowerOfTwo.h"
#include "Common/ZenAudioPlugin.h"

const zen::PluginDescriptor ZenStereoFixer::kDescriptor = {
    "Stereo Fixer", 1.0, zen::kPluginStateOffered, zen::MakePluginCode('Z', 'n', 'S', 'F'),
    2, 2, "ZenStereoFixer", 0, 0, -1, nullptr};

namespace {

// Half the balance on each side: right up, left down by as much.
float HalfBalanceGain(float db) { return std::pow(10.0f, db / 40.0f); }

}  // namespace

ZenStereoFixer::ZenStereoFixer() {
    InitParameters(Definitions());
    InitMeters(Meters());
}

const zen::ParameterTableDefinition& ZenStereoFixer::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "ZenStereoFixer",
        {
            SwitchParameter("SWAP", QT_TRANSLATE_NOOP("ZenStereoFixer", "Swap Channels"), 0.0f),
            ListParameter("LEFT_POLARITY", QT_TRANSLATE_NOOP("ZenStereoFixer", "Left Polarity"),
                          {QT_TRANSLATE_NOOP("ZenStereoFixer", "Normal"), QT_TRANSLATE_NOOP("ZenStereoFixer", "Inverted")},
                          kNormal),
            ListParameter("RIGHT_POLARITY", QT_TRANSLATE_NOOP("ZenStereoFixer", "Right Polarity"),
                          {QT_TRANSLATE_NOOP("ZenStereoFixer", "Normal"), QT_TRANSLATE_NOOP("ZenStereoFixer", "Inverted")},
                          kNormal),
            ContinuousParameter("BALANCE", QT_TRANSLATE_NOOP("ZenStereoFixer", "Balance"), -12.0f, 12.0f, 0.0f, 0.1f,
                                "dB")
                .SmoothedSingle(HalfBalanceGain),
            SwitchParameter("AUTO_ALIGN", QT_TRANSLATE_NOOP("ZenStereoFixer", "Auto Align"), 1.0f),
            ListParameter("FOLD_DOWN", QT_TRANSLATE_NOOP("ZenStereoFixer", "Mono Fold-Down"),
                          {QT_TRANSLATE_NOOP("ZenStereoFixer", "Off"), QT_TRANSLATE_NOOP("ZenStereoFixer", "Auto"),
                           QT_TRANSLATE_NOOP("ZenStereoFixer", "On")},
                          kFoldOff),
        });
    return table;
}

const zen::MeterTableDefinition& ZenStereoFixer::Meters() {
    using namespace zen;
    static const MeterTableDefinition table = MakeMeterTable(
        "ZenStereoFixer",
        {
            ValueMeter("OFFSET", QT_TRANSLATE_NOOP("ZenStereoFixer", "Offset"), "ms", -10.0f, 10.0f),
            ValueMeter("OUTPUT_CORRELATION", QT_TRANSLATE_NOOP("ZenStereoFixer", "Output Correlation"), "", -1.0f,
                       1.0f),
            ValueMeter("OUTPUT_BALANCE", QT_TRANSLATE_NOOP("ZenStereoFixer", "Output Balance"), "dB", -24.0f, 24.0f),
            ValueMeter("FOLDED", QT_TRANSLATE_NOOP("ZenStereoFixer", "Folded"), "", 0.0f, 1.0f),
        });
    return table;
}

bool ZenStereoFixer::AcceptsChannelConfiguration(std::uint32_t inputs, std::uint32_t outputs) const {
    return inputs == 2 && outputs == 2;
}

bool ZenStereoFixer::ApplyNeutralSetting() {
    ZenAudioPluginImpl::ApplyNeutralSetting();
    SetParameter(kSwap, 0.0f);
    SetParameter(kLeftPolarity, kNormal);
    SetParameter(kRightPolarity, kNormal);
    SetParameter(kBalance, 0.0f);
    SetParameter(kFoldDown, kFoldOff);
    return SetParameter(kAutoAlign, 0.0f);
}

void ZenStereoFixer::UpdateProcessingParameter(std::uint32_t index, float value) {
    switch (index) {
        case kSwap: m_swap = value >= 0.5f; Remap(); break;
        case kLeftPolarity: m_leftSign = std::lround(value) == kInverted ? -1.0f : 1.0f; Remap(); break;
        case kRightPolarity: m_rightSign = std::lround(value) == kInverted ? -1.0f : 1.0f; Remap(); break;
        case kAutoAlign: {
            m_autoAlign = value >= 0.5f;
            // Off returns to no correction; on waits for the next estimate.
            if (!m_autoAlign && m_lag != 0) {
                m_previousLag = m_lag;
                m_lag = 0;
                m_alignStep = 0;
            }
            break;
        }
        case kFoldDown: m_foldDown = static_cast<FoldDown>(std::clamp<long>(std::lround(value), kFoldOff, kFoldOn)); break;
        default: break;
    }
}

void ZenStereoFixer::PrepareProcessing(float sampleRate, std::uint32_t maxBlockSize) {
    m_offset.SetChannelCount(2);
    m_offset.SetRange(kMaxOffsetMs);
    m_offset.Prepare(sampleRate, maxBlockSize);
    m_output.SetChannelCount(2);
    m_output.Prepare(sampleRate, maxBlockSize);
    m_latency = m_offset.GetMaxLag();
    m_mask = zen::NextPowerOfTwo(m_latency + 1) - 1;
    m_lines.assign(2 * (static_cast<std::size_t>(m_mask) + 1), 0.0f);
    m_alignFade = std::max(1u, static_cast<std::uint32_t>(std::lround(kAlignFadeMs * 0.001 * sampleRate)));
    m_foldFade = std::max(1u, static_cast<std::uint32_t>(std::lround(kFoldFadeMs * 0.001 * sampleRate)));
    m_mapFade.Prepare(sampleRate);
    ResetProcessing();
    SetLatency(m_latency);
}

void ZenStereoFixer::ResetProcessing() {
    m_offset.Reset();
    m_output.Reset();
    std::fill(m_lines.begin(), m_lines.end(), 0.0f);
    m_write = 0;
    m_seenEstimates = 0;
    m_lag = m_previousLag = 0;
    m_alignStep = m_alignFade;
    m_source = kSum;
    m_faultFold = false;
    m_fold = m_foldDown == kFoldOn ? 1.0f : 0.0f;
    m_fresh = true;
    m_mapFade.Finish();
    m_mapFrom = m_mapTo = TargetMapping();
}

ZenStereoFixer::Mapping ZenStereoFixer::TargetMapping() const noexcept {
    if (m_swap) return {0.0f, m_leftSign, m_rightSign, 0.0f};
    return {m_leftSign, 0.0f, 0.0f, m_rightSign};
}

ZenStereoFixer::Mapping ZenStereoFixer::PresentMapping() const noexcept {
    const float w = m_mapFade.Weight();
    Mapping m;
    for (std::size_t k = 0; k < m.size(); ++k) m[k] = m_mapFrom[k] + w * (m_mapTo[k] - m_mapFrom[k]);
    return m;
}

void ZenStereoFixer::Remap() noexcept {
    const Mapping target = TargetMapping();
    if (target == m_mapTo) return;
    if (m_fresh) {
        m_mapFrom = m_mapTo = target;
        m_mapFade.Finish();
        return;
    }
    m_mapFrom = PresentMapping();
    m_mapTo = target;
    m_mapFade.Start();
}

void ZenStereoFixer::MapInput(float* left, float* right, std::uint32_t frames) noexcept {
    if (!m_mapFade.IsActive()) {
        for (std::uint32_t i = 0; i < frames; ++i) {
            float l = left[i];
            float r = right[i];
            if (m_swap) std::swap(l, r);
            left[i] = l * m_leftSign;
            right[i] = r * m_rightSign;
        }
        return;
    }
    for (std::uint32_t i = 0; i < frames; ++i) {
        const float w = m_mapFade.Next();
        Mapping m;
        for (std::size_t k = 0; k < m.size(); ++k) m[k] = m_mapFrom[k] + w * (m_mapTo[k] - m_mapFrom[k]);
        const float l = left[i], r = right[i];
        left[i] = m[0] * l + m[1] * r;
        right[i] = m[2] * l + m[3] * r;
    }
}

std::uint32_t ZenStereoFixer::DelayOf(int channel, int lag) const noexcept {
    // The later channel waits less by the lag; the earlier one the whole latency.
    const int shorten = channel == 0 ? std::max(0, -lag) : std::max(0, lag);
    return m_latency - static_cast<std::uint32_t>(shorten);
}

void ZenStereoFixer::Decide() noexcept {
    const InterChannelOffset::Estimate& e = m_offset.Current();
    const bool leftDead = e.leftPower < kDeadPowerRatio * e.rightPower;
    const bool rightDead = e.rightPower < kDeadPowerRatio * e.leftPower;
    const bool inverted = !leftDead && !rightDead && e.correlation < kInvertedCorrelation;
    m_faultFold = leftDead || rightDead || inverted;
    if (m_faultFold) m_source = leftDead ? kRightOnly : rightDead ? kLeftOnly : kDifference;
    else m_source = kSum;

    const int lag = std::clamp(e.lag, -static_cast<int>(m_latency), static_cast<int>(m_latency));
    if (m_autoAlign && !leftDead && !rightDead && std::fabs(e.correlation) >= kConfidentCorrelation && lag != m_lag &&
        m_alignStep >= m_alignFade) {
        m_previousLag = m_lag;
        m_lag = lag;
        m_alignStep = 0;
    }
}

void ZenStereoFixer::Repair(float* left, float* right, std::uint32_t frames) noexcept {
    float* lines[2] = {m_lines.data(), m_lines.data() + m_mask + 1};
    const std::uint32_t now[2] = {DelayOf(0, m_lag), DelayOf(1, m_lag)};
    const std::uint32_t before[2] = {DelayOf(0, m_previousLag), DelayOf(1, m_previousLag)};
    const float alignStep = 1.0f / static_cast<float>(m_alignFade);
    const float foldStep = 1.0f / static_cast<float>(m_foldFade);
    const bool foldWanted = m_foldDown == kFoldOn || (m_foldDown == kFoldAuto && m_faultFold);
    const float foldTarget = foldWanted ? 1.0f : 0.0f;
    auto balance = Smoothed(kBalance).Track(0);
    for (std::uint32_t i = 0; i < frames; ++i) {
        const std::uint32_t w = m_write;
        lines[0][w] = left[i];
        lines[1][w] = right[i];
        float y[2];
        for (int c = 0; c < 2; ++c) {
            y[c] = lines[c][(w - now[c]) & m_mask];
            if (m_alignStep < m_alignFade) {
                const float t = static_cast<float>(m_alignStep) * alignStep;
                y[c] = t * y[c] + (1.0f - t) * lines[c][(w - before[c]) & m_mask];
            }
        }
        if (m_alignStep < m_alignFade) ++m_alignStep;
        m_write = (w + 1) & m_mask;

        const auto g = static_cast<float>(balance.Next());
        // Held finite: full-scale input times the gain may pass the largest float.
        float l = std::clamp(y[0] / g, -FLT_MAX, FLT_MAX);
        float r = std::clamp(y[1] * g, -FLT_MAX, FLT_MAX);
        if (m_fold != foldTarget) m_fold = m_fold < foldTarget ? std::min(foldTarget, m_fold + foldStep)
                                                               : std::max(foldTarget, m_fold - foldStep);
        if (m_fold > 0.0f) {
            float mono;
            switch (m_source) {
                case kLeftOnly: mono = l; break;
                case kRightOnly: mono = r; break;
                case kDifference: mono = 0.5f * l - 0.5f * r; break;
                default: mono = 0.5f * l + 0.5f * r; break;
            }
            l = std::clamp((1.0f - m_fold) * l + m_fold * mono, -FLT_MAX, FLT_MAX);
            r = std::clamp((1.0f - m_fold) * r + m_fold * mono, -FLT_MAX, FLT_MAX);
        }
        left[i] = l;
        right[i] = r;
    }
}

void ZenStereoFixer::ProcessBlock(float* const* channels, std::uint32_t, std::uint32_t frames) noexcept {
    m_fresh = false;
    float* left = channels[0];
    float* right = channels[1];
    MapInput(left, right, frames);
    // Non-finite samples would stay in the delay lines for their length.
    for (std::uint32_t i = 0; i < frames; ++i) {
        if (!std::isfinite(left[i])) left[i] = 0.0f;
        if (!std::isfinite(right[i])) right[i] = 0.0f;
    }
    // Cut at the estimator's frame ends, so decisions land on the same sample in any split.
    std::uint32_t done = 0;
    while (done < frames) {
        const std::uint32_t n = std::min(frames - done, m_offset.FramesToEstimate());
        float* part[2] = {left + done, right + done};
        m_offset.Process(part, n);
        Repair(part[0], part[1], n);
        done += n;
        if (m_offset.GetEstimateCount() != m_seenEstimates) {
            m_seenEstimates = m_offset.GetEstimateCount();
            Decide();
        }
    }
    m_output.Process(channels, frames);
    const CorrelationMeter::Image image = m_output.Current();
    PublishMeter(kOffset, static_cast<float>(m_lag * 1000.0 / GetSampleRate()));
    PublishMeter(kCorrelation, static_cast<float>(image.correlation));
    const bool silent = image.leftRms * image.leftRms < CorrelationMeter::kSilentPower ||
                        image.rightRms * image.rightRms < CorrelationMeter::kSilentPower;
    const double balanceDb = silent ? 0.0 : 20.0 * std::log10(image.rightRms / image.leftRms);
    PublishMeter(kBalanceReading, static_cast<float>(std::clamp(balanceDb, -24.0, 24.0)));
    PublishMeter(kFolded, m_fold);
}

template class ZenAudioPlugin<ZenStereoFixer>;
