#include "Algorithms/BiquadPair.h"

namespace ora::numeric {

void BiquadPair::Process(const BiquadSection* sections, BiquadPairState& state, float* const* lanes,
                         std::size_t laneCount, std::size_t count) const noexcept {
    BiquadLane lane[BiquadPairState::kMaxLanes];
    BiquadLane* pointers[BiquadPairState::kMaxLanes] = {};
    for (std::size_t l = 0; l < laneCount; ++l) {
        for (std::size_t s = 0; s < 2; ++s) {
            lane[l].sections[s] = sections[s];
            lane[l].w1[s] = state.w1[s][l];
            lane[l].w2[s] = state.w2[s][l];
        }
        pointers[l] = &lane[l];
    }
    m_lanes.Process(pointers, lanes, laneCount, count);
    for (std::size_t l = 0; l < laneCount; ++l)
        for (std::size_t s = 0; s < 2; ++s) {
            state.w1[s][l] = lane[l].w1[s];
            state.w2[s][l] = lane[l].w2[s];
        }
}

}  // namespace ora::numeric
