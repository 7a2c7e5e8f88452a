#include "GainList.h"

GainList::GainList()
    : m_measured(new std::atomic<float>[kCapacity]),
      m_voiced(new std::atomic<std::int32_t>[kCapacity]),
      m_gain(new std::atomic<std::int32_t>[kCapacity]),
      m_input(new std::atomic<std::int32_t>[kCapacity]),
      m_output(new std::atomic<std::int32_t>[kCapacity]),
      m_speech(new std::atomic<std::int32_t>[kCapacity]),
      m_answered(new std::atomic<std::uint64_t>[kCapacity]) {
    for (std::size_t i = 0; i < kCapacity; ++i) {
        m_measured[i].store(zen::levelling::kNoSpeech, std::memory_order_relaxed);
        m_voiced[i].store(0, std::memory_order_relaxed);
        m_gain[i].store(0, std::memory_order_relaxed);
        m_input[i].store(0, std::memory_order_relaxed);
        m_output[i].store(0, std::memory_order_relaxed);
        m_speech[i].store(0, std::memory_order_relaxed);
        m_answered[i].store(0, std::memory_order_relaxed);
    }
}

void GainList::ForgetAnswers() noexcept {
    // Answers of the analysis before stop matching their keys.
    m_analysis.fetch_add(1, std::memory_order_acq_rel);
}

void GainList::WriteMeasurement(std::uint64_t entry, float loudness, std::int32_t voicedPerMille) noexcept {
    if (entry != m_written.load(std::memory_order_relaxed)) return;
    const std::size_t slot = Slot(entry);
    m_measured[slot].store(loudness, std::memory_order_relaxed);
    m_voiced[slot].store(voicedPerMille, std::memory_order_relaxed);
    m_answered[slot].store(0, std::memory_order_relaxed);  // the lap before's answer is not this entry's
    m_written.store(entry + 1, std::memory_order_release);
}

bool GainList::Holds(std::uint64_t entry) const noexcept {
    const std::uint64_t written = Written();
    return entry < written && written - entry <= kCapacity;
}

float GainList::Measurement(std::uint64_t entry) const noexcept {
    return Holds(entry) ? m_measured[Slot(entry)].load(std::memory_order_relaxed) : zen::levelling::kNoSpeech;
}

std::int32_t GainList::Voiced(std::uint64_t entry) const noexcept {
    return Holds(entry) ? m_voiced[Slot(entry)].load(std::memory_order_relaxed) : 0;
}

void GainList::WriteAnswer(std::uint64_t entry, const zen::levelling::EntryRecord& record) noexcept {
    if (!Holds(entry)) return;
    const std::size_t slot = Slot(entry);
    m_answered[slot].store(0, std::memory_order_release);
    m_gain[slot].store(record.gain, std::memory_order_relaxed);
    m_input[slot].store(record.input, std::memory_order_relaxed);
    m_output[slot].store(record.output, std::memory_order_relaxed);
    m_speech[slot].store(record.speech, std::memory_order_relaxed);
    m_answered[slot].store(Key(entry), std::memory_order_release);
}

bool GainList::ReadAnswer(std::uint64_t entry, zen::levelling::EntryRecord& record) const noexcept {
    const std::size_t slot = Slot(entry);
    const std::uint64_t key = Key(entry);
    if (m_answered[slot].load(std::memory_order_acquire) != key) return false;
    record.gain = m_gain[slot].load(std::memory_order_relaxed);
    record.input = m_input[slot].load(std::memory_order_relaxed);
    record.output = m_output[slot].load(std::memory_order_relaxed);
    record.speech = m_speech[slot].load(std::memory_order_relaxed);
    // A rewrite that began meanwhile leaves the previous answer standing.
    return m_answered[slot].load(std::memory_order_acquire) == key;
}
