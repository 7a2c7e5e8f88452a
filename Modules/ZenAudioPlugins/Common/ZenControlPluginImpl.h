// Common base of control plug-ins: panels that edit settings of the host's
// console. Same shape as the audio base, without audio: parameters with
// tapers, state text, presets and the editor. The class actually
// instantiated is ZenControlPlugin<Settings>.
#pragma once

#include <QObject>
#include <QString>

#include "HostServicesClient.h"
#include "ParameterTable.h"
#include "zen/ControlPlugin.h"
#include "zen/PluginInstance.h"
#include "zen/ZenControlValueHost.h"

class ZenControlPluginImpl : public QObject, public zen::PluginInstance, public ControlPlugin, public ZenControlValueHost {
    Q_OBJECT

public:
    // Called once by the factory.
    void AttachToHost(const char* registryName, const char* className, zen::HostServices* hostServices);
    zen::HostServices* GetHostServices() const { return m_host.Services(); }

    // Runs a host action; false when the host offers no actions or refuses
    // this one. UI thread; allocates.
    bool CallHostAction(const char* action, const std::vector<std::string>& arguments = {},
                        std::string* result = nullptr) const {
        return m_host.CallAction(action, arguments, result);
    }

    const zen::ParameterTable& Parameters() const { return m_parameters; }

    // zen::PluginInstance
    int GetKind() const override { return zen::kControlPluginKind; }
    const zen::PluginDescriptor* GetDescriptor() const override { return nullptr; }
    const char* GetName() const override { return m_name; }
    void* QueryInterface(const char* interfaceName) override;

    // zen::PluginParameters
    std::uint32_t GetParameterCount() const override { return m_parameters.GetCount(); }
    bool GetParameterInfo(std::uint32_t index, zen::ParameterInfo& info) const override;
    bool SetParameter(std::uint32_t index, float value) override;
    float GetParameter(std::uint32_t index) const override;
    std::string SaveState() const override;
    bool LoadState(const std::string& state) override;
    std::vector<std::string> GetPresetNames() const override;
    bool LoadPreset(const std::string& name) override;
    void* CreateEditor(void* parentWidget) override;
    void* CreateEditorFor(zen::EditorLink& link, void* parentWidget) override;

    // ZenControlValueHost
    std::int32_t FindParameter(const char* identifierOrLabel) const override;
    float GetParameterPosition(std::uint32_t index) const override;
    bool SetParameterPosition(std::uint32_t index, float position) override;

protected:
    ZenControlPluginImpl() = default;

    void InitParameters(const zen::ParameterTableDefinition& definitions) { m_parameters.Build(definitions); }

    // False for an index out of range; else stores the value. Overrides call
    // this first, then apply the setting to the console.
    virtual bool OnParameterChanged(std::uint32_t index, float value);

private:
    const char* m_name = "";
    const char* m_className = "";
    zen::HostServicesClient m_host;
    zen::ParameterTable m_parameters;
};

