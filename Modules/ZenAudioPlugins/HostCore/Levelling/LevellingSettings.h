// The settings of one channel's levelling engine: the parameter table of
// zen/LevellerEngine.h by index, the levelling mode, the range points and
// the clip normalisation, each kept inside its documented range.
#pragma once

#include <array>
#include <cstdint>

#include "zen/LevellerEngine.h"

namespace zen::host {

class LevellingSettings {
public:
    enum Index : std::uint32_t {
        kTargetOffset = 0,
        kMaxBoost = 1,
        kMaxCut = 2,
        kAttack = 3,
        kRelease = 4,
        kLookahead = 5,
        kMaxGainRate = 6,
        kPauseHold = 10,
        kBackgroundReduction = 11,
        kReduceLoudDialogue = 12,
        kLiftSoftDialogue = 13,
        kManageLoudDialogue = 14,
        kReduceBackground = 15,
        kLoudnessWindow = 16,
        kFirstRangePoint = 17,  // In and Gain of point p at 17 + 2p, 18 + 2p
        kNormaliseClips = 25,
        kClipTarget = 26,
        kClipRange = 27,
        kClipGap = 28,
        kClipPeakCeiling = 29,
        kClipMaxGain = 30,
        kMusicDucking = 31,
        kHoldTime = 32,
        kGateThreshold = 35,
        kSilenceGain = 36,
        kOutputTrim = 37,
    };
    static constexpr std::uint32_t kRangePoints = 4;
    // A range point's In at or below this is no point.
    static constexpr float kNoRangePoint = -70.0f;

    LevellingSettings();

    // Clamped to the parameter's range. False for an index above 37 and for
    // 33 and 34, which are the plug-in's own switches.
    bool Set(std::uint32_t index, float value);
    float Get(std::uint32_t index) const { return m_values[index]; }
    bool IsOn(std::uint32_t index) const { return m_values[index] > 0.5f; }

    // False for a mode outside kLevellingModes.
    bool SetMode(int mode);
    int Mode() const { return m_mode; }
    bool IsLevelling() const { return m_mode != 0; }
    // The mode's dialogue target plus "Target Offset", LUFS.
    double Target() const;

    // False for a point outside 0..3.
    bool SetRangePoint(std::uint32_t point, float in, float gain);
    void SetClipAdvanced(float gapSeconds, float peakCeiling, float maxGain);
    // kNoValue as target: the clips follow the mode's target.
    void SetNormaliseClips(bool on, float target, float range);
    // LUFS the clips are brought to.
    double ClipTarget() const;

private:
    std::array<float, levelling::kParameterCount> m_values{};
    int m_mode = 0;
    bool m_clipFollowsMode = false;
};

}  // namespace zen::host
