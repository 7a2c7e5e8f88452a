// Settings of the 15-line feedback network: per lane its length (samples),
// gain per pass and damping coefficient. Lane 15 rides along.
#pragma once

#include <boost/numeric/ublas/vector.hpp>
#include <cstdint>

namespace zen::reverb {

namespace ublas = boost::numeric::ublas;

struct zn_reverberant_u15_core_param {
    static constexpr std::uint32_t kLanes = 16;
    static constexpr std::uint32_t kLines = 15;

    zn_reverberant_u15_core_param() : lengths(kLanes, 1u), gains(kLanes, 0.0f), coefficients(kLanes, 0.0f) {}

    ublas::vector<std::uint32_t> lengths;  // odd, at least 1
    ublas::vector<float> gains;            // g_i
    ublas::vector<float> coefficients;     // c_i in [-0.9999, 0]
};

}  // namespace zen::reverb
