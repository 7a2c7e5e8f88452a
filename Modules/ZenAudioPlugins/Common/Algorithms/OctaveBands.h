// Third-octave band levels from a power spectrum: the 31 bands of base-10
// centres 1000 * 10^(k/10) Hz, k = -17..13 (nominal 20 Hz to 20 kHz), each
// from centre * 10^(-1/20) to centre * 10^(1/20). A bin counts for the
// share of its width inside the band, so bands narrower than a bin still
// get their share and the bands together hold each bin once. Bands above
// the Nyquist frequency stay empty.
#pragma once

#include <array>
#include <cstddef>

namespace zen {

class OctaveBands {
public:
    static constexpr std::size_t kBands = 31;
    static constexpr int kFirstIndex = -17;  // 20 Hz

    static double Centre(std::size_t band);
    static double LowerEdge(std::size_t band);
    static double UpperEdge(std::size_t band);

    // For spectra of `fftSize` points at `sampleRate`; no allocation.
    void Configure(double sampleRate, std::size_t fftSize);
    // Sums `power` (fftSize / 2 + 1 bins) into the bands, each times `scale`.
    void Compute(const float* power, float* bands, float scale = 1.0f) const noexcept;

private:
    struct Span {
        std::size_t first = 0, last = 0;  // bins, inclusive; last < first: empty
        float firstShare = 0.0f, lastShare = 0.0f;
    };
    std::array<Span, kBands> m_spans{};
};

}  // namespace zen
