// Gated programme loudness over any length: the 400 ms gating blocks above
// the absolute gate (-70 LUFS) set a relative gate 10 LU below their mean
// loudness, and the blocks above both gates make the result. Constant
// memory, exact as LoudnessHistogram says.
#pragma once

#include "LoudnessHistogram.h"

namespace zen {

class IntegratedLoudness {
public:
    static constexpr double kRelativeGate = -10.0;  // LU

    // A gating block's power (weighted mean square over the channels).
    void AddBlock(double power) noexcept { m_blocks.Add(power); }
    void Clear() noexcept { m_blocks.Clear(); }

    // LUFS; -inf while no block lies above the absolute gate.
    double Loudness() const noexcept;
    // The relative gate in LUFS; -inf as above.
    double RelativeGate() const noexcept;
    std::uint64_t BlocksAboveAbsoluteGate() const { return m_blocks.Count(); }

private:
    LoudnessHistogram m_blocks;
};

}  // namespace zen
