// zenfx process --learn START:END: plug-ins with a "Learn" switch (such as
// "Noise Reduction") learn from a region of the input before the file is
// processed. For each such stage a first pass reads the input up to END and
// runs the chain over START..END seconds with that stage's Learn on; the
// output is dropped. Learn then goes off and every stage is reset, so the
// file's pass starts clean and the plug-in ends its learn on its first block.
#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "AudioFile.h"
#include "Commands.h"
#include "HostCore/Studio/StudioModel.h"

namespace zenfx {

struct LearnRegion {
    double start = 0.0;  // seconds
    double end = 0.0;
};

// "START:END" in seconds, 0 <= START < END; throws ZenfxError (usage).
LearnRegion ParseLearnRegion(const std::string& text);

// Runs the first passes of every stage with a learn region; stage s is
// `plugins[s]` in the studio's `channel`, which is prepared (a template may
// have loaded more slots between stages). `open` gives a fresh source of the
// input each time. Throws ZenfxError for a region outside the input or a
// plug-in without "Learn".
void RunLearnPasses(zen::host::StudioModel& studio, std::size_t channel, const std::vector<StageSpec>& stages,
                    const std::vector<AudioPlugin*>& plugins,
                    const std::function<std::unique_ptr<AudioSource>()>& open, std::uint32_t block);

}  // namespace zenfx
