#include "AIControlTemplate.h"

#include <cmath>
#include <cstring>

#include "zen/LevellerEngine.h"

namespace zen {
Q_LOGGING_CATEGORY(aiTrace, "zen.ai", QtInfoMsg)
}  // namespace zen

AIControlTemplate::AIControlTemplate(AITemplateOwner& owner, const char* name, std::vector<const char*> controls)
    : m_owner(owner), m_name(name), m_controls(std::move(controls)), m_values(m_controls.size(), 0.0f) {}

const std::vector<AIControlTemplate::Mapping>& AIControlTemplate::MappingsOf(std::size_t control) const {
    static const std::vector<Mapping> kNone;
    const auto it = m_mappings.find(control);
    return it == m_mappings.end() ? kNone : it->second;
}

void AIControlTemplate::AddDefault(const char* target, const char* parameter, float value) {
    m_defaults.push_back({target, parameter, value});
}

void AIControlTemplate::AddMapping(std::size_t control, const char* target, const char* parameter, float scale,
                                   float offset) {
    m_mappings[control].push_back({target, parameter, scale, offset});
}

int AIControlTemplate::EngineIndex(const char* label) {
    for (std::uint32_t i = 0; i < zen::levelling::kParameterCount; ++i)
        if (std::strcmp(zen::levelling::kLevellerParameters[i].label, label) == 0) return static_cast<int>(i);
    return -1;
}

long long AIControlTemplate::ToInteger(float value) { return static_cast<long long>(std::trunc(value * 10.0f)); }

void AIControlTemplate::SetValue(std::size_t control, float value) {
    qCDebug(zen::aiTrace, "Setting %d to %f", static_cast<int>(control), static_cast<double>(value));
    if (control >= m_values.size()) return;
    m_values[control] = value;
    for (const Mapping& m : MappingsOf(control)) {
        const float v = m.Apply(value);
        if (std::strcmp(m.target, kEngine) == 0) {
            const int index = EngineIndex(m.parameter);
            if (index >= 0) m_owner.SetEngineParameter(static_cast<std::uint32_t>(index), v);
            continue;
        }
        const std::string slot = FindOrLoad(m.target);
        if (!slot.empty()) Send(slot, m.parameter, v);
    }
}

void AIControlTemplate::RunAction(const std::string& action) {
    qCDebug(zen::aiTrace, "Action: %s", action.c_str());
    if (action == "Apply")
        for (std::size_t c = 0; c < m_values.size(); ++c) SetValue(c, m_values[c]);
}

void AIControlTemplate::SetLevellerParameter(std::uint32_t index, float value) {
    if (index < zen::levelling::kParameterCount) m_owner.ForwardEngineParameter(index, value);
}

std::string AIControlTemplate::FindOrLoad(const char* target) {
    std::string slot;
    if (!m_owner.CallTemplateAction("FindPlugin", {target}, &slot)) {
        qCDebug(zen::aiTrace, "FindPlugin %s refused", target);
        return {};
    }
    if (!slot.empty()) return slot;
    if (!m_owner.CallTemplateAction("LoadPlugin", {target, "after"}, &slot) || slot.empty()) {
        qCDebug(zen::aiTrace, "LoadPlugin %s refused", target);
        return {};
    }
    for (const TargetDefault& d : m_defaults)
        if (std::strcmp(d.target, target) == 0) Send(slot, d.parameter, d.value);
    return slot;
}

void AIControlTemplate::Send(const std::string& slot, const char* parameter, float value) {
    if (!m_owner.CallTemplateAction("SetIntParameter", {slot, parameter, std::to_string(ToInteger(value))}, nullptr))
        qCDebug(zen::aiTrace, "SetIntParameter %s %s refused", slot.c_str(), parameter);
}
