#include "LoudnessHistogram.h"

#include <algorithm>
#include <limits>

namespace zen {

LoudnessHistogram::LoudnessHistogram() : m_bins(kBins), m_groups(kGroups), m_gatePower(Power(kAbsoluteGate)) {}

std::ptrdiff_t LoudnessHistogram::BinOf(double lufs) {
    if (!(lufs >= kAbsoluteGate)) return -1;
    const double position = std::floor((lufs - kAbsoluteGate) / kBinWidth);
    return static_cast<std::ptrdiff_t>(std::min(position, static_cast<double>(kBins - 1)));
}

void LoudnessHistogram::Add(double power) noexcept {
    if (!(power > m_gatePower)) return;
    const std::ptrdiff_t bin = std::max<std::ptrdiff_t>(0, BinOf(Lufs(power)));
    const auto index = static_cast<std::size_t>(bin);
    ++m_bins[index].count;
    m_bins[index].power += power;
    ++m_groups[index / kBinsPerGroup].count;
    m_groups[index / kBinsPerGroup].power += power;
    ++m_count;
}

void LoudnessHistogram::Clear() noexcept {
    std::fill(m_bins.begin(), m_bins.end(), Bin{});
    std::fill(m_groups.begin(), m_groups.end(), Bin{});
    m_count = 0;
}

bool LoudnessHistogram::Straddler(std::ptrdiff_t gateBin, double gate) const {
    const Bin& bin = m_bins[static_cast<std::size_t>(gateBin)];
    return bin.count > 0 && Lufs(bin.power / static_cast<double>(bin.count)) > gate;
}

LoudnessHistogram::Selection LoudnessHistogram::Above(double gate) const noexcept {
    const std::ptrdiff_t gateBin = BinOf(gate);
    std::uint64_t count = 0;
    double power = 0.0;
    auto take = [&](const Bin& b) {
        count += b.count;
        power += b.power;
    };
    std::size_t firstGroup = 0;
    if (gateBin >= 0) {
        const auto g = static_cast<std::size_t>(gateBin);
        if (Straddler(gateBin, gate)) take(m_bins[g]);
        const std::size_t groupEnd = std::min(kBins, (g / kBinsPerGroup + 1) * kBinsPerGroup);
        for (std::size_t i = g + 1; i < groupEnd; ++i) take(m_bins[i]);
        firstGroup = g / kBinsPerGroup + 1;
    }
    for (std::size_t k = firstGroup; k < kGroups; ++k) take(m_groups[k]);
    return {count, count > 0 ? power / static_cast<double>(count) : 0.0};
}

double LoudnessHistogram::LoudnessAtRank(double gate, std::uint64_t rank) const noexcept {
    const std::ptrdiff_t gateBin = BinOf(gate);
    std::size_t first = 0;  // first bin wholly above the gate
    if (gateBin >= 0) {
        const auto g = static_cast<std::size_t>(gateBin);
        first = g + 1;
        if (Straddler(gateBin, gate)) {
            if (rank < m_bins[g].count) return Lufs(m_bins[g].power / static_cast<double>(m_bins[g].count));
            rank -= m_bins[g].count;
        }
    }
    std::size_t i = first;
    while (i < kBins) {
        // Whole groups are skipped by their counts.
        if (i % kBinsPerGroup == 0 && rank >= m_groups[i / kBinsPerGroup].count) {
            rank -= m_groups[i / kBinsPerGroup].count;
            i += kBinsPerGroup;
            continue;
        }
        const Bin& bin = m_bins[i];
        if (rank < bin.count) return Lufs(bin.power / static_cast<double>(bin.count));
        rank -= bin.count;
        ++i;
    }
    return -std::numeric_limits<double>::infinity();
}

}  // namespace zen
