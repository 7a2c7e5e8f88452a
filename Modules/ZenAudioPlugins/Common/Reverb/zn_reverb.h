// The reverb engine: a record of room parameters turned into the settings of
// the processing object (zn_reverb_u15_param) by update steps, each marked
// by a dirty bit when one of its inputs changes and run in a fixed order,
// pass after pass, until no bit is left:
//
//   1  room -> lane lengths       (then 2, 4)   32 late gain
//   2  decay and damping          (then 32)     16 early gain
//   4  geometry -> reflections    (then 8, 16)   8 direct gain
//                                               64 modulation depths
//                                              128 the two EQs
//
// The steps run where the owner calls Update (the audio thread, before a
// block); they neither allocate nor block. Room dimensions at or below 0.1 m
// would make step 1 skip for ever, so Set refuses them.
#pragma once

#include <array>
#include <cstdint>

#include "zn_reverb_u15_param.h"

namespace zen::reverb {

class zn_reverb {
public:
    enum Entry : std::uint32_t {
        kRoomLength, kRoomWidth, kRoomHeight, kRoomSize, kRoomRatio,
        kT60, kHighDecayRatio,
        kSourceDistance, kSourceAzimuth, kSourceElevation,
        kPreDelay, kModulation,
        kBalance, kDirectGain, kEarlyGain, kLateGain,
        kEq1LowFrequency, kEq1LowGain, kEq1LowShape, kEq1HighFrequency, kEq1HighGain, kEq1HighShape,
        kEq2LowFrequency, kEq2LowGain, kEq2LowShape, kEq2HighFrequency, kEq2HighGain, kEq2HighShape,
        kEntryCount
    };

    enum Step : std::uint16_t {
        kStepLaneLengths = 1,
        kStepDecay = 2,
        kStepReflections = 4,
        kStepDirectGain = 8,
        kStepEarlyGain = 16,
        kStepLateGain = 32,
        kStepModulation = 64,
        kStepEq = 128,
        kAllSteps = 255,
    };

    static constexpr std::uint32_t kLanes = 16;
    static constexpr std::uint32_t kTaps = 16;
    static constexpr float kSpeedOfSound = 340.0f;  // m/s
    static constexpr float kMinDimension = 0.1f;    // m
    static constexpr float kMaxDimension = 1000.0f;
    static constexpr float kSourceBox = 0.475f;     // of each dimension, around the centre
    static constexpr float kMinDistance = 0.01f;
    static constexpr float kMinPathBehindDirect = 0.1f;  // m
    static constexpr float kMinPreDelayedTap = 4.0f;     // samples
    static constexpr float kDampingLimit = -0.9999f;
    static constexpr float kDepthPerModulation = 0.02f;  // samples per unit and tap multiplier
    static constexpr std::uint32_t kFirstDepthMultiplier = 6;
    static constexpr double kLogFloor = 1e-10;
    // A maximal-length binary sequence: each channel hears the taps with its own polarities.
    static constexpr std::array<float, 15> kSigns = {1, 1, 1, 1, -1, -1, -1, 1, -1, -1, 1, 1, -1, 1, -1};
    // Level of each lane in the late gain matrix.
    static constexpr float kLateOutputGain = 0.25f;

    // The taps' result of the geometry step.
    struct Reflections {
        std::uint32_t delays[kTaps];
        float gains[kTaps];  // 1 / (r + 1)
        float directDistance;
        float directGain;    // 1 / (r0 + 1)
    };

    // Record defaults, every step dirty. `sampleRate` is the engine's rate.
    zn_reverb(float sampleRate, std::uint32_t inputs, std::uint32_t outputs);

    // False, nothing changed, for an index out of range, a value that is not
    // finite, a room dimension at or below 0.1 m, or a decay time or ratio
    // that is not positive. A new value marks the steps that read the entry.
    bool Set(std::uint32_t entry, float value);
    float Get(std::uint32_t entry) const { return entry < kEntryCount ? m_record[entry] : 0.0f; }

    // Runs the marked steps; true when any ran.
    bool Update();
    std::uint16_t Dirty() const { return m_dirty; }
    void MarkDirty(std::uint16_t steps) { m_dirty |= steps; }
    // How often a step has run (tests and diagnostics).
    std::uint64_t Runs(Step step) const;

    float SampleRate() const { return m_fs; }
    const zn_reverb_u15_param& Param() const { return m_param; }
    float LaneTime(std::uint32_t lane) const { return m_tau[lane]; }
    float DirectDistanceGain() const { return m_directDistanceGain; }
    float LateLevel() const { return m_lateLevel; }
    float DirectMix() const { return m_directMix; }
    float EarlyMix() const { return m_earlyMix; }
    float LateMix() const { return m_lateMix; }

    // The steps' formulas, on their own.
    static float FastInverseSqrt(float v);
    // False (lengths untouched) when a dimension is at or below 0.1 m after clamping.
    static bool RoomToLaneLengths(float length, float width, float height, float sampleRate, std::uint32_t* lengths);
    static Reflections GeometryToReflections(const float* record, float sampleRate);
    // The early gain matrix (channels x 16) from the tap gains.
    static void ChannelGains(const float* tapGains, ublas::matrix<float>& matrix);
    static float DirectMixGain(float balance, float directDistanceGain);
    static float EarlyMixGain(float balance);
    static float LateMixGain(float balance, float lateLevel);

private:
    void RunLaneLengths();
    void RunDecay();
    void RunReflections();
    void RunDirectGain();
    void RunEarlyGain();
    void RunLateGain();
    void RunModulation();
    void RunEq();

    float m_fs;
    std::uint32_t m_inputs, m_outputs;
    std::array<float, kEntryCount> m_record;
    std::uint16_t m_dirty = kAllSteps;
    std::array<std::uint64_t, 8> m_runs{};

    zn_reverb_u15_param m_param;
    ublas::matrix<float> m_routing;      // outputs x inputs
    ublas::matrix<float> m_earlyMatrix;  // outputs x 16, before the mix law
    ublas::matrix<float> m_lateMatrix;   // outputs x 16, before the mix law
    std::array<float, kLanes> m_tau{};
    float m_directDistanceGain = 1.0f;
    float m_lateLevel = 1.0f;
    float m_directMix = 1.0f, m_earlyMix = 1.0f, m_lateMix = 1.0f;
};

}  // namespace zen::reverb
