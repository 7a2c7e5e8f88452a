// Settings of the early-reflection tap network: the number of input channels,
// one delay per tap (samples) and the weights with which each tap sums the
// input channels (taps x inputs).
#pragma once

#include <boost/numeric/ublas/matrix.hpp>
#include <boost/numeric/ublas/vector.hpp>
#include <cstdint>

namespace zen::reverb {

namespace ublas = boost::numeric::ublas;

struct zn_reflections_param {
    static constexpr std::uint32_t kTaps = 16;

    // Every tap one sample late, tap k listening to input k mod inputs.
    explicit zn_reflections_param(std::uint32_t inputCount = 1)
        : inputs(inputCount), delays(kTaps, 1u), weights(kTaps, inputCount, 0.0f) {
        for (std::uint32_t k = 0; k < kTaps; ++k) weights(k, k % inputCount) = 1.0f;
    }

    std::uint32_t inputs;
    ublas::vector<std::uint32_t> delays;  // samples, one per tap
    ublas::matrix<float> weights;         // row k: the input weights of tap k
};

}  // namespace zen::reverb
