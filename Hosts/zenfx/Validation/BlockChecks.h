// Block lengths from 1 frame to beyond the prepared maximum, and the same
// signal split in different ways.
#pragma once

#include <vector>

#include "ValidationContext.h"

namespace zenfx {

class BlockChecks {
public:
    // Lengths every plug-in must take; the prepared maximum is added.
    static constexpr std::uint32_t kLengths[] = {1, 2, 3, 17, 64, 511, 512, 4096};

    explicit BlockChecks(ValidationContext& context) : m_context(context) {}
    void Run();

private:
    // One split of the test signal through a fresh instance.
    struct Split {
        std::string name;  // "blocks of 17", "random sequence 2"
        Planar output;
    };
    struct RateRun {
        double rate = 0.0;
        bool blockBased = false;
        Planar reference;  // in blocks of the prepared maximum
        std::vector<Split> splits;
    };

    CheckOutcome Lengths();
    CheckOutcome SplitInvariance();
    // Runs every split once, for both checks.
    const std::vector<RateRun>& Measure();
    void MeasureEverySplit();
    std::vector<std::uint32_t> RandomSequence();

    ValidationContext& m_context;
    std::vector<RateRun> m_runs;
    bool m_measured = false;
    std::string m_failure;  // why measuring failed, for the second check
};

}  // namespace zenfx
