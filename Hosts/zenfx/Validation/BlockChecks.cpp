#include "BlockChecks.h"

#include <algorithm>

namespace zenfx {

namespace {

// Long enough for several blocks of the longest length.
constexpr std::size_t kFrames = 3 * 4096 + 1000;
constexpr std::size_t kRandomSequenceLength = 64;

CheckOutcome SplitInvarianceOutcome(std::size_t compared, const std::string& blockBasedRates) {
    if (compared == 0) return Skip("block-based by design at " + blockBasedRates);
    return Pass("every split gives the output of one block of 1500 (" + std::to_string(compared) + " splits)" +
                (blockBasedRates.empty() ? "" : "; block-based by design at " + blockBasedRates + ", not compared"));
}

}  // namespace

void BlockChecks::Run() {
    m_context.Run("blocks.lengths", [this] { return Lengths(); });
    m_context.Run("blocks.split-invariance", [this] { return SplitInvariance(); });
}

std::vector<std::uint32_t> BlockChecks::RandomSequence() {
    std::vector<std::uint32_t> lengths;
    std::uniform_int_distribution<std::uint32_t> any(1, 4096);
    std::uniform_int_distribution<std::size_t> pick(0, std::size(kLengths));
    std::bernoulli_distribution listed(0.5);
    for (std::size_t i = 0; i < kRandomSequenceLength; ++i) {
        if (listed(m_context.Random())) {
            const std::size_t k = pick(m_context.Random());
            lengths.push_back(k < std::size(kLengths) ? kLengths[k] : ValidationContext::kMaxBlock);
        } else {
            lengths.push_back(any(m_context.Random()));
        }
    }
    return lengths;
}

const std::vector<BlockChecks::RateRun>& BlockChecks::Measure() {
    if (m_measured) {
        if (!m_failure.empty()) throw CheckFailure(m_failure);
        return m_runs;
    }
    m_measured = true;
    try {
        MeasureEverySplit();
    } catch (const CheckFailure& failure) {
        m_failure = failure.what();
        throw;
    }
    return m_runs;
}

void BlockChecks::MeasureEverySplit() {
    // Settings are made before the first block, so no smoothing ramp runs
    // and every split must give the same samples.
    std::vector<std::vector<float>> settings = {m_context.Defaults()};
    for (int i = 1; i < m_context.Level(); ++i) settings.push_back(m_context.RandomSetting());

    for (double rate : m_context.CheckRates()) {
        for (const auto& setting : settings) {
            auto prepared = [&] {
                auto plugin = m_context.NewInstance();
                Require(plugin->SetAll(setting), "a parameter value was refused");
                Require(plugin->Prepare(rate, ValidationContext::kMaxBlock), "Prepare at " + Hertz(rate) + " was refused");
                return plugin;
            };
            auto first = prepared();
            RateRun run;
            run.rate = rate;
            run.blockBased = first->Audio().IsBlockBased();
            const Planar input = signals::Noise(first->Width(), kFrames, ValidationContext::kTestLevel, m_context.Random());
            run.reference = first->Run(input, ValidationContext::kMaxBlock);

            std::vector<std::pair<std::string, std::vector<std::uint32_t>>> splits;
            for (std::uint32_t length : kLengths) splits.push_back({"blocks of " + std::to_string(length), {length}});
            for (int i = 0; i < m_context.Level(); ++i)
                splits.push_back({"random sequence " + std::to_string(i + 1), RandomSequence()});
            for (auto& [name, lengths] : splits) {
                auto plugin = prepared();
                Planar io = signals::Silence(plugin->Width(), kFrames);
                for (std::uint32_t c = 0; c < std::min<std::size_t>(plugin->Audio().GetInputChannelCount(), io.size()); ++c)
                    io[c] = input[c];
                Require(plugin->Process(io, lengths), "Process refused " + name + " at " + Hertz(rate));
                run.splits.push_back({name, std::move(io)});
            }
            m_runs.push_back(std::move(run));
        }
    }
}

CheckOutcome BlockChecks::Lengths() {
    const auto& runs = Measure();
    std::string rates;
    for (const RateRun& run : runs) {
        RequireSane(run.reference, "blocks of " + std::to_string(ValidationContext::kMaxBlock) + " at " + Hertz(run.rate));
        for (const Split& split : run.splits) RequireSane(split.output, split.name + " at " + Hertz(run.rate));
        if (rates.find(Hertz(run.rate)) == std::string::npos) rates += (rates.empty() ? "" : ", ") + Hertz(run.rate);
    }
    return Pass("blocks of 1, 2, 3, 17, 64, 511, 512, 4096, the prepared 1500 and random sequences at " + rates +
                ": output finite and bounded");
}

CheckOutcome BlockChecks::SplitInvariance() {
    std::size_t compared = 0;
    std::string blockBased;
    for (const RateRun& run : Measure()) {
        if (run.blockBased) {
            if (blockBased.find(Hertz(run.rate)) == std::string::npos)
                blockBased += (blockBased.empty() ? "" : ", ") + Hertz(run.rate);
            continue;
        }
        for (const Split& split : run.splits) {
            RequireMatch(split.output, run.reference,
                         split.name + " at " + Hertz(run.rate) + " differ from one block of 1500, and the plug-in " +
                             "does not declare itself block-based,");
            ++compared;
        }
    }
    return SplitInvarianceOutcome(compared, blockBased);
}

}  // namespace zenfx
