#include "ZenControlPluginImpl.h"

#include <cmath>
#include <cstring>

#include "Editor/InstanceEditorLink.h"
#include "Editor/ZenEditor.h"
#include "StateText.h"

void ZenControlPluginImpl::AttachToHost(const char* registryName, const char* className, zen::HostServices* hostServices) {
    m_name = registryName;
    m_className = className;
    m_host = zen::HostServicesClient(hostServices);
}

void* ZenControlPluginImpl::QueryInterface(const char* interfaceName) {
    if (interfaceName == nullptr) return nullptr;
    if (std::strcmp(interfaceName, zen::PluginInstance::kInterfaceName) == 0) return static_cast<zen::PluginInstance*>(this);
    if (std::strcmp(interfaceName, ControlPlugin::kInterfaceName) == 0) return static_cast<ControlPlugin*>(this);
    if (std::strcmp(interfaceName, ZenControlValueHost::kInterfaceName) == 0)
        return static_cast<ZenControlValueHost*>(this);
    return QObject::qt_metacast(interfaceName);
}

bool ZenControlPluginImpl::GetParameterInfo(std::uint32_t index, zen::ParameterInfo& info) const {
    if (!m_parameters.Contains(index)) return false;
    info = m_parameters[index].Definition().ToInfo();
    return true;
}

bool ZenControlPluginImpl::SetParameter(std::uint32_t index, float value) {
    if (!m_parameters.Contains(index) || std::isnan(value)) return false;
    return OnParameterChanged(index, m_parameters[index].Definition().Constrain(value));
}

float ZenControlPluginImpl::GetParameter(std::uint32_t index) const {
    return m_parameters.Contains(index) ? m_parameters[index].GetValue() : 0.0f;
}

bool ZenControlPluginImpl::OnParameterChanged(std::uint32_t index, float value) {
    if (!m_parameters.Contains(index)) return false;
    m_parameters.Store(index, value);
    return true;
}

std::string ZenControlPluginImpl::SaveState() const { return zen::StateText::Save(m_className, m_parameters); }

bool ZenControlPluginImpl::LoadState(const std::string& state) {
    zen::StateText::Contents contents;
    if (!zen::StateText::Parse(state, m_className, m_parameters, contents)) return false;
    for (const auto& [index, value] : contents.values) SetParameter(index, value);
    m_parameters.MarkLoaded();
    return true;
}

std::vector<std::string> ZenControlPluginImpl::GetPresetNames() const { return zen::StateText::PresetNames(m_className); }

bool ZenControlPluginImpl::LoadPreset(const std::string& name) {
    std::string text;
    return zen::StateText::ReadPreset(m_className, name, text) && LoadState(text);
}

void* ZenControlPluginImpl::CreateEditor(void* parentWidget) {
    return static_cast<QWidget*>(ZenEditor::Create(m_className, QString::fromUtf8(m_name), std::make_unique<InstanceEditorLink>(*this),
                             static_cast<QWidget*>(parentWidget)));
}

void* ZenControlPluginImpl::CreateEditorFor(zen::EditorLink& link, void* parentWidget) {
    return static_cast<QWidget*>(ZenEditor::Create(m_className, QString::fromUtf8(m_name), link, static_cast<QWidget*>(parentWidget)));
}

std::int32_t ZenControlPluginImpl::FindParameter(const char* identifierOrLabel) const {
    return identifierOrLabel != nullptr ? m_parameters.Find(QString::fromUtf8(identifierOrLabel)) : -1;
}

float ZenControlPluginImpl::GetParameterPosition(std::uint32_t index) const {
    return m_parameters.Contains(index) ? m_parameters[index].GetPosition() : 0.0f;
}

bool ZenControlPluginImpl::SetParameterPosition(std::uint32_t index, float position) {
    if (!m_parameters.Contains(index) || std::isnan(position)) return false;
    return SetParameter(index, m_parameters[index].PositionToValue(position));
}

