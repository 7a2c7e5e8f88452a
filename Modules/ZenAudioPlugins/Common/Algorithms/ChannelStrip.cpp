#include "ChannelStrip.h"

namespace zen {

void ChannelStrip::Add(StripStage& stage, const SmoothedRamp& fade) { m_links.push_back({&stage, &fade}); }

void ChannelStrip::Prepare(std::uint32_t channels, std::uint32_t maxBlock) {
    for (const Link& link : m_links) link.stage->Prepare(channels, maxBlock);
    Reset();
}

bool ChannelStrip::SwitchesSettled() const noexcept {
    for (const Link& link : m_links) {
        const SmoothedRamp& fade = *link.fade;
        if (!fade.IsConstant() || (fade[0] != 0.0f && fade[0] != 1.0f)) return false;
    }
    return true;
}

void ChannelStrip::Reset() noexcept {
    m_position = 0;
    for (const Link& link : m_links) link.stage->Reset();
}

}  // namespace zen
