// One instance of the plug-in being validated, driven as a host drives it,
// with every Process call watched for allocations and locks.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "RealtimeMonitor.h"
#include "ValidationSignals.h"
#include "zen/Zen.h"

namespace zenfx {

// What every Process call of a validation did, and where it first went wrong.
struct RealtimeTally {
    RealtimeCounts counts;
    std::uint64_t processCalls = 0;
    std::string firstAllocation;  // "in blocks.lengths, a block of 17 frames at 48000 Hz"
    std::string firstLock;
    std::string check;  // the check running now
};

class PluginUnderTest {
public:
    PluginUnderTest(std::unique_ptr<zen::PluginInstance> instance, RealtimeTally& tally);

    zen::PluginInstance& Instance() { return *m_instance; }
    AudioPlugin& Audio() { return *m_audio; }
    const zen::PluginDescriptor& Descriptor() const { return *m_instance->GetDescriptor(); }

    // The channels Process is handed: max(inputs, outputs) of the layout.
    std::uint32_t Width() const;
    bool HasAudioInput() const { return m_audio->GetInputChannelCount() > 0; }

    bool Prepare(double sampleRate, std::uint32_t maxBlock);
    double SampleRate() const { return m_sampleRate; }
    std::uint32_t MaxBlock() const { return m_maxBlock; }

    // Processes `io` in place, in blocks whose lengths cycle through
    // `lengths`. False as soon as Process refuses a block.
    bool Process(Planar& io, const std::vector<std::uint32_t>& lengths);
    bool Process(Planar& io, std::uint32_t length) { return Process(io, std::vector<std::uint32_t>{length}); }

    // `input` (its channels cover the inputs; the rest is silence) through
    // the plug-in in blocks of `length`; throws CheckFailure when refused.
    Planar Run(const Planar& input, std::uint32_t length);

    // Sets every parameter; false when one is refused.
    bool SetAll(const std::vector<float>& values);
    std::vector<float> Values() const;

private:
    std::unique_ptr<zen::PluginInstance> m_instance;
    AudioPlugin* m_audio = nullptr;
    RealtimeTally& m_tally;
    double m_sampleRate = 48000.0;
    std::uint32_t m_maxBlock = 0;
    std::vector<float*> m_pointers;
};

}  // namespace zenfx
