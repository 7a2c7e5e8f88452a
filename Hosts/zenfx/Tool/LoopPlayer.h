// Plays interleaved source frames through a PluginFeed over and over, as the
// callback of a device (zenfx edit): the plug-in's output goes to the
// device's outputs, as many channels as both have.
#pragma once

#include <cstdint>
#include <vector>

#include "HostCore/Devices/AudioDevice.h"
#include "PluginFeed.h"

namespace zenfx {

class LoopPlayer final : public zen::host::AudioCallback {
public:
    // `interleaved` holds whole frames of `channels` samples (kept; must
    // outlive the player); none plays silence. The device has
    // `deviceOutputs` outputs.
    LoopPlayer(PluginFeed& feed, const std::vector<float>& interleaved, std::uint32_t channels,
               std::uint32_t deviceOutputs);

    void ProcessBlock(const float* const* inputs, float* const* outputs, std::uint32_t frames) noexcept override;

    // Frames taken from the source so far; wraps with it.
    std::uint64_t Position() const { return m_position; }

private:
    PluginFeed& m_feed;
    const std::vector<float>& m_source;
    std::uint32_t m_channels;
    std::uint64_t m_frames;
    std::uint64_t m_position = 0;
    std::vector<float> m_block;  // the frames of one block, across the loop point
    std::uint32_t m_deviceOutputs;
};

}  // namespace zenfx
