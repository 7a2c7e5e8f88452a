// The registry of audio plug-in classes (kind 0): key "%1:%2" (display name
// and decimal code) -> descriptor copy and factory, ordered by key. Filled
// during the library's static initialisation, read without locks afterwards.
#pragma once

#include <QString>
#include <map>

#include "zen/PluginTypes.h"

namespace zen {

class AudioPluginRegistry {
public:
    struct Node {
        QString key;
        PluginDescriptor descriptor;  // the registry's copy; factories keep pointers to it
        AudioPluginFactory factory;
    };

    static AudioPluginRegistry& Instance();

    static QString MakeKey(const char* name, PluginCode code);

    // Withheld descriptors (state 2) are skipped. A key already present raises
    // the debug assertion "0" and keeps the first registration. True when the
    // descriptor was entered.
    bool Register(const PluginDescriptor& descriptor, AudioPluginFactory factory);

    const Node* Find(const QString& key) const;
    const std::map<QString, Node>& Nodes() const { return m_nodes; }

private:
    AudioPluginRegistry() = default;
    std::map<QString, Node> m_nodes;
};

}  // namespace zen
