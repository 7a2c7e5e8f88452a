// The re-timer's rate control: the ratio at which frames are analysed (and
// so the rate at which the stretched stream is read) glides toward the
// wanted pitch ratio, and the latency that ties output samples to input
// samples: output sample n shows input time n - latency. The latency is
// the least that lets every frame be analysed by the time the reader needs
// it, at any sequence of ratios down to the lowest.
#pragma once

#include <cstddef>
#include <cstdint>

#include "System/ParamGroup.h"

namespace ora::retimer {

class rate_control {
public:
    class Param : public ParamGroup {
    public:
        std::int64_t m_Origin = 0;          // first frame's centre, input samples after the first output's input time
        std::int32_t m_ExtraLatency = 0;    // added to the least latency
        float m_Rate = 1.0f;                // rate the control starts from
        float m_Glide = 0.001f;             // per-sample one-pole step toward a new ratio (~21 ms at 48 kHz)
        std::int64_t m_LatencyOverride = 0; // when non-zero, the latency (never below the least)
        std::int32_t m_FifoCapacity = 20000;  // stretched samples held per channel
        std::int32_t m_Immediate = 0;       // non-zero: a new ratio applies at once
    };

    // Samples of margin over the computed least latency (rounding of
    // analysis positions).
    static constexpr std::int64_t kMargin = 8;

    // The least latency for frames of `frameLength` read at `minRatio` or
    // above with `lookahead` samples of interpolation look-ahead.
    static std::int64_t LeastLatency(std::size_t frameLength, double minRatio, std::size_t lookahead);

    void Configure(const Param& param, std::int64_t latency, double minRatio, double maxRatio);
    void Reset(double ratio) noexcept;
    void SetTarget(double ratio) noexcept;
    double Target() const { return m_target; }
    double Rate() const { return m_rate; }

    // The rate for the next output sample.
    double Next() noexcept {
        if (m_rate != m_target) {
            m_rate += m_glide * (m_target - m_rate);
            if (Abs(m_target - m_rate) < 1e-9) m_rate = m_target;
        }
        return m_rate;
    }

    std::int64_t Latency() const { return m_latency; }
    std::int64_t Origin() const { return m_origin; }

private:
    static double Abs(double x) { return x < 0 ? -x : x; }

    double m_rate = 1.0;
    double m_target = 1.0;
    double m_glide = 0.001;
    double m_minRatio = 0.5;
    double m_maxRatio = 2.0;
    std::int64_t m_latency = 0;
    std::int64_t m_origin = 0;
};

}  // namespace ora::retimer
