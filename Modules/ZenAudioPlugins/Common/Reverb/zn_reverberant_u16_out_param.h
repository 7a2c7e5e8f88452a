// Settings of the network's output stage: the gain matrix from the 16 lanes
// to the output channels and each channel's tone-correction coefficient.
#pragma once

#include <boost/numeric/ublas/matrix.hpp>
#include <boost/numeric/ublas/vector.hpp>
#include <cstdint>

namespace zen::reverb {

namespace ublas = boost::numeric::ublas;

struct zn_reverberant_u16_out_param {
    static constexpr std::uint32_t kLanes = 16;

    explicit zn_reverberant_u16_out_param(std::uint32_t channelCount = 1)
        : channels(channelCount), gains(channelCount, kLanes, 0.0f), tone(channelCount, 0.0f) {}

    std::uint32_t channels;
    ublas::matrix<float> gains;  // channels x 16
    ublas::vector<float> tone;   // t in [0, 1]: 0 leaves the channel as it is
};

}  // namespace zen::reverb
