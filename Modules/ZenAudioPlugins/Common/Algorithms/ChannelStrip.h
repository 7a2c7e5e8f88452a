// A chain of switchable stages run in order over the same channels, with a
// control grid: while controls or switches move, the stream is cut at every
// kControlInterval-th sample (counted from Prepare or Reset, not from the
// host's blocks), and the owner sets the stages' coefficients from its
// smoothed controls at each cut. So a control glides in small steps, and
// the output does not depend on how the host splits the stream. While
// nothing moves, each stage runs over the whole block at once, which gives
// the same output.
#pragma once

#include <algorithm>
#include <cstdint>
#include <vector>

#include "StripStage.h"

namespace zen {

class ChannelStrip {
public:
    static constexpr std::uint32_t kControlInterval = 16;

    // Appends a stage, switched by `fade`; both must outlive the strip.
    void Add(StripStage& stage, const SmoothedRamp& fade);

    // Prepares every stage for `channels` and blocks of up to maxBlock. Allocates.
    void Prepare(std::uint32_t channels, std::uint32_t maxBlock);
    // Back to the first grid point; every stage starts over.
    void Reset() noexcept;

    // Runs `frames` frames (at most the block the fades were read for)
    // through the stages. `atControlPoint(offset)` is called at each grid
    // point, before the stages run from `offset` on; fades count per sample.
    // `controlsSettled`: the owner has nothing new to hand on this block.
    template <class AtControlPoint>
    void Process(float* const* channels, std::uint32_t channelCount, std::uint32_t frames, bool controlsSettled,
                 AtControlPoint&& atControlPoint) noexcept {
        if (controlsSettled && SwitchesSettled()) {
            for (const Link& link : m_links) link.stage->Process(channels, channelCount, 0, frames, *link.fade);
            m_position = (m_position + frames) % kControlInterval;
            return;
        }
        for (std::uint32_t offset = 0; offset < frames;) {
            const std::uint32_t count = std::min(frames - offset, kControlInterval - m_position);
            if (m_position == 0) atControlPoint(offset);
            for (const Link& link : m_links) link.stage->Process(channels, channelCount, offset, count, *link.fade);
            m_position = (m_position + count) % kControlInterval;
            offset += count;
        }
    }

private:
    // Every switch rests fully in or fully out for the whole block.
    bool SwitchesSettled() const noexcept;

    struct Link {
        StripStage* stage;
        const SmoothedRamp* fade;
    };
    std::vector<Link> m_links;
    std::uint32_t m_position = 0;  // samples since the last grid point
};

}  // namespace zen
