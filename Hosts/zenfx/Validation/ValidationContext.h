// What the checks of one plug-in's validation share: the plug-in, the
// options, a reproducible random source, the realtime tally and the results.
#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "CheckResult.h"
#include "Commands.h"
#include "PluginLibrary.h"
#include "PluginUnderTest.h"

namespace zenfx {

class ValidationContext {
public:
    using Listener = std::function<void(const CheckResult&)>;

    // The rate most checks run at.
    static constexpr double kSampleRate = 48000.0;
    // The largest block most checks prepare for: not a power of two, and
    // below 4096 so that the base's splitting of long blocks is exercised.
    static constexpr std::uint32_t kMaxBlock = 1500;
    static constexpr std::uint32_t kBlock = 512;
    // Level of the test signals: -6 dBFS.
    static constexpr float kTestLevel = 0.5f;
    // Outputs that should be identical may differ by this much, relative to
    // a full-scale peak: vector and scalar code round differently.
    static constexpr double kMatchTolerance = 1e-5;

    ValidationContext(PluginLibrary& library, PluginEntry plugin, const ValidateOptions& options, Listener listener);
    // A context that runs no check but lists the id of every one asked of it.
    explicit ValidationContext(const ValidateOptions& options);
    const std::vector<std::string>& Listed() const { return m_listed; }

    const PluginEntry& Plugin() const { return m_plugin; }
    int Level() const { return m_options.level; }
    // `perLevel` times the level: how many repetitions a check makes.
    int Scaled(int perLevel) const { return perLevel * m_options.level; }
    std::mt19937& Random() { return m_random; }
    RealtimeTally& Tally() { return m_tally; }

    // Rates the block and signal checks run at: more at higher levels.
    std::vector<double> CheckRates() const;

    // A new instance in its default layout; throws CheckFailure when the
    // library cannot create one.
    std::unique_ptr<PluginUnderTest> NewInstance();
    // A new instance prepared at `sampleRate` for blocks up to `maxBlock`.
    std::unique_ptr<PluginUnderTest> NewPrepared(double sampleRate = kSampleRate, std::uint32_t maxBlock = kMaxBlock);

    // Parameter descriptions, read once from a first instance.
    const std::vector<zen::ParameterInfo>& Parameters() const { return m_parameters; }
    std::vector<float> Defaults() const;
    // A value the parameter can hold exactly: any in range for a continuous
    // one, a whole step for a switch or list.
    float RandomValue(const zen::ParameterInfo& info) { return RandomValue(info, m_random); }
    static float RandomValue(const zen::ParameterInfo& info, std::mt19937& random);
    std::vector<float> RandomSetting();

    // Runs a check unless the options leave it out, and reports its outcome.
    // A CheckFailure, or any exception escaping the plug-in, fails the check.
    void Run(const std::string& id, const std::function<CheckOutcome()>& check);
    bool Wants(const std::string& id) const;

    const std::vector<CheckResult>& Results() const { return m_results; }

private:
    PluginLibrary* m_library = nullptr;  // null when only listing
    PluginEntry m_plugin;
    const ValidateOptions& m_options;
    Listener m_listener;
    std::mt19937 m_random;
    RealtimeTally m_tally;
    std::vector<zen::ParameterInfo> m_parameters;
    std::vector<CheckResult> m_results;
    std::vector<std::string> m_listed;
};

// Fails the running check when `output` (from frame `from` on) holds a NaN,
// an infinity or a peak above the output limit; `what` says which signal.
void RequireSane(const Planar& output, const std::string& what, std::size_t from = 0);

// Fails the running check when `actual` differs from `expected` by more than
// the match tolerance; the reason starts with `what`.
void RequireMatch(const Planar& actual, const Planar& expected, const std::string& what);

// "32 samples" / "1 sample"; Count(3, "block") is "3 blocks".
std::string Samples(std::uint64_t count);
std::string Count(std::uint64_t count, const std::string& noun);
std::string Hertz(double rate);

}  // namespace zenfx
