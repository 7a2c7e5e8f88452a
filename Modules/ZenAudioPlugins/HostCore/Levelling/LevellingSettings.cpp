#include "LevellingSettings.h"

#include <algorithm>
#include <cmath>

namespace zen::host {

using zen::levelling::kLevellerParameters;

LevellingSettings::LevellingSettings() {
    for (std::uint32_t i = 0; i < levelling::kParameterCount; ++i) m_values[i] = kLevellerParameters[i].defaultValue;
}

bool LevellingSettings::Set(std::uint32_t index, float value) {
    if (index >= levelling::kParameterCount || index == levelling::kLevellingOnIndex ||
        index == levelling::kApplyGainIndex || !std::isfinite(value))
        return false;
    const auto& p = kLevellerParameters[index];
    m_values[index] = std::clamp(value, p.minimum, p.maximum);
    if (index == kClipTarget) m_clipFollowsMode = false;
    return true;
}

bool LevellingSettings::SetMode(int mode) {
    if (mode < 0 || mode >= static_cast<int>(levelling::kLevellingModes.size())) return false;
    m_mode = mode;
    return true;
}

double LevellingSettings::Target() const {
    return static_cast<double>(levelling::kModeTargets[static_cast<std::size_t>(m_mode)]) + m_values[kTargetOffset];
}

bool LevellingSettings::SetRangePoint(std::uint32_t point, float in, float gain) {
    if (point >= kRangePoints) return false;
    Set(kFirstRangePoint + 2 * point, std::max(in, kNoRangePoint));
    Set(kFirstRangePoint + 2 * point + 1, gain);
    return true;
}

void LevellingSettings::SetClipAdvanced(float gapSeconds, float peakCeiling, float maxGain) {
    Set(kClipGap, gapSeconds);
    Set(kClipPeakCeiling, peakCeiling);
    Set(kClipMaxGain, maxGain);
}

void LevellingSettings::SetNormaliseClips(bool on, float target, float range) {
    Set(kNormaliseClips, on ? 1.0f : 0.0f);
    if (target == levelling::kNoValue) {
        m_clipFollowsMode = true;
    } else {
        Set(kClipTarget, target);
    }
    Set(kClipRange, range);
}

double LevellingSettings::ClipTarget() const { return m_clipFollowsMode ? Target() : m_values[kClipTarget]; }

}  // namespace zen::host
