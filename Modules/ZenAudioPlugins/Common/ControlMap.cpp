#include "ControlMap.h"

namespace zen {

void ControlMap::Apply(SmoothedRamp* ramps, std::uint32_t i) noexcept {
    const Link* previous = nullptr;
    bool moved = false;
    float value = 0.0f;
    for (const Link& link : m_links) {
        if (previous == nullptr || link.control != previous->control) moved = ramps[link.control].Changed(i, value);
        if (moved) link.algorithm->SetParameter(link.parameter, link.offset + link.scale * value);
        previous = &link;
    }
}

bool ControlMap::Settled(const SmoothedRamp* ramps) const noexcept {
    for (const Link& link : m_links)
        if (!ramps[link.control].Settled()) return false;
    return true;
}

}  // namespace zen
