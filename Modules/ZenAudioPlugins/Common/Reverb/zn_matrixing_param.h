// Settings of a gain matrix between two sets of channels or lanes.
#pragma once

#include <boost/numeric/ublas/matrix.hpp>
#include <cstdint>

namespace zen::reverb {

namespace ublas = boost::numeric::ublas;

struct zn_matrixing_param {
    explicit zn_matrixing_param(std::uint32_t inputCount = 1, std::uint32_t outputCount = 1)
        : inputs(inputCount), outputs(outputCount), gains(outputCount, inputCount, 0.0f) {}

    std::uint32_t inputs;
    std::uint32_t outputs;
    ublas::matrix<float> gains;  // outputs x inputs
};

}  // namespace zen::reverb
