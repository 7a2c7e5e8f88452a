// The editor of "Reverb": the decay across frequency and a plan of the room,
// the room, its decay, the two tone controls and the mix. "Room Size" and
// "Room Ratio" edit the floor linked: moving either sets the length and
// width (size = length x width, ratio = width / length).
#include <algorithm>
#include <cmath>
#include <memory>

#include "Common/Editor/DecayDisplay.h"
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/RoomView.h"
#include "Common/Editor/ZenEditor.h"
#include "ZenReverb.h"

namespace {

void SetEngineRecord(const zen::EditorLink& link, zen::reverb::zn_reverb& engine) {
    const std::uint32_t count = std::min<std::uint32_t>(link.GetParameterCount(), ZenReverb::kParameterCount);
    for (std::uint32_t p = 0; p < count; ++p)
        engine.Set(ZenReverb::RecordEntry(p), ZenReverb::ToRecord(p, link.GetParameter(p)));
}

// Follows "Room Size" and "Room Ratio" into the length and width.
class FloorLink {
public:
    explicit FloorLink(zen::EditorLink& link)
        : m_link(link), m_size(link.GetParameter(ZenReverb::kRoomSize)), m_ratio(link.GetParameter(ZenReverb::kRoomRatio)) {}

    void Follow() {
        const float size = m_link.GetParameter(ZenReverb::kRoomSize);
        const float ratio = m_link.GetParameter(ZenReverb::kRoomRatio);
        if (size == m_size && ratio == m_ratio) return;
        m_size = size;
        m_ratio = ratio;
        const auto side = [](double metres) {
            return static_cast<float>(std::clamp(metres, double(ZenReverb::kMinRoomDimension), double(ZenReverb::kMaxRoomLength)));
        };
        m_link.SetParameter(ZenReverb::kRoomLength, side(std::sqrt(double(size) / ratio)));
        m_link.SetParameter(ZenReverb::kRoomWidth, side(std::sqrt(double(size) * ratio)));
    }

private:
    zen::EditorLink& m_link;
    float m_size, m_ratio;
};

void BuildReverbEditor(ZenEditor& editor) {
    if (editor.Link().GetParameterCount() < ZenReverb::kParameterCount) return;
    editor.AddDisplay(new DecayDisplay(QObject::tr("Decay Time"), &SetEngineRecord), 3);
    editor.AddDisplay(new RoomView(QObject::tr("Room"), ZenReverb::kRoomLength, ZenReverb::kRoomWidth,
                                   ZenReverb::kRoomHeight, ZenReverb::kDistance),
                      2);
    auto floor = std::make_shared<FloorLink>(editor.Link());
    editor.OnRefresh([floor] { floor->Follow(); });

    editor.AddGroup(QObject::tr("Room"), {"ROOM_LENGTH", "ROOM_WIDTH", "ROOM_HEIGHT", "ROOM_SIZE", "ROOM_RATIO"});
    editor.AddGroup(QObject::tr("Decay"), {"T60", "BRIGHTNESS", "MODULATION", "PRE_DELAY", "DISTANCE"});
    editor.AddGroup(QObject::tr("Early Refl."),
                    {"EARLY_LOW_FREQ", "EARLY_LOW_GAIN", "EARLY_HIGH_FREQ", "EARLY_HIGH_GAIN"});
    editor.AddGroup(QObject::tr("Late Rev."), {"LATE_LOW_FREQ", "LATE_LOW_GAIN", "LATE_HIGH_FREQ", "LATE_HIGH_GAIN"});
    editor.AddGroup(QObject::tr("Mix"), {"DRY_WET", "DIRECT_GAIN", "EARLY_GAIN", "LATE_GAIN"});
}

const EditorLayoutRegistry::Entry kLayout("ZenReverb", &BuildReverbEditor);

}  // namespace
