// The levelling engine of one mixer channel: takes the speech loudness of
// each entry (kEntryFrames samples, 0.4 s at 48 kHz) and answers the gain
// that brings the dialogue to the mode's target.
//
// The gain law, entry by entry:
// - speech: "target + Target Offset - loudness", the loudness being the
//   energy mean of the speech entries within "Loudness Window" around the
//   entry (or the range points' law, or the clip law below); a cut scaled by
//   "Reduce Loud Dialogue" (none without "Manage Loud Dialogue"), a boost by
//   "Lift Soft Dialogue", then held within "Max Cut" and "Max Boost". The
//   gain moves toward it with "Attack" as time constant when falling and
//   "Release" when rising;
// - pauses: with "Pause Hold" the gain stays at the last phrase's gain, or
//   heads for the next phrase's once that is in sight, so it only moves
//   monotonically between the two; without, it heads for 0 dB. "Music
//   Ducking" lowers it in every pause, "Background Reduction" (with "Reduce
//   Background") in pauses longer than "Hold Time", "Silence Gain" in
//   entries whose speech lies under "Gate Threshold" or 15 LU under the
//   loudest speech of the 4 s before (a bed, room tone): those are pauses;
// - lookahead: the gain reaches each phrase's gain by the phrase's first
//   entry, starting as late as "Max Gain Rate" allows, "Lookahead" ahead at
//   most;
// - "Max Gain Rate": consecutive entries differ by at most rate x 0.4 s;
// - clips ("Normalise Clips"): speech separated by pauses of "Clip Gap" is a
//   clip; its speech so far (and in sight) is brought to "Clip Target",
//   below "Clip Peak Ceiling" minus its loudest entry and "Clip Max Gain",
//   and the ride then stays within +-"Clip Range" of that;
// - "Output Trim" is added to every answered gain; "Unlevelled" answers 0.
//
// An entry's answer depends only on the inputs up to ten entries after it,
// so the answers for FIRST-10..FIRST-1 are final once FIRST+9 is known, and
// feeding the same input in any blocks answers the same. Not for the audio
// thread: it allocates as the input grows.
#pragma once

#include <array>
#include <cstdint>
#include <vector>

#include "ClipTracker.h"
#include "LevellingSettings.h"
#include "RangeLaw.h"
#include "zen/LevellerEngine.h"

namespace zen::host {

class LevellingEngine {
public:
    using Records = std::array<levelling::EntryRecord, levelling::kBlockEntries>;
    using Inputs = std::array<float, levelling::kBlockEntries>;
    // The engine reads an entry as 0.4 s whatever the host's rate.
    static constexpr double kEntrySeconds = levelling::kEntryFrames / 48000.0;
    // How far past an entry its answer may look.
    static constexpr std::int64_t kLookaheadEntries = levelling::kBlockEntries;
    // "Speech" this far below the loudest speech of the 4 s before it is
    // taken for what a voice detector hears in a music bed or room tone.
    static constexpr float kRelativeGateLu = 15.0f;
    static constexpr std::int64_t kRelativeGateEntries = 10;

    // Changes apply to the entries not answered yet.
    LevellingSettings& Settings() { return m_settings; }
    const LevellingSettings& Settings() const { return m_settings; }

    // The speech loudness of entries first..first+9 (kNoSpeech: none);
    // answers entries first-10..first-1 (before entry 0: unity). Sending an
    // earlier block again replaces its input and what followed it.
    Records Process(std::int64_t first, const Inputs& values);
    // The input ended before entry `first`; answers first-10..first-1.
    Records Finish(std::int64_t first);
    // Forgets the input and the answers, keeps the settings.
    void Reset();

    // Entries answered or ready to be, and an entry's gain in dB (before
    // "Output Trim"), for inspection.
    std::int64_t Computed() const { return static_cast<std::int64_t>(m_entries.size()); }
    double GainDb(std::int64_t entry) const { return m_entries[static_cast<std::size_t>(entry)].gain; }

private:
    struct Entry {
        double gain = 0.0;  // dB
        double held = 0.0;  // the gain of the last speech entry
        std::int64_t pauseRun = 0;
    };

    float Input(std::int64_t entry) const;
    bool IsAboveGate(std::int64_t entry) const;
    bool IsSpeech(std::int64_t entry) const;
    bool IsGated(std::int64_t entry) const;
    bool IsPhraseStart(std::int64_t entry) const;
    std::int64_t HalfWindow() const;
    double WindowLoudness(std::int64_t entry) const;
    double SpeechTarget(std::int64_t entry) const;
    double PauseAim(std::int64_t entry, const Entry& before, bool nextSeen, double next) const;
    void StoreInput(std::int64_t first, const Inputs& values);
    void ForgetFrom(std::int64_t entry);
    void ComputeUpTo(std::int64_t end);
    void ComputeEntry(std::int64_t entry);
    levelling::EntryRecord Answer(std::int64_t entry) const;
    Records Answers(std::int64_t from) const;

    LevellingSettings m_settings;
    RangeLaw m_law;  // of m_settings, taken at each ComputeUpTo
    std::vector<float> m_inputs;
    std::vector<Entry> m_entries;
    ClipTracker m_clips;
    std::int64_t m_clipGap = 0;  // what m_clips was built with
    float m_clipGate = 0.0f;
};

}  // namespace zen::host
