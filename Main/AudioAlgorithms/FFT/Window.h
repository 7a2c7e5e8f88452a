// Analysis window and its dual synthesis window. Overlap-adding frames that
// were windowed by the analysis window and again by the dual one, at the
// stride they were built for, gives back the input exactly.
#pragma once

#include <cstddef>

#include "System/AlignedBuffer.h"

namespace ora::fft {

class Window {
public:
    // Periodic Hann: smooth spectra, narrow main lobe, and a close fit to the
    // Gaussian the phase-gradient relations assume.
    static void Hann(float* win, std::size_t len);
    // More analysis windows, periodic, for spectrum analysers:
    // rectangular (finest resolution, -13 dB side lobes), 4-term
    // Blackman-Harris (-92 dB side lobes) and flat top (amplitude of a tone
    // between bins within 0.01 dB).
    static void Rectangular(float* win, std::size_t len);
    static void BlackmanHarris(float* win, std::size_t len);
    static void FlatTop(float* win, std::size_t len);

    // Fills `win` (Hann) and `win_dual` for frames of `len` at `stride`.
    // False, with a reported check, for null pointers or zero sizes.
    static bool MakePair(float* win, float* win_dual, std::size_t len, std::size_t stride);

    // Owns a pair. Allocates; throws std::bad_alloc.
    bool Build(std::size_t len, std::size_t stride);
    const float* Analysis() const { return m_win.data(); }
    const float* Dual() const { return m_dual.data(); }
    std::size_t Length() const { return m_win.size(); }

private:
    AlignedBuffer<float> m_win;
    AlignedBuffer<float> m_dual;
};

}  // namespace ora::fft
