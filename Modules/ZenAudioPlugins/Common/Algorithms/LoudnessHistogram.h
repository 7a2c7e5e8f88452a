// Loudness values of measurement blocks (gating blocks, short-term windows)
// kept in constant memory, for gates and percentiles over any length of
// programme.
//
// A block enters by its power (the weighted mean square of its channels,
// the quantity loudness is the logarithm of); blocks at or below the
// absolute gate of -70 LUFS are not kept. Bins are 0.005 LU wide from -70 to
// +30 LUFS (louder blocks share one last bin), and every bin holds the count
// and the exact sum of its blocks' powers. So:
//
// - A mean above a gate is exact but for the one bin the gate falls into:
//   its blocks lie within 0.005 LU of the gate and go in or out together,
//   by their own mean. Anything else would need every block kept. Moving
//   such blocks across the gate changes the result by less than 4 LU times
//   their share of the blocks above it; for the result to move by 0.01 LU,
//   more than 1 block in 400 would have to sit inside those 0.005 LU.
// - A percentile is the mean loudness of its bin, within 0.005 LU of the
//   block's own, so a range built from two is within 0.01 LU.
//
// Bins are grouped by 1 LU with their sums, so a query walks about 300
// entries rather than 20000. Nothing allocates after construction.
#pragma once

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <vector>

namespace zen {

class LoudnessHistogram {
public:
    static constexpr double kOffset = -0.691;        // LUFS of a unit power
    static constexpr double kAbsoluteGate = -70.0;  // LUFS
    static constexpr double kTop = 30.0;            // LUFS; louder blocks share the last bin
    static constexpr double kBinWidth = 0.005;      // LU
    static constexpr std::size_t kBinsPerGroup = 200;

    static double Lufs(double power) { return kOffset + 10.0 * std::log10(power); }
    static double Power(double lufs) { return std::pow(10.0, (lufs - kOffset) / 10.0); }

    LoudnessHistogram();

    // Keeps a block's power when it lies above the absolute gate (NaN never does).
    void Add(double power) noexcept;
    void Clear() noexcept;

    // Blocks above the absolute gate.
    std::uint64_t Count() const { return m_count; }
    // The blocks louder than `gate` (LUFS): how many, and their mean power
    // (0 when none).
    struct Selection {
        std::uint64_t count = 0;
        double meanPower = 0.0;
    };
    Selection Above(double gate) const noexcept;
    // The loudness (LUFS) of the block of `rank` (0: the quietest) among
    // those louder than `gate`; -inf when there are not that many.
    double LoudnessAtRank(double gate, std::uint64_t rank) const noexcept;

private:
    struct Bin {
        std::uint64_t count = 0;
        double power = 0.0;
    };
    static constexpr std::size_t kBins = static_cast<std::size_t>((kTop - kAbsoluteGate) / kBinWidth + 0.5) + 1;
    static constexpr std::size_t kGroups = (kBins + kBinsPerGroup - 1) / kBinsPerGroup;

    // The bin of a loudness; -1 below the first.
    static std::ptrdiff_t BinOf(double lufs);
    // Whether the straddled bin `gateBin` counts as above `gate`.
    bool Straddler(std::ptrdiff_t gateBin, double gate) const;

    std::vector<Bin> m_bins;
    std::vector<Bin> m_groups;
    std::uint64_t m_count = 0;
    double m_gatePower;
};

}  // namespace zen
