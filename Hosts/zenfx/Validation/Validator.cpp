#include "Validator.h"

#include "BlockChecks.h"
#include "LatencyChecks.h"
#include "LifecycleChecks.h"
#include "ParameterChecks.h"
#include "RealtimeChecks.h"
#include "SignalChecks.h"
#include "ThreadChecks.h"

namespace zenfx {

std::vector<CheckResult> Validator::Validate(const PluginEntry& plugin, const ValidationContext::Listener& listener) {
    std::unique_ptr<ValidationContext> context;
    try {
        context = std::make_unique<ValidationContext>(m_library, plugin, m_options, listener);
    } catch (const std::exception& error) {
        CheckResult failed{"lifecycle.create", Fail(error.what())};
        if (listener) listener(failed);
        return {failed};
    }
    LifecycleChecks(*context).Run();
    ParameterChecks(*context).Run();
    BlockChecks(*context).Run();
    SignalChecks(*context).Run();
    LatencyChecks(*context).Run();
    ThreadChecks(*context).Run();
    RealtimeChecks(*context).Run();
    return context->Results();
}

}  // namespace zenfx
