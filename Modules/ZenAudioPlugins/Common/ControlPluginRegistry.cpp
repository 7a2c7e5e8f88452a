#include "ControlPluginRegistry.h"

#include "ZenAssert.h"

namespace zen {

ControlPluginRegistry& ControlPluginRegistry::Instance() {
    static ControlPluginRegistry registry;
    return registry;
}

bool ControlPluginRegistry::Register(const char* name, ControlPluginFactory factory) {
    const QString key = QString::fromUtf8(name);
    if (m_nodes.count(key) != 0) {
        ZEN_ASSERT(false, "0");
        return false;
    }
    m_nodes.emplace(key, Node{key, 1.0, kPluginStateOffered, factory});
    return true;
}

const ControlPluginRegistry::Node* ControlPluginRegistry::Find(const QString& name) const {
    const auto it = m_nodes.find(name);
    return it == m_nodes.end() ? nullptr : &it->second;
}

}  // namespace zen
