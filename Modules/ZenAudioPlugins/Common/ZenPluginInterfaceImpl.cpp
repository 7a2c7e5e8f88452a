#include "ZenPluginInterfaceImpl.h"

#include <algorithm>
#include <mutex>

#include "AudioPluginRegistry.h"
#include "ControlPluginRegistry.h"
#include "ZenResourceTrees.h"

// The resource compiler's registration functions of every embedded tree.
#define ZEN_DECLARE_RESOURCE_TREE(tree) \
    int qInitResources_##tree();        \
    int qCleanupResources_##tree();
ZEN_RESOURCE_TREES(ZEN_DECLARE_RESOURCE_TREE)
#undef ZEN_DECLARE_RESOURCE_TREE

namespace {

// Registered at the first GetZenPluginInterface call, unregistered at unload.
struct ResourceTrees {
    ResourceTrees() {
#define ZEN_REGISTER_RESOURCE_TREE(tree) qInitResources_##tree();
        ZEN_RESOURCE_TREES(ZEN_REGISTER_RESOURCE_TREE)
#undef ZEN_REGISTER_RESOURCE_TREE
    }
    ~ResourceTrees() {
#define ZEN_UNREGISTER_RESOURCE_TREE(tree) qCleanupResources_##tree();
        ZEN_RESOURCE_TREES(ZEN_UNREGISTER_RESOURCE_TREE)
#undef ZEN_UNREGISTER_RESOURCE_TREE
    }
};

}  // namespace

std::map<std::string, zen::PluginListEntry> ZenPluginInterfaceImpl::GetPluginList(int kind) const {
    std::map<std::string, zen::PluginListEntry> list;
    if (kind == zen::kAudioPluginKind) {
        for (const auto& [key, node] : zen::AudioPluginRegistry::Instance().Nodes()) {
            zen::PluginListEntry entry;
            entry.name = node.descriptor.name;
            entry.channelCount = std::max(node.descriptor.inputChannelLimit, node.descriptor.outputChannelLimit);
            entry.listFlags = node.descriptor.listFlags;
            list.emplace(key.toStdString(), entry);
        }
    } else if (kind == zen::kControlPluginKind) {
        for (const auto& [name, node] : zen::ControlPluginRegistry::Instance().Nodes()) {
            zen::PluginListEntry entry;
            entry.name = name.toStdString();
            list.emplace(name.toStdString(), entry);
        }
    }
    return list;
}

zen::PluginInstance* ZenPluginInterfaceImpl::CreatePlugin(int kind, const std::string& key) {
    const QString qkey = QString::fromStdString(key);
    if (kind == zen::kAudioPluginKind) {
        const zen::AudioPluginRegistry::Node* node = zen::AudioPluginRegistry::Instance().Find(qkey);
        return node != nullptr ? node->factory(m_hostContext, m_hostServices, &node->descriptor) : nullptr;
    }
    if (kind == zen::kControlPluginKind) {
        const zen::ControlPluginRegistry::Node* node = zen::ControlPluginRegistry::Instance().Find(qkey);
        return node != nullptr ? node->factory(m_hostServices) : nullptr;
    }
    return nullptr;
}

extern "C" zen::PluginInterface* GetZenPluginInterface() {
    static ZenPluginInterfaceImpl entry;
    static ResourceTrees resourceTrees;  // thread-safe once, destroyed at unload
    return &entry;
}
