#include "PluginUnderTest.h"

#include <algorithm>

#include "CheckResult.h"

namespace zenfx {

PluginUnderTest::PluginUnderTest(std::unique_ptr<zen::PluginInstance> instance, RealtimeTally& tally)
    : m_instance(std::move(instance)), m_audio(zen::InterfaceCast<AudioPlugin>(m_instance.get())), m_tally(tally) {
    if (m_audio == nullptr) throw CheckFailure("the instance has no audio interface");
}

std::uint32_t PluginUnderTest::Width() const {
    return std::max(m_audio->GetInputChannelCount(), m_audio->GetOutputChannelCount());
}

bool PluginUnderTest::Prepare(double sampleRate, std::uint32_t maxBlock) {
    if (!m_audio->Prepare(static_cast<float>(sampleRate), maxBlock)) return false;
    m_sampleRate = sampleRate;
    m_maxBlock = maxBlock;
    return true;
}

bool PluginUnderTest::Process(Planar& io, const std::vector<std::uint32_t>& lengths) {
    const std::uint32_t width = Width();
    if (io.size() < width || lengths.empty()) throw CheckFailure("the validator built too few channels");
    const std::size_t frames = io.empty() ? 0 : io[0].size();
    m_pointers.resize(width);
    std::size_t next = 0;
    for (std::size_t done = 0; done < frames; next = (next + 1) % lengths.size()) {
        const std::size_t length = std::min<std::size_t>(std::max<std::uint32_t>(lengths[next], 1), frames - done);
        for (std::uint32_t c = 0; c < width; ++c) m_pointers[c] = io[c].data() + done;

        RealtimeWatch watch;
        const bool accepted = m_audio->Process(m_pointers.data(), length);
        const RealtimeCounts counts = watch.Stop();

        ++m_tally.processCalls;
        m_tally.counts += counts;
        if ((counts.allocations > 0 || counts.frees > 0) && m_tally.firstAllocation.empty())
            m_tally.firstAllocation = "in " + m_tally.check + ", a block of " + std::to_string(length) +
                                      " frames at " + std::to_string(static_cast<int>(m_sampleRate)) + " Hz";
        if (counts.locks > 0 && m_tally.firstLock.empty())
            m_tally.firstLock = "in " + m_tally.check + ", a block of " + std::to_string(length) + " frames at " +
                                std::to_string(static_cast<int>(m_sampleRate)) + " Hz";
        if (!accepted) return false;
        done += length;
    }
    return true;
}

Planar PluginUnderTest::Run(const Planar& input, std::uint32_t length) {
    const std::size_t frames = input.empty() ? 0 : input[0].size();
    Planar io = signals::Silence(Width(), frames);
    const std::uint32_t inputs = m_audio->GetInputChannelCount();
    for (std::uint32_t c = 0; c < std::min<std::size_t>(inputs, input.size()); ++c) io[c] = input[c];
    if (!Process(io, length)) throw CheckFailure("Process refused a block after a successful Prepare");
    return io;
}

bool PluginUnderTest::SetAll(const std::vector<float>& values) {
    bool accepted = true;
    for (std::uint32_t i = 0; i < values.size(); ++i) accepted = m_audio->SetParameter(i, values[i]) && accepted;
    return accepted;
}

std::vector<float> PluginUnderTest::Values() const {
    std::vector<float> values(m_audio->GetParameterCount());
    for (std::uint32_t i = 0; i < values.size(); ++i) values[i] = m_audio->GetParameter(i);
    return values;
}

}  // namespace zenfx
