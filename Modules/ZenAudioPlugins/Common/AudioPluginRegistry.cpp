#include "AudioPluginRegistry.h"

#include "ZenAssert.h"

namespace zen {

AudioPluginRegistry& AudioPluginRegistry::Instance() {
    static AudioPluginRegistry registry;
    return registry;
}

QString AudioPluginRegistry::MakeKey(const char* name, PluginCode code) {
    return QStringLiteral("%1:%2").arg(QString::fromUtf8(name)).arg(code);
}

bool AudioPluginRegistry::Register(const PluginDescriptor& descriptor, AudioPluginFactory factory) {
    if (descriptor.state == kPluginStateWithheld) return false;
    const QString key = MakeKey(descriptor.name, descriptor.code);
    if (m_nodes.count(key) != 0) {
        ZEN_ASSERT(false, "0");
        return false;
    }
    Node node{key, descriptor, factory};
    node.descriptor.factory = factory;
    m_nodes.emplace(key, node);
    return true;
}

const AudioPluginRegistry::Node* AudioPluginRegistry::Find(const QString& key) const {
    const auto it = m_nodes.find(key);
    return it == m_nodes.end() ? nullptr : &it->second;
}

}  // namespace zen
