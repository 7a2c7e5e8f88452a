// One audio plug-in fed from interleaved source frames, for the commands that
// run it beside its editor (edit, screenshot). The plug-in takes the source's
// width when it can, else the first layout it accepts, each input channel
// reading source channel (c mod width); plug-ins without audio input play
// over silence.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "zen/Zen.h"

namespace zenfx {

class PluginFeed {
public:
    // Configures and prepares the instance's audio plug-in (kept; must
    // outlive the feed). Throws ZenfxError naming the plug-in when it has no
    // audio interface or refuses every layout or the rate.
    PluginFeed(zen::PluginInstance& instance, std::uint32_t sourceChannels, int sampleRate,
               std::uint32_t maxBlock);

    std::uint32_t Inputs() const { return m_inputs; }
    std::uint32_t Outputs() const { return m_outputs; }
    std::uint32_t MaxBlock() const { return m_maxBlock; }

    // Up to MaxBlock frames of the source, interleaved at its width; the
    // plug-in's output is then in Output(c). Real-time safe.
    bool Process(const float* interleaved, std::uint32_t frames) noexcept;
    const float* Output(std::uint32_t channel) const { return m_pointers[channel]; }

private:
    AudioPlugin& m_audio;
    std::uint32_t m_sourceChannels;
    std::uint32_t m_inputs = 0;
    std::uint32_t m_outputs = 0;
    std::uint32_t m_maxBlock;
    std::vector<float> m_planar;
    std::vector<float*> m_pointers;
};

}  // namespace zenfx
