// A list of timed triggers for zenfx render: one "TIME PAD" per line, the
// time in seconds, the pad a whole number from 1; blank lines and text after
// '#' are ignored.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace zenfx {

struct Trigger {
    std::uint64_t frame = 0;  // at the render's sample rate
    std::uint32_t pad = 1;
};

// Triggers in time order (stable for equal times). Throws ZenfxError with
// "file:line: what" for a line that is not a time and a pad.
std::vector<Trigger> ParseTriggerList(const std::string& text, const std::string& fileName, int sampleRate);
std::vector<Trigger> ReadTriggerList(const std::string& path, int sampleRate);

// A trigger is a rising edge handed to the plug-in at a block start: after
// one it takes a block of one frame to fall again, so triggers closer than
// kTriggerSpacing frames are moved later. Returns how many moved.
constexpr std::uint64_t kTriggerSpacing = 2;
std::size_t SpaceTriggers(std::vector<Trigger>& triggers);

}  // namespace zenfx
