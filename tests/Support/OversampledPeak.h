// An independent true-peak check for the limiter's tests: the band-limited
// waveform through the samples is evaluated 16 times per sample with its own
// filter (a Kaiser-windowed sinc, 64 taps per point, double precision), and
// the largest point is refined by a parabola through its neighbours 1/16
// sample apart. It shares nothing with the library's TruePeak.
#pragma once

#include <cstddef>
#include <vector>

namespace zentest {

class OversampledPeak {
public:
    static constexpr int kFactor = 16;
    static constexpr int kHalfWidth = 32;  // input samples each side

    OversampledPeak();

    // The largest magnitude of the waveform between t = begin and t = end
    // (samples before 0 and from x.size() on are taken as silence).
    double Measure(const std::vector<float>& x, std::size_t begin, std::size_t end) const;
    double Measure(const std::vector<float>& x) const { return Measure(x, 0, x.size()); }

private:
    // `padded` holds kHalfWidth zeros, the signal, kHalfWidth zeros.
    double Point(const std::vector<double>& padded, std::size_t n, int phase) const;

    std::vector<double> m_taps;  // kFactor phases x 2 kHalfWidth taps
};

}  // namespace zentest
