// The library's one interface object, returned by GetZenPluginInterface.
#pragma once

#include "zen/PluginInterface.h"

class ZenPluginInterfaceImpl final : public zen::PluginInterface {
public:
    static constexpr int kInterfaceVersion = 100;

    int GetInterfaceVersion() const override { return kInterfaceVersion; }
    std::map<std::string, zen::PluginListEntry> GetPluginList(int kind) const override;
    zen::PluginInstance* CreatePlugin(int kind, const std::string& key) override;
    void SetHostContext(void* context) override { m_hostContext = context; }
    void SetHostServices(zen::HostServices* services) override { m_hostServices = services; }

private:
    void* m_hostContext = nullptr;
    zen::HostServices* m_hostServices = nullptr;
};

