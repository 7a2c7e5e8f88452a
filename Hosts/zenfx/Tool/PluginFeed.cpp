#include "PluginFeed.h"

#include <algorithm>
#include <utility>

#include "PluginLibrary.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {

// After the source's own width: the layouts a user inserts on a track or bus.
constexpr std::pair<std::uint32_t, std::uint32_t> kFallbackLayouts[] = {{2, 2}, {1, 1}, {1, 2}, {6, 6}, {8, 8}};

}  // namespace

PluginFeed::PluginFeed(zen::PluginInstance& instance, std::uint32_t sourceChannels, int sampleRate,
                       std::uint32_t maxBlock)
    : m_audio(AudioOf(instance)), m_sourceChannels(std::max(sourceChannels, 1u)), m_maxBlock(maxBlock) {
    AudioPlugin& audio = m_audio;
    const std::string name = instance.GetName();
    const bool hasInput = instance.GetDescriptor()->inputChannelLimit > 0;
    std::vector<std::pair<std::uint32_t, std::uint32_t>> layouts;
    if (hasInput) {
        layouts.emplace_back(m_sourceChannels, m_sourceChannels);
        layouts.insert(layouts.end(), std::begin(kFallbackLayouts), std::end(kFallbackLayouts));
    } else {
        layouts = {{0, m_sourceChannels}, {0, 2}, {0, 1}};
    }
    for (const auto& [inputs, outputs] : layouts)
        if (audio.ConfigureChannels(inputs, outputs)) {
            m_inputs = inputs;
            m_outputs = outputs;
            break;
        }
    if (m_outputs == 0) throw ZenfxError("'" + name + "' takes none of the channel layouts zenfx offers");
    if (!audio.Prepare(static_cast<float>(sampleRate), maxBlock))
        throw ZenfxError("'" + name + "' cannot run at " + std::to_string(sampleRate) + " Hz");

    const std::uint32_t width = std::max(m_inputs, m_outputs);
    m_planar.assign(static_cast<std::size_t>(width) * maxBlock, 0.0f);
    for (std::uint32_t c = 0; c < width; ++c) m_pointers.push_back(m_planar.data() + std::size_t{c} * maxBlock);
}

bool PluginFeed::Process(const float* interleaved, std::uint32_t frames) noexcept {
    frames = std::min(frames, m_maxBlock);
    std::fill(m_planar.begin(), m_planar.end(), 0.0f);
    for (std::uint32_t c = 0; c < m_inputs; ++c) {
        const std::uint32_t source = c % m_sourceChannels;
        for (std::uint32_t i = 0; i < frames; ++i) m_pointers[c][i] = interleaved[std::size_t{i} * m_sourceChannels + source];
    }
    return m_audio.Process(m_pointers.data(), frames);
}

}  // namespace zenfx
