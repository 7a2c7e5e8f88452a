#include "RealtimeChecks.h"

#include <limits>

#include "BlockChecks.h"

namespace zenfx {

void RealtimeChecks::Run() {
    m_context.Run("realtime.allocation", [this] {
        Exercise();
        return Allocations();
    });
    m_context.Run("realtime.locks", [this] {
        if (!m_context.Wants("realtime.allocation")) Exercise();
        return Locks();
    });
}

void RealtimeChecks::Exercise() {
    const auto& parameters = m_context.Parameters();
    std::mt19937& random = m_context.Random();
    std::uniform_int_distribution<std::size_t> pickLength(0, std::size(BlockChecks::kLengths) - 1);
    std::uniform_int_distribution<int> event(0, 15);

    for (double rate : {48000.0, 96000.0, 44100.0}) {
        auto plugin = m_context.NewPrepared(rate, ValidationContext::kMaxBlock);
        AudioPlugin& audio = plugin->Audio();
        // One pass in mono, where the plug-in takes it (it prepares again).
        if (rate == 44100.0) audio.ConfigureChannels(plugin->HasAudioInput() ? 1 : 0, 1);
        const std::uint32_t width = plugin->Width();
        const int blocks = m_context.Scaled(40);
        for (int b = 0; b < blocks; ++b) {
            const std::uint32_t length = BlockChecks::kLengths[pickLength(random)];
            Planar io = signals::Noise(width, length, ValidationContext::kTestLevel, random);
            switch (event(random)) {
                case 0: audio.SetBypass(!audio.IsBypassed()); break;
                case 1: audio.Reset(); break;
                case 2: io[0][0] = std::numeric_limits<float>::quiet_NaN(); break;
                case 3: plugin->SetAll(m_context.RandomSetting()); break;
                default:
                    if (!parameters.empty()) {
                        std::uniform_int_distribution<std::uint32_t> pick(0, static_cast<std::uint32_t>(parameters.size() - 1));
                        const std::uint32_t index = pick(random);
                        audio.SetParameter(index, m_context.RandomValue(parameters[index]));
                    }
                    break;
            }
            plugin->Process(io, length);
        }
    }
}

CheckOutcome RealtimeChecks::Allocations() {
    if (!RealtimeWatch::SeesAllocations()) return Skip("this build of zenfx cannot see the allocator");
    const RealtimeTally& tally = m_context.Tally();
    const std::string calls = std::to_string(tally.processCalls) + " Process calls";
    if (tally.counts.allocations == 0 && tally.counts.frees == 0)
        return Pass("no heap allocation or free inside " + calls);
    return Fail(std::to_string(tally.counts.allocations) + " allocations and " + std::to_string(tally.counts.frees) +
                " frees inside " + calls + "; the first " + tally.firstAllocation);
}

CheckOutcome RealtimeChecks::Locks() {
    const RealtimeTally& tally = m_context.Tally();
    const std::string calls = std::to_string(tally.processCalls) + " Process calls";
    if (tally.counts.locks == 0) return Pass("no lock taken inside " + calls);
    auto plugin = m_context.NewInstance();
    const std::string taken = std::to_string(tally.counts.locks) + " locks taken inside " + calls;
    if (plugin->Audio().LocksAudioPath()) return Pass(taken + ", as the plug-in declares (LocksAudioPath)");
    return Fail(taken + "; the first " + tally.firstLock + "; the plug-in does not declare LocksAudioPath");
}

}  // namespace zenfx
