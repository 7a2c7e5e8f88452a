#include "LevellingEngine.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include "HostCore/HostError.h"

namespace zen::host {

namespace {

using S = LevellingSettings;
using levelling::kNoSpeech;

std::int32_t Tenths(double value) { return static_cast<std::int32_t>(std::lround(value * 10.0)); }

}  // namespace

float LevellingEngine::Input(std::int64_t entry) const {
    if (entry < 0 || entry >= static_cast<std::int64_t>(m_inputs.size())) return kNoSpeech;
    return m_inputs[static_cast<std::size_t>(entry)];
}

bool LevellingEngine::IsAboveGate(std::int64_t entry) const {
    const float v = Input(entry);
    return v > kNoSpeech && v >= m_settings.Get(S::kGateThreshold);
}

bool LevellingEngine::IsSpeech(std::int64_t entry) const {
    if (!IsAboveGate(entry)) return false;
    // Looking back only, so that an entry's kind is known with its input.
    float loudest = Input(entry);
    for (std::int64_t e = std::max<std::int64_t>(0, entry - kRelativeGateEntries); e < entry; ++e)
        if (IsAboveGate(e)) loudest = std::max(loudest, Input(e));
    return Input(entry) >= loudest - kRelativeGateLu;
}

bool LevellingEngine::IsGated(std::int64_t entry) const { return Input(entry) > kNoSpeech && !IsSpeech(entry); }

bool LevellingEngine::IsPhraseStart(std::int64_t entry) const {
    return IsSpeech(entry) && (entry == 0 || !IsSpeech(entry - 1));
}

std::int64_t LevellingEngine::HalfWindow() const {
    const double entries = m_settings.Get(S::kLoudnessWindow) / kEntrySeconds;
    return std::max<std::int64_t>(0, std::lround((entries - 1.0) / 2.0));
}

double LevellingEngine::WindowLoudness(std::int64_t entry) const {
    const std::int64_t h = HalfWindow();
    double energy = 0.0;
    int count = 0;
    for (std::int64_t e = entry - h; e <= entry + h; ++e)
        if (IsSpeech(e)) {
            energy += std::pow(10.0, Input(e) / 10.0);
            ++count;
        }
    return count > 0 ? 10.0 * std::log10(energy / count) : Input(entry);
}

double LevellingEngine::SpeechTarget(std::int64_t entry) const {
    const double loudness = WindowLoudness(entry);
    double gain = 0.0;
    if (m_settings.IsOn(S::kNormaliseClips)) {
        const auto e = static_cast<std::size_t>(entry);
        const ClipTracker::Stretch clip = m_clips.ClipUpTo(e, e + static_cast<std::size_t>(HalfWindow()));
        const double target = m_settings.ClipTarget();
        // The loudest entry stands in for the clip's peak.
        const double clipGain = std::min({target - clip.loudness, m_settings.Get(S::kClipPeakCeiling) - clip.loudest,
                                          static_cast<double>(m_settings.Get(S::kClipMaxGain))});
        const double range = m_settings.Get(S::kClipRange);
        gain = clipGain + std::clamp(target - (loudness + clipGain), -range, range);
    } else if (!m_law.Empty()) {
        gain = m_law.Gain(loudness);
    } else {
        gain = m_settings.Target() - loudness;
    }
    if (gain < 0.0)
        gain *= m_settings.IsOn(S::kManageLoudDialogue) ? m_settings.Get(S::kReduceLoudDialogue) : 0.0f;
    else
        gain *= m_settings.Get(S::kLiftSoftDialogue);
    return std::clamp(gain, -static_cast<double>(m_settings.Get(S::kMaxCut)),
                      static_cast<double>(m_settings.Get(S::kMaxBoost)));
}

double LevellingEngine::PauseAim(std::int64_t entry, const Entry& before, bool nextSeen, double next) const {
    double aim = 0.0;
    if (m_settings.IsOn(S::kPauseHold)) aim = nextSeen ? next : before.held;
    aim -= m_settings.Get(S::kMusicDucking);
    const double pauseSeconds = static_cast<double>(before.pauseRun + 1) * kEntrySeconds;
    if (m_settings.IsOn(S::kReduceBackground) && pauseSeconds > m_settings.Get(S::kHoldTime))
        aim -= m_settings.Get(S::kBackgroundReduction);
    if (IsGated(entry)) aim += m_settings.Get(S::kSilenceGain);
    return aim;
}

void LevellingEngine::ComputeEntry(std::int64_t entry) {
    const bool speech = IsSpeech(entry);
    Entry out;
    if (!m_settings.IsLevelling()) {
        out.pauseRun = speech || m_entries.empty() ? 0 : m_entries.back().pauseRun + 1;
        m_entries.push_back(out);
        return;
    }
    const double step = m_settings.Get(S::kMaxGainRate) * kEntrySeconds;
    const std::int64_t lookahead =
        std::min(std::lround(m_settings.Get(S::kLookahead) / kEntrySeconds), kLookaheadEntries - HalfWindow());

    // Where the gain may be now and still reach the phrases in sight on their
    // first entry; the nearest phrases win when not all can be reached.
    double low = -std::numeric_limits<double>::infinity(), high = std::numeric_limits<double>::infinity();
    bool nextSeen = false;
    double next = 0.0;
    for (std::int64_t j = 0; j <= lookahead; ++j) {
        if (!IsPhraseStart(entry + j)) continue;
        const double target = SpeechTarget(entry + j);
        const double slack = static_cast<double>(j) * step;
        if (std::max(low, target - slack) > std::min(high, target + slack)) break;
        low = std::max(low, target - slack);
        high = std::min(high, target + slack);
        if (!nextSeen) next = target;
        nextSeen = true;
    }

    if (m_entries.empty()) {
        out.gain = speech ? SpeechTarget(entry) : (nextSeen ? next : 0.0);
    } else {
        const Entry& before = m_entries.back();
        const double aim = speech ? SpeechTarget(entry) : PauseAim(entry, before, nextSeen, next);
        const double timeConstant = m_settings.Get(aim < before.gain ? S::kAttack : S::kRelease);
        double gain = before.gain + (1.0 - std::exp(-kEntrySeconds / timeConstant)) * (aim - before.gain);
        gain = std::clamp(gain, low, high);
        out.gain = std::clamp(gain, before.gain - step, before.gain + step);
        out.held = before.held;
        out.pauseRun = speech ? 0 : before.pauseRun + 1;
    }
    if (speech || m_entries.empty()) out.held = out.gain;
    m_entries.push_back(out);
}

void LevellingEngine::StoreInput(std::int64_t first, const Inputs& values) {
    const auto end = static_cast<std::size_t>(first) + values.size();
    if (m_inputs.size() < end) m_inputs.resize(end, kNoSpeech);
    for (std::size_t i = 0; i < values.size(); ++i) {
        const float v = values[i];
        m_inputs[static_cast<std::size_t>(first) + i] = std::isfinite(v) && v > kNoSpeech ? v : kNoSpeech;
    }
}

void LevellingEngine::ForgetFrom(std::int64_t entry) {
    // An answer looks kLookaheadEntries ahead: those that saw the entry go.
    const auto keep = static_cast<std::size_t>(std::max<std::int64_t>(0, entry - kLookaheadEntries));
    if (keep < m_entries.size()) m_entries.resize(keep);
    m_clips.Truncate(static_cast<std::size_t>(std::max<std::int64_t>(0, entry)));
}

void LevellingEngine::ComputeUpTo(std::int64_t end) {
    m_law = RangeLaw(m_settings);
    const auto gap = static_cast<std::int64_t>(std::ceil(m_settings.Get(S::kClipGap) / kEntrySeconds - 1e-9));
    if (gap != m_clipGap || m_settings.Get(S::kGateThreshold) != m_clipGate) {
        m_clips.Clear();
        m_clipGap = gap;
        m_clipGate = m_settings.Get(S::kGateThreshold);
    }
    // Clips as far as any entry up to `end` may look.
    const std::int64_t known = std::max(static_cast<std::int64_t>(m_inputs.size()), end);
    for (auto e = static_cast<std::int64_t>(m_clips.Size()); e < known + kLookaheadEntries; ++e)
        m_clips.Append(IsSpeech(e), Input(e), gap);
    for (std::int64_t e = Computed(); e < end; ++e) ComputeEntry(e);
}

levelling::EntryRecord LevellingEngine::Answer(std::int64_t entry) const {
    levelling::EntryRecord r;
    if (entry < 0) return r;
    const bool speech = IsSpeech(entry);
    const double gain = m_settings.IsLevelling() ? GainDb(entry) + m_settings.Get(S::kOutputTrim) : 0.0;
    r.gain = Tenths(gain);
    if (Input(entry) > kNoSpeech) r.input = Tenths(Input(entry));
    if (speech) r.output = Tenths(Input(entry) + gain);
    r.speech = speech ? 1000 : 0;
    return r;
}

LevellingEngine::Records LevellingEngine::Answers(std::int64_t from) const {
    Records records;
    for (std::size_t i = 0; i < records.size(); ++i) records[i] = Answer(from + static_cast<std::int64_t>(i));
    return records;
}

LevellingEngine::Records LevellingEngine::Process(std::int64_t first, const Inputs& values) {
    if (first < 0) throw HostError("levelling entry " + std::to_string(first) + " is before the first");
    ForgetFrom(first);
    StoreInput(first, values);
    ComputeUpTo(first);
    return Answers(first - static_cast<std::int64_t>(levelling::kBlockEntries));
}

LevellingEngine::Records LevellingEngine::Finish(std::int64_t first) {
    if (first < 0) throw HostError("levelling entry " + std::to_string(first) + " is before the first");
    if (static_cast<std::int64_t>(m_inputs.size()) > first) {
        ForgetFrom(first);
        m_inputs.resize(static_cast<std::size_t>(first));
    }
    ComputeUpTo(first);
    return Answers(first - static_cast<std::int64_t>(levelling::kBlockEntries));
}

void LevellingEngine::Reset() {
    m_inputs.clear();
    m_entries.clear();
    m_clips.Clear();
}

}  // namespace zen::host
