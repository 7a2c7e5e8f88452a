#include "LearnPass.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <iostream>

#include "StageSettings.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {

std::string Seconds(double seconds) {
    char text[32];
    std::snprintf(text, sizeof text, "%.2f", seconds);
    return text;
}

}  // namespace

LearnRegion ParseLearnRegion(const std::string& text) {
    const std::size_t colon = text.find(':');
    LearnRegion region;
    char* end = nullptr;
    bool ok = colon != std::string::npos;
    if (ok) {
        const std::string start = text.substr(0, colon), stop = text.substr(colon + 1);
        region.start = std::strtod(start.c_str(), &end);
        ok = !start.empty() && *end == '\0';
        region.end = std::strtod(stop.c_str(), &end);
        ok = ok && !stop.empty() && *end == '\0' && std::isfinite(region.start) && std::isfinite(region.end);
    }
    if (!ok) throw ZenfxError("--learn '" + text + "' is not START:END in seconds", kExitUsage);
    if (region.start < 0.0 || region.end <= region.start)
        throw ZenfxError("--learn " + text + " is an empty region: END must come after START, both from 0 s",
                         kExitUsage);
    return region;
}

void RunLearnPasses(zen::host::StudioModel& studio, std::size_t channel, const std::vector<StageSpec>& stages,
                    const std::vector<AudioPlugin*>& plugins,
                    const std::function<std::unique_ptr<AudioSource>()>& open, std::uint32_t block) {
    const auto resetAll = [&] {
        for (const auto& slot : studio.GetChannel(channel).chain) slot.audio->Reset();
    };
    for (std::size_t s = 0; s < stages.size(); ++s) {
        if (stages[s].learn.empty()) continue;
        const LearnRegion region = ParseLearnRegion(stages[s].learn);
        std::unique_ptr<AudioSource> source = open();
        const int rate = source->SampleRate();
        const auto channels = static_cast<std::size_t>(source->Channels());
        const auto first = static_cast<std::int64_t>(std::llround(region.start * rate));
        const auto last = std::min(static_cast<std::int64_t>(std::llround(region.end * rate)), source->Frames());
        if (last <= first)
            throw ZenfxError("--learn " + stages[s].learn + " holds no audio: the input lasts " +
                                 Seconds(static_cast<double>(source->Frames()) / rate) + " s",
                             kExitUsage);

        StageSettings learner(*plugins[s], stages[s].plugin, [](const std::string&) {});
        resetAll();
        learner.Set("Learn=1");
        std::vector<float> interleaved(channels * block), planar(channels * block);
        std::vector<float*> pointers(channels);
        for (std::int64_t position = 0; position < last;) {
            const std::int64_t got = source->Read(interleaved.data(), std::min<std::int64_t>(block, last - position));
            if (got <= 0) break;
            // Only the region is heard; what comes before it is read past.
            const std::int64_t from = std::max<std::int64_t>(first - position, 0);
            if (from < got) {
                const auto count = static_cast<std::size_t>(got - from);
                for (std::size_t c = 0; c < channels; ++c) {
                    pointers[c] = planar.data() + c * block;
                    for (std::size_t i = 0; i < count; ++i)
                        pointers[c][i] = interleaved[(static_cast<std::size_t>(from) + i) * channels + c];
                }
                studio.Process(channel, pointers.data(), count);
            }
            position += got;
        }
        learner.Set("Learn=0");
        resetAll();
        std::cout << "zenfx: " << stages[s].plugin << " learnt from " << Seconds(region.start) << " to "
                  << Seconds(static_cast<double>(last) / rate) << " s\n";
    }
}

}  // namespace zenfx
