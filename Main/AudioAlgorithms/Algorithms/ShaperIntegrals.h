// Second antiderivatives of saturation curves over a block of driven
// inputs: the costly part of a shaper that averages its curve along the
// straight lines between samples (see Waveshaper), once per sample at the
// oversampled rate.
//
// No library calls on the way: the sine is a Taylor series after reduction
// by the nearest multiple of pi, the logarithm a table of 256 cells of the
// mantissa (built once) and a short series within the cell, without a
// division; both accurate to a few units in the last place,
// because the shaper divides differences of these values by squared steps
// (within ten units of the value in the last place, of 1 below it).
// The 256-bit form (four doubles, chosen when the processor has AVX) takes
// the reference form's steps and agrees with it bit for bit.
#pragma once

#include <cstddef>

#include "System/DispatchSettings.h"

namespace ora::numeric {

enum class ShaperCurve { Tape, Tube, Hard, FoldBack };

// The curves, for a driven input u:
//   Tape      f = u / sqrt(1 + u^2)               F2 = R(u)
//   Tube      f = (g(k u + bias) - g(bias)) scale  F2 = (R(k u + bias) / k^2 - g(bias) u^2 / 2) scale
//   Hard      f = clamp(u, -1, 1)                  F2 = u^3 / 6 inside, sign(u) (u^2 - |u| + 1/3) / 2 outside
//   FoldBack  f = sin u                            F2 = u - sin u
// with g the tape curve and R(v) = (v sqrt(1 + v^2) + asinh v) / 2.
struct ShaperShape {
    ShaperCurve curve = ShaperCurve::Tape;
    double k = 1.0, bias = 0.0, biasLevel = 0.0, scale = 1.0;  // the tube's
};

using ShaperIntegralKernel = double (*)(const ShaperShape& shape, const float* pre, const float* in, double* u,
                                        double* f2, std::size_t n);
using ShaperMeanKernel = std::size_t (*)(const double* u, const double* f2, double smallStep, double* mean,
                                         unsigned char* small, std::size_t n);
using ShaperScaleKernel = void (*)(const double* mean, const float* post, float* out, std::size_t n);

class ShaperIntegrals {
public:
    ShaperIntegrals();

    // u[i] = pre[i] x in[i] and f2[i] = F2(u[i]) for i < n; returns the largest |u[i]|.
    double Evaluate(const ShaperShape& shape, const float* pre, const float* in, double* u, double* f2,
                    std::size_t n) const noexcept {
        return m_kernel(shape, pre, in, u, f2, n);
    }
    // One value, the reference form's arithmetic.
    static double Evaluate(const ShaperShape& shape, double u) noexcept;

    // The triangle-weighted mean of the curve around each u[i + 1]:
    // mean[i] = 2 (D(u[i+2], u[i+1]) - D(u[i+1], u[i])) / (u[i+2] - u[i]),
    // D(a, b) = (F2(a) - F2(b)) / (a - b), for i < n (u and f2 hold n + 2
    // values). Where a step or the span is at most smallStep x (1 + |its
    // later end|) the divisions lose too many digits: small[i] is 1 and
    // mean[i] is left for the caller, else small[i] is 0. Returns how many are 1.
    std::size_t Mean(const double* u, const double* f2, double smallStep, double* mean, unsigned char* small,
                     std::size_t n) const noexcept {
        return m_mean(u, f2, smallStep, mean, small, n);
    }

    // out[i] = post[i] x mean[i] held within +-1, for i < n.
    void Scale(const double* mean, const float* post, float* out, std::size_t n) const noexcept {
        m_scale(mean, post, out, n);
    }

    system::KernelForm GetForm() const { return m_form; }

private:
    system::KernelForm m_form;
    ShaperIntegralKernel m_kernel;
    ShaperMeanKernel m_mean;
    ShaperScaleKernel m_scale;
};

}  // namespace ora::numeric
