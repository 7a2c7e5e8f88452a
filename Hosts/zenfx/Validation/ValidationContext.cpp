#include "ValidationContext.h"

#include <algorithm>
#include <cmath>

namespace zenfx {

namespace {

// FNV-1a, so that a plug-in's random choices depend on the seed and its key
// only, not on which other plug-ins ran before it.
std::uint32_t HashKey(const std::string& key) {
    std::uint32_t hash = 2166136261u;
    for (unsigned char c : key) hash = (hash ^ c) * 16777619u;
    return hash;
}

}  // namespace

ValidationContext::ValidationContext(PluginLibrary& library, PluginEntry plugin, const ValidateOptions& options,
                                     Listener listener)
    : m_library(&library),
      m_plugin(std::move(plugin)),
      m_options(options),
      m_listener(std::move(listener)),
      m_random(options.seed ^ HashKey(m_plugin.key)) {
    auto first = NewInstance();
    for (std::uint32_t i = 0; i < first->Audio().GetParameterCount(); ++i) {
        zen::ParameterInfo info;
        first->Audio().GetParameterInfo(i, info);
        m_parameters.push_back(info);
    }
}

ValidationContext::ValidationContext(const ValidateOptions& options) : m_options(options) {}

std::vector<double> ValidationContext::CheckRates() const {
    if (Level() <= 2) return {kSampleRate};
    if (Level() == 3) return {kSampleRate, 96000.0};
    return {44100.0, kSampleRate, 96000.0, 192000.0};
}

std::unique_ptr<PluginUnderTest> ValidationContext::NewInstance() {
    if (m_library == nullptr) throw CheckFailure("a listing context runs no check");
    zen::PluginInstance* instance = m_library->Interface().CreatePlugin(m_plugin.kind, m_plugin.key);
    if (instance == nullptr) throw CheckFailure("the library could not create an instance");
    return std::make_unique<PluginUnderTest>(std::unique_ptr<zen::PluginInstance>(instance), m_tally);
}

std::unique_ptr<PluginUnderTest> ValidationContext::NewPrepared(double sampleRate, std::uint32_t maxBlock) {
    auto plugin = NewInstance();
    Require(plugin->Prepare(sampleRate, maxBlock), "Prepare(" + std::to_string(static_cast<int>(sampleRate)) + ", " +
                                                      std::to_string(maxBlock) + ") was refused");
    return plugin;
}

std::vector<float> ValidationContext::Defaults() const {
    std::vector<float> values;
    for (const auto& info : m_parameters) values.push_back(info.defaultValue);
    return values;
}

float ValidationContext::RandomValue(const zen::ParameterInfo& info, std::mt19937& random) {
    if (info.kind == zen::ParameterKind::Continuous) {
        std::uniform_real_distribution<float> uniform(info.minimum, info.maximum);
        return std::min(uniform(random), info.maximum);
    }
    const float stride = info.step > 0.0f ? info.step : 1.0f;
    const auto steps = static_cast<int>(std::lround((info.maximum - info.minimum) / stride));
    std::uniform_int_distribution<int> pick(0, std::max(steps, 0));
    return std::min(info.minimum + static_cast<float>(pick(random)) * stride, info.maximum);
}

std::vector<float> ValidationContext::RandomSetting() {
    std::vector<float> values;
    for (const auto& info : m_parameters) values.push_back(RandomValue(info, m_random));
    return values;
}

bool ValidationContext::Wants(const std::string& id) const {
    if (m_options.checks.empty()) return true;
    for (const std::string& prefix : m_options.checks)
        if (id.compare(0, prefix.size(), prefix) == 0) return true;
    return false;
}

void ValidationContext::Run(const std::string& id, const std::function<CheckOutcome()>& check) {
    if (!Wants(id)) return;
    if (m_library == nullptr) {
        m_listed.push_back(id);
        return;
    }
    m_tally.check = id;
    CheckOutcome outcome;
    try {
        outcome = check();
    } catch (const CheckFailure& failure) {
        outcome = Fail(failure.what());
    } catch (const std::exception& error) {
        outcome = Fail(std::string("an exception escaped: ") + error.what());
    } catch (...) {
        outcome = Fail("an exception escaped");
    }
    m_results.push_back({id, outcome});
    if (m_listener) m_listener(m_results.back());
}

void RequireSane(const Planar& output, const std::string& what, std::size_t from) {
    const std::string fault = signals::DescribeFault(signals::Inspect(output, from));
    if (!fault.empty()) throw CheckFailure(what + ": " + fault);
}

void RequireMatch(const Planar& actual, const Planar& expected, const std::string& what) {
    std::size_t frame = 0;
    const double difference = signals::MaxDifference(actual, expected, &frame);
    const double tolerance =
        ValidationContext::kMatchTolerance * std::max(1.0f, signals::Inspect(expected).peak);
    if (difference > tolerance)
        throw CheckFailure(what + " by " + std::to_string(difference) + " at frame " + std::to_string(frame));
}

std::string Count(std::uint64_t count, const std::string& noun) {
    if (count == 1) return "1 " + noun;
    const bool sibilant = !noun.empty() && (noun.back() == 's' || noun.back() == 'h' || noun.back() == 'x');
    return std::to_string(count) + " " + noun + (sibilant ? "es" : "s");
}

std::string Samples(std::uint64_t count) { return Count(count, "sample"); }

std::string Hertz(double rate) { return std::to_string(static_cast<long>(std::lround(rate))) + " Hz"; }

}  // namespace zenfx
