#include "Validator.h"

#include "BlockChecks.h"
#include "LatencyChecks.h"
#include "LifecycleChecks.h"
#include "ParameterChecks.h"
#include "RealtimeChecks.h"
#include "SignalChecks.h"
#include "ThreadChecks.h"

namespace zenfx {

namespace {
constexpr const char* kCreateCheck = "lifecycle.create";  // reported only when no instance can be made
}

void Validator::RunGroups(ValidationContext& context) {
    LifecycleChecks(context).Run();
    ParameterChecks(context).Run();
    BlockChecks(context).Run();
    SignalChecks(context).Run();
    LatencyChecks(context).Run();
    ThreadChecks(context).Run();
    RealtimeChecks(context).Run();
}

std::vector<std::string> Validator::CheckIds() {
    const ValidateOptions every;
    ValidationContext listing(every);
    RunGroups(listing);
    std::vector<std::string> ids = {kCreateCheck};
    ids.insert(ids.end(), listing.Listed().begin(), listing.Listed().end());
    return ids;
}

std::vector<CheckResult> Validator::Validate(const PluginEntry& plugin, const ValidationContext::Listener& listener) {
    std::unique_ptr<ValidationContext> context;
    try {
        context = std::make_unique<ValidationContext>(m_library, plugin, m_options, listener);
    } catch (const std::exception& error) {
        CheckResult failed{kCreateCheck, Fail(error.what())};
        if (listener) listener(failed);
        return {failed};
    }
    RunGroups(*context);
    return context->Results();
}

}  // namespace zenfx
