// The registry of control plug-in classes (kind 2): name -> factory, ordered
// by name. Filled during static initialisation like the audio registry.
#pragma once

#include <QString>
#include <map>

#include "zen/PluginTypes.h"

namespace zen {

using ControlPluginFactory = PluginInstance* (*)(HostServices* hostServices);

class ControlPluginRegistry {
public:
    struct Node {
        QString name;
        double version;
        std::uint32_t state;
        ControlPluginFactory factory;
    };

    static ControlPluginRegistry& Instance();

    // A name already present raises the debug assertion "0" and keeps the
    // first registration. True when entered.
    bool Register(const char* name, ControlPluginFactory factory);

    const Node* Find(const QString& name) const;
    const std::map<QString, Node>& Nodes() const { return m_nodes; }

private:
    ControlPluginRegistry() = default;
    std::map<QString, Node> m_nodes;
};

}  // namespace zen
