// Hands a plug-in's smoothed controls on to the parameters of its
// algorithms at control points, each through a straight line (parameter =
// offset + scale * control), and only when the control moved. One control
// may drive several parameters; its links are added one after another.
#pragma once

#include <cstdint>
#include <vector>

#include "SmoothedRamp.h"
#include "ZenAudioAlgorithm.h"

namespace zen {

class ControlMap {
public:
    struct Link {
        std::uint32_t control;  // index into the ramps
        ZenAudioAlgorithm* algorithm;
        std::uint64_t parameter;
        float scale = 1.0f;
        float offset = 0.0f;
    };

    // Construction only: allocates.
    void Add(const Link& link) { m_links.push_back(link); }

    // The controls that moved, at sample i of the block; `ramps` holds one
    // per control of the owner. Audio thread.
    void Apply(SmoothedRamp* ramps, std::uint32_t i) noexcept;
    // No control has anything new to hand on this block.
    bool Settled(const SmoothedRamp* ramps) const noexcept;

private:
    std::vector<Link> m_links;
};

}  // namespace zen
