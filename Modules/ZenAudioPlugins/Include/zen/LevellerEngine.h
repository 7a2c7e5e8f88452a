// The exchange between the "AI" plug-in and a host's levelling engine,
// carried by the host action "AudioLevellerEngine" (text arguments, decimal
// numbers). The plug-in measures its input per entry of kEntryFrames samples
// and hands the measurements over kBlockEntries at a time; the engine answers
// a gain (tenths of a dB) and three display values per entry. README.md,
// "Levelling engine", gives the law and what every parameter index means.
//
// Arguments of "AudioLevellerEngine":
//   INDEX VALUE                  sets engine parameter INDEX (0..37, not 33/34)
//   "SetRangePoint" P IN GAIN    range point P (0..3): speech at IN LUFS gets
//                                GAIN dB; IN at -70 or below removes the point
//   "NormaliseSetAdvancedParameters" GAP PEAK MAXGAIN
//                                clip normalisation: the pause in seconds that
//                                separates clips, the peak ceiling in dBFS and
//                                the largest gain in dB it may apply
//   "NormaliseClips" ON TARGET RANGE
//                                ON 1/0; each clip's speech to TARGET LUFS (or
//                                kNoValue: the mode's target) before riding,
//                                riding then within +-RANGE dB
//   "Process" FIRST V0 .. V9     speech loudness of entries FIRST..FIRST+9
//                                (LUFS, kNoSpeech for an entry without speech);
//                                answers kBlockEntries records for entries
//                                FIRST-10..FIRST-1: "GAIN IN OUT SPEECH" each,
//                                space separated (see EntryRecord)
//   "Finish" FIRST               the input ended before entry FIRST; answers
//                                the records of every entry not yet answered,
//                                from FIRST-10 on
//   "Reset"                      forgets the channel's input and results
//   "Mode" M                     levelling mode 0..3 (kLevellingModes)
#pragma once

#include <array>
#include <cstdint>

namespace zen::levelling {

inline constexpr const char* kEngineAction = "AudioLevellerEngine";
inline constexpr std::uint32_t kEntryFrames = 19200;  // samples per gain-list entry
inline constexpr std::uint32_t kBlockEntries = 10;    // entries per engine call
inline constexpr std::uint32_t kParameterCount = 38;  // indexes 0..37
inline constexpr std::uint32_t kLevellingOnIndex = 33;
inline constexpr std::uint32_t kApplyGainIndex = 34;
inline constexpr float kNoSpeech = -200.0f;  // input value of an entry without speech
inline constexpr float kNoValue = 99999.0f;  // preset value meaning "leave as is"
inline constexpr std::int32_t kMuteGain = -1000;  // below -999 tenths: mute

// "Levelling Mode" choices and their dialogue targets (integrated speech
// loudness, LUFS). "Unlevelled" leaves the gain at 0 dB.
inline constexpr std::array<const char*, 4> kLevellingModes = {"Unlevelled", "Narrator", "Studio Dialogue",
                                                                "Outdoor Dialogue"};
inline constexpr std::array<float, 4> kModeTargets = {0.0f, -18.0f, -24.0f, -27.0f};

// One answered entry: GAIN in tenths of a dB (kMuteGain mutes), the entry's
// speech loudness in and expected out (tenths of LUFS, kNoSpeech * 10 when
// none) and SPEECH, the share of the entry judged speech in per-mille.
struct EntryRecord {
    std::int32_t gain = 0;
    std::int32_t input = static_cast<std::int32_t>(kNoSpeech * 10);
    std::int32_t output = static_cast<std::int32_t>(kNoSpeech * 10);
    std::int32_t speech = 0;
};

struct LevellerParameter {
    const char* label;
    const char* unit;
    float minimum;
    float maximum;
    float defaultValue;
    bool isSwitch;
};

// Engine parameters by index. The plug-in offers each as a host parameter
// named by its label; 33 and 34 are the plug-in's own switches.
inline constexpr std::array<LevellerParameter, kParameterCount> kLevellerParameters = {{
    {"Target Offset", "dB", -10.0f, 10.0f, 0.0f, false},          // 0: added to the mode's target
    {"Max Boost", "dB", 0.0f, 30.0f, 24.0f, false},               // 1: most the engine raises
    {"Max Cut", "dB", 0.0f, 30.0f, 18.0f, false},                 // 2: most it lowers
    {"Attack", "s", 0.4f, 10.0f, 1.2f, false},                    // 3: time constant of falling gain
    {"Release", "s", 0.4f, 20.0f, 2.4f, false},                   // 4: time constant of rising gain
    {"Lookahead", "s", 0.0f, 4.0f, 4.0f, false},                  // 5: how early the curve moves
    {"Max Gain Rate", "dB/s", 0.5f, 2.5f, 2.5f, false},           // 6: slope limit of the curve
    {"VAD Mode", "", 0.0f, 3.0f, 2.0f, false},                    // 7: voice detector aggressiveness (plug-in)
    {"Speech Fraction", "%", 10.0f, 90.0f, 30.0f, false},         // 8: share of voiced frames for speech (plug-in)
    {"Speech Floor", "LUFS", -80.0f, -30.0f, -65.0f, false},      // 9: quieter frames are not speech (plug-in)
    {"Pause Hold", "", 0.0f, 1.0f, 1.0f, true},                   // 10: hold the gain through pauses (off: to 0 dB)
    {"Background Reduction", "dB", 0.0f, 12.0f, 0.0f, false},     // 11: cut in pauses longer than Hold Time
    {"Reduce Loud Dialogue", "", 0.0f, 1.0f, 1.0f, false},        // 12: share of a cut applied
    {"Lift Soft Dialogue", "", 0.0f, 1.0f, 1.0f, false},          // 13: share of a boost applied
    {"Manage Loud Dialogue", "", 0.0f, 1.0f, 1.0f, true},         // 14: cut speech above target
    {"Reduce Background", "", 0.0f, 1.0f, 0.0f, true},           // 15: apply Background Reduction
    {"Loudness Window", "s", 0.4f, 4.0f, 1.2f, false},            // 16: speech loudness integration
    {"Range Point 1 In", "LUFS", -70.0f, 0.0f, -70.0f, false},  // 17..24: an In at -70 is no point
    {"Range Point 1 Gain", "dB", -30.0f, 30.0f, 0.0f, false},
    {"Range Point 2 In", "LUFS", -70.0f, 0.0f, -70.0f, false},
    {"Range Point 2 Gain", "dB", -30.0f, 30.0f, 0.0f, false},
    {"Range Point 3 In", "LUFS", -70.0f, 0.0f, -70.0f, false},
    {"Range Point 3 Gain", "dB", -30.0f, 30.0f, 0.0f, false},
    {"Range Point 4 In", "LUFS", -70.0f, 0.0f, -70.0f, false},
    {"Range Point 4 Gain", "dB", -30.0f, 30.0f, 0.0f, false},
    {"Normalise Clips", "", 0.0f, 1.0f, 0.0f, true},              // 25: NormaliseClips ON
    {"Clip Target", "LUFS", -40.0f, -10.0f, -24.0f, false},        // 26: NormaliseClips TARGET
    {"Clip Range", "dB", 0.0f, 20.0f, 6.0f, false},               // 27: NormaliseClips RANGE
    {"Clip Gap", "s", 0.4f, 10.0f, 2.0f, false},                  // 28: NormaliseSetAdvancedParameters GAP
    {"Clip Peak Ceiling", "dBFS", -12.0f, 0.0f, -1.0f, false},    // 29: ... PEAK
    {"Clip Max Gain", "dB", 0.0f, 30.0f, 20.0f, false},           // 30: ... MAXGAIN
    {"Music Ducking", "dB", 0.0f, 20.0f, 0.0f, false},            // 31: pauses sit this far under the phrases
    {"Hold Time", "s", 0.0f, 10.0f, 2.0f, false},                 // 32: longer pauses are background (11)
    {"Levelling", "", 0.0f, 1.0f, 0.0f, true},                    // 33: analysis and levelling on
    {"Apply Gain List", "", 0.0f, 1.0f, 0.0f, true},              // 34: apply the gain list
    {"Gate Threshold", "dBFS", -90.0f, -30.0f, -70.0f, false},    // 35: quieter speech entries are pauses
    {"Silence Gain", "dB", -60.0f, 0.0f, 0.0f, false},            // 36: added to the gain of gated entries
    {"Output Trim", "dB", -12.0f, 12.0f, 0.0f, false},            // 37: added to every gain
}};

}  // namespace zen::levelling
