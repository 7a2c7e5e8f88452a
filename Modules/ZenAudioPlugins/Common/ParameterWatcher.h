// Lets an editor follow a plug-in's parameters. SetParameter may run on any
// thread, even the audio thread, and must never allocate or block, so it only
// counts changes (ParameterTable); this object lives in the editor's thread,
// compares the counts about 30 times a second and emits Qt signals there.
// Any number of watchers may follow one instance; each keeps its own counts.
// A watcher must not outlive the table it watches.
#pragma once

#include <QObject>
#include <QTimer>
#include <cstdint>
#include <vector>

#include "ParameterTable.h"

namespace zen {

class ParameterWatcher : public QObject {
    Q_OBJECT

public:
    static constexpr int kPollIntervalMs = 33;

    // Starts polling at once; changes made before construction are not reported.
    explicit ParameterWatcher(const ParameterTable& parameters, QObject* parent = nullptr);

    // Emits what changed since the last poll: ParameterChanged for each
    // changed parameter in index order, then StateLoaded if a state or preset
    // was loaded meanwhile.
    void Poll();

signals:
    void ParameterChanged(int index, float value);
    void StateLoaded();

private:
    const ParameterTable& m_parameters;
    QTimer m_timer;
    std::uint64_t m_seenChanges;
    std::uint64_t m_seenLoads;
    std::vector<std::uint32_t> m_seen;  // per parameter
};

}  // namespace zen
