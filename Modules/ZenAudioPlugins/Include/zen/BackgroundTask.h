// Reached through PluginInstance::QueryInterface(BackgroundTask::kInterfaceName).
#pragma once

namespace zen {

// Work a plug-in needs done off the audio thread (host actions, feeding an analysis engine). Hosts call
// RunBackgroundTask regularly from one non-audio thread (after every block offline, ~30/s live), never
// concurrently with itself. inputEnded is true on the call after the last block of a finite input.
class BackgroundTask {
public:
    static constexpr const char* kInterfaceName = "zen.BackgroundTask";
    virtual void RunBackgroundTask(bool inputEnded) = 0;

protected:
    ~BackgroundTask() = default;
};

}  // namespace zen
