#include "LevellingPasses.h"

#include <algorithm>
#include <iostream>
#include <vector>

#include "ProgressBar.h"
#include "ZenfxError.h"
#include "zen/BackgroundTask.h"
#include "zen/LevellerEngine.h"

namespace zenfx {

namespace {

using zen::levelling::kApplyGainIndex;
using zen::levelling::kLevellerParameters;
using zen::levelling::kLevellingOnIndex;

// The index of the parameter labelled `label`, or -1.
std::int64_t FindLabel(AudioPlugin& audio, const char* label) {
    for (std::uint32_t i = 0; i < audio.GetParameterCount(); ++i) {
        zen::ParameterInfo info;
        if (audio.GetParameterInfo(i, info) && info.label == label) return i;
    }
    return -1;
}

}  // namespace

bool RunLevellingPasses(zen::host::StudioModel& studio, std::size_t channel,
                        const std::function<std::unique_ptr<AudioSource>()>& open, std::uint32_t block) {
    // The "Apply Gain List" switches of the slots that level.
    std::vector<std::pair<AudioPlugin*, std::uint32_t>> levellers;
    for (const zen::host::StudioModel::Slot& slot : studio.GetChannel(channel).chain) {
        if (slot.instance->QueryInterface(zen::BackgroundTask::kInterfaceName) == nullptr) continue;
        const std::int64_t on = FindLabel(*slot.audio, kLevellerParameters[kLevellingOnIndex].label);
        const std::int64_t apply = FindLabel(*slot.audio, kLevellerParameters[kApplyGainIndex].label);
        if (on >= 0 && apply >= 0 && slot.audio->GetParameter(static_cast<std::uint32_t>(on)) > 0.5f)
            levellers.emplace_back(slot.audio, static_cast<std::uint32_t>(apply));
    }
    if (levellers.empty()) return false;

    for (const auto& [audio, apply] : levellers) audio->SetParameter(apply, 0.0f);
    const std::unique_ptr<AudioSource> source = open();
    const auto channels = static_cast<std::size_t>(source->Channels());
    // As far as the writing pass runs (the input and the chain's delayed
    // tail), on to the end of that entry: the plug-in answers only entries
    // it measured whole.
    const std::int64_t entry = zen::levelling::kEntryFrames;
    const std::int64_t total =
        ((source->Frames() + static_cast<std::int64_t>(studio.Latency(channel))) / entry + 1) * entry;
    std::vector<float> interleaved(channels * block), planar(channels * block);
    std::vector<float*> pointers(channels);
    for (std::size_t c = 0; c < channels; ++c) pointers[c] = planar.data() + c * block;
    {
        ProgressBar progress(total);
        for (std::int64_t done = 0; done < total;) {
            const std::int64_t got = std::max<std::int64_t>(0, source->Read(interleaved.data(), block));
            std::fill(interleaved.begin() + got * static_cast<std::int64_t>(channels), interleaved.end(), 0.0f);
            for (std::size_t i = 0; i < block; ++i)
                for (std::size_t c = 0; c < channels; ++c) pointers[c][i] = interleaved[i * channels + c];
            const std::size_t count = static_cast<std::size_t>(std::min<std::int64_t>(block, total - done));
            if (!studio.Process(channel, pointers.data(), count))
                throw ZenfxError("a plug-in of the chain refused to process a block of the levelling analysis");
            done += static_cast<std::int64_t>(count);
            studio.RunBackgroundTasks(channel, false);
            progress.Update(done);
        }
    }
    studio.RunBackgroundTasks(channel, true);
    for (std::size_t s = 0; s < studio.GetChannel(channel).chain.size(); ++s) studio.PluginAt(channel, s).Reset();
    for (const auto& [audio, apply] : levellers) audio->SetParameter(apply, 1.0f);
    std::cout << "zenfx: levelling analysed in a first pass; the gain list is applied in the second\n";
    return true;
}

}  // namespace zenfx
