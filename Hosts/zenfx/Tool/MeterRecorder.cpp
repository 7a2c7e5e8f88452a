#include "MeterRecorder.h"

#include <algorithm>

#include "MeterJson.h"

namespace zenfx {

MeterRecorder::MeterRecorder(std::vector<Plugin> plugins) : m_plugins(std::move(plugins)) {
    for (std::size_t p = 0; p < m_plugins.size(); ++p) {
        const AudioPlugin& audio = *m_plugins[p].audio;
        for (std::uint32_t m = 0; m < audio.GetMeterCount(); ++m) {
            zen::MeterInfo info;
            if (audio.GetMeterInfo(m, info) && info.kind == zen::MeterKind::Level)
                m_levels.push_back({p, m, audio.GetMeter(m)});
        }
    }
}

void MeterRecorder::Update() {
    for (Level& level : m_levels) level.max = std::max(level.max, m_plugins[level.plugin].audio->GetMeter(level.meter));
}

nlohmann::json MeterRecorder::Json() const {
    nlohmann::json plugins = nlohmann::json::array();
    auto level = m_levels.begin();
    for (std::size_t p = 0; p < m_plugins.size(); ++p) {
        const AudioPlugin& audio = *m_plugins[p].audio;
        nlohmann::json meters = nlohmann::json::array();
        for (std::uint32_t m = 0; m < audio.GetMeterCount(); ++m) {
            nlohmann::json row = ReadMeter(audio, m);
            if (level != m_levels.end() && level->plugin == p && level->meter == m) row["max"] = (level++)->max;
            meters.push_back(row);
        }
        plugins.push_back({{"name", m_plugins[p].name}, {"key", m_plugins[p].key}, {"meters", meters}});
    }
    return {{"plugins", plugins}};
}

}  // namespace zenfx
