// The gain list of the "AI" plug-in: per entry of kEntryFrames samples the
// speech loudness the audio thread measured and the engine's answer (gain in
// tenths of a dB, speech in and out, share of speech). A ring of fixed
// capacity, allocated at construction; entries are numbered from the start of
// the analysis and wrap at the capacity.
//
// Threads: the audio thread writes measurements (entry by entry, in order)
// and reads answers; one background thread reads measurements and writes
// answers. Every field is atomic, so neither side waits.
#pragma once

#include <atomic>
#include <cstdint>
#include <memory>

#include "zen/LevellerEngine.h"

class GainList {
public:
    // Two hours and a quarter at 48 kHz.
    static constexpr std::uint32_t kCapacity = 20480;

    GainList();
    GainList(const GainList&) = delete;
    GainList& operator=(const GainList&) = delete;

    // Any thread: forgets every answer (a new analysis); measurements stay.
    void ForgetAnswers() noexcept;

    // Audio thread. Stores the measurement of `entry` when it is the next
    // one the list expects; later passes over measured entries change nothing.
    void WriteMeasurement(std::uint64_t entry, float loudness, std::int32_t voicedPerMille) noexcept;
    // Entries measured so far: 0 .. Written() - 1.
    std::uint64_t Written() const noexcept { return m_written.load(std::memory_order_acquire); }
    float Measurement(std::uint64_t entry) const noexcept;
    std::int32_t Voiced(std::uint64_t entry) const noexcept;

    // Background thread: the engine's answer for an entry still in the ring.
    void WriteAnswer(std::uint64_t entry, const zen::levelling::EntryRecord& record) noexcept;
    // Any thread: the answer, when there is one.
    bool ReadAnswer(std::uint64_t entry, zen::levelling::EntryRecord& record) const noexcept;

    // True while `entry` has not been overwritten by a later lap of the ring.
    bool Holds(std::uint64_t entry) const noexcept;

private:
    std::size_t Slot(std::uint64_t entry) const noexcept { return static_cast<std::size_t>(entry % kCapacity); }

    std::unique_ptr<std::atomic<float>[]> m_measured;
    std::unique_ptr<std::atomic<std::int32_t>[]> m_voiced;
    std::unique_ptr<std::atomic<std::int32_t>[]> m_gain;
    std::unique_ptr<std::atomic<std::int32_t>[]> m_input;
    std::unique_ptr<std::atomic<std::int32_t>[]> m_output;
    std::unique_ptr<std::atomic<std::int32_t>[]> m_speech;
    // Key of the answer a slot holds: the analysis in the high half, entry
    // number + 1 in the low half; 0 for none.
    std::uint64_t Key(std::uint64_t entry) const noexcept {
        return (m_analysis.load(std::memory_order_acquire) << 32) | ((entry + 1) & 0xFFFFFFFFu);
    }

    std::unique_ptr<std::atomic<std::uint64_t>[]> m_answered;
    std::atomic<std::uint64_t> m_written{0};
    std::atomic<std::uint64_t> m_analysis{1};
};
