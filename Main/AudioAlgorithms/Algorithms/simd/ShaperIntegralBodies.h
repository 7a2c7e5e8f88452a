// The ShaperIntegrals arithmetic on one lane type L (PlainLanes: a double;
// the 256-bit form's four doubles), written once so that both forms take
// the same steps. L gives D (the values), U (their bits as unsigned
// integers), Dup, Bits, FromBits, Sqrt and Mask (a comparison as all-ones
// or zero bits).
#pragma once

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>

#include "Algorithms/ShaperIntegrals.h"

namespace ora::numeric::simd {

constexpr std::uint64_t kShaperSignBit = 0x8000000000000000ull;
constexpr std::uint64_t kShaperMantissa = 0x000FFFFFFFFFFFFFull;
constexpr std::uint64_t kShaperOneBits = 0x3FF0000000000000ull;
constexpr std::uint64_t kShaperTwoTo52Bits = 0x4330000000000000ull;
constexpr double kShaperTwoTo52 = 4503599627370496.0;
// The logarithm's table: kShaperLogCells cells of [1, 2), chosen by the
// mantissa's top bits.
constexpr std::size_t kShaperLogCells = 256;
constexpr int kShaperLogCellShift = 44;  // 52 mantissa bits less 8
constexpr std::uint64_t kShaperLogCellMask = kShaperLogCells - 1;
constexpr std::uint64_t kShaperLogCellBits = std::uint64_t{kShaperLogCells - 1} << kShaperLogCellShift;
constexpr std::uint64_t kShaperLogHalfCellBit = std::uint64_t{1} << (kShaperLogCellShift - 1);
constexpr double kShaperLn2Hi = 6.93147180369123816490e-01;
constexpr double kShaperLn2Lo = 1.90821492927058770002e-10;
// pi in three parts, the first two short enough that n times them is exact.
constexpr double kShaperPiA = 3.14159250259399414062;
constexpr double kShaperPiB = 1.50995788317231926667e-7;
constexpr double kShaperPiC = 1.07806057163162381058e-14;
constexpr double kShaperInversePi = 0.31830988618379067154;
constexpr double kShaperRoundingShift = 6755399441055744.0;  // 1.5 x 2^52: adding it rounds to a whole number

// Per cell of the logarithm's table, its middle z: 1/z and ln z, each
// rounded once from long double. Built on first use, read only after.
struct ShaperLogTable {
    double inverse[kShaperLogCells];
    double log[kShaperLogCells];

    static const ShaperLogTable& Get() {
        static const ShaperLogTable table = [] {
            ShaperLogTable t{};
            for (std::size_t j = 0; j < kShaperLogCells; ++j) {
                const long double z = 1.0L + (static_cast<long double>(j) + 0.5L) / kShaperLogCells;
                t.inverse[j] = static_cast<double>(1.0L / z);
                t.log[j] = static_cast<double>(std::log(z));
            }
            return t;
        }();
        return table;
    }
};

struct PlainLanes {
    using D = double;
    using U = std::uint64_t;
    static constexpr std::size_t kWidth = 1;
    static D Dup(double v) { return v; }
    static D Load(const float* p) { return static_cast<double>(*p); }
    static D LoadDouble(const double* p) { return *p; }
    static std::size_t StoreFlags(unsigned char* p, U mask) {
        *p = mask != 0 ? 1 : 0;
        return *p;
    }
    static void Store(double* p, D v) { *p = v; }
    static void StoreFloat(float* p, D v) { *p = static_cast<float>(v); }
    static double Lane(D v, std::size_t) { return v; }
    static D Gather(const double* table, U index) { return table[index]; }
    static U Bits(D v) {
        U b;
        std::memcpy(&b, &v, sizeof b);
        return b;
    }
    static D FromBits(U b) {
        D v;
        std::memcpy(&v, &b, sizeof v);
        return v;
    }
    static D Sqrt(D v) { return std::sqrt(v); }
    static U Mask(bool condition) { return condition ? ~U{0} : U{0}; }
};

template <class L>
inline typename L::D ShaperBlend(typename L::U mask, typename L::D yes, typename L::D no) {
    return L::FromBits((mask & L::Bits(yes)) | (~mask & L::Bits(no)));
}

// sin u for |u| below about 1e6: u less the nearest multiple of pi, then
// the Taylor series to the 19th power (the next term is below 3e-16).
template <class L>
inline typename L::D ShaperSine(typename L::D u) {
    using D = typename L::D;
    const D shifted = u * L::Dup(kShaperInversePi) + L::Dup(kShaperRoundingShift);
    const D n = shifted - L::Dup(kShaperRoundingShift);
    const D r = ((u - n * L::Dup(kShaperPiA)) - n * L::Dup(kShaperPiB)) - n * L::Dup(kShaperPiC);
    const D r2 = r * r;
    D p = L::Dup(-1.0 / 121645100408832000.0);
    p = p * r2 + L::Dup(1.0 / 355687428096000.0);
    p = p * r2 + L::Dup(-1.0 / 1307674368000.0);
    p = p * r2 + L::Dup(1.0 / 6227020800.0);
    p = p * r2 + L::Dup(-1.0 / 39916800.0);
    p = p * r2 + L::Dup(1.0 / 362880.0);
    p = p * r2 + L::Dup(-1.0 / 5040.0);
    p = p * r2 + L::Dup(1.0 / 120.0);
    p = p * r2 + L::Dup(-1.0 / 6.0);
    const D s = r + r * r2 * p;
    // An odd multiple of pi turns the sign: its parity is the shifted value's lowest bit.
    return L::FromBits(L::Bits(s) ^ (L::Bits(shifted) << 63));
}

// ln a for finite a >= 1: a = 2^k m with 1 <= m < 2; z, the middle of the
// 1/kShaperLogCells of [1, 2) that holds m, comes from the table with 1/z and
// ln z, so that ln m = ln z + ln(1 + r), r = (m - z) / z within +-2^-9 and
// ln(1 + r) a short series to r^5 (the next term is below 1e-17): no
// division, and m - z is exact.
template <class L>
inline typename L::D ShaperLog(typename L::D a, const ShaperLogTable& table) {
    using D = typename L::D;
    using U = typename L::U;
    const U bits = L::Bits(a);
    const U cell = (bits >> kShaperLogCellShift) & kShaperLogCellMask;
    const D k = (L::FromBits((bits >> 52) | kShaperTwoTo52Bits) - L::Dup(kShaperTwoTo52)) - L::Dup(1023.0);
    const D m = L::FromBits((bits & kShaperMantissa) | kShaperOneBits);
    const D z = L::FromBits((bits & kShaperLogCellBits) | kShaperOneBits | kShaperLogHalfCellBit);
    const D r = (m - z) * L::Gather(table.inverse, cell);
    D p = L::Dup(1.0 / 5.0);
    p = p * r + L::Dup(-1.0 / 4.0);
    p = p * r + L::Dup(1.0 / 3.0);
    p = p * r + L::Dup(-1.0 / 2.0);
    const D logM = L::Gather(table.log, cell) + (r + r * r * p);
    return k * L::Dup(kShaperLn2Hi) + (k * L::Dup(kShaperLn2Lo) + logM);
}

// R(v) = (v sqrt(1 + v^2) + asinh v) / 2, asinh from the root at hand.
template <class L>
inline typename L::D ShaperRootIntegral(typename L::D v, const ShaperLogTable& table) {
    using D = typename L::D;
    const D r = L::Sqrt(L::Dup(1.0) + v * v);
    const D magnitude = L::FromBits(L::Bits(v) & ~kShaperSignBit);
    const D asinh = L::FromBits(L::Bits(ShaperLog<L>(magnitude + r, table)) | (L::Bits(v) & kShaperSignBit));
    return L::Dup(0.5) * (v * r + asinh);
}

// A shape's numbers as lanes, taken once per block.
template <class L>
struct ShaperTerms {
    typename L::D k, bias, inverseKSquared, halfBiasLevel, scale;
    explicit ShaperTerms(const ShaperShape& shape)
        : k(L::Dup(shape.k)),
          bias(L::Dup(shape.bias)),
          inverseKSquared(L::Dup(1.0 / (shape.k * shape.k))),
          halfBiasLevel(L::Dup(0.5 * shape.biasLevel)),
          scale(L::Dup(shape.scale)) {}
};

template <class L, ShaperCurve C>
inline typename L::D ShaperCurveIntegral(const ShaperTerms<L>& t, typename L::D u, const ShaperLogTable& table) {
    using D = typename L::D;
    if constexpr (C == ShaperCurve::Tape) {
        return ShaperRootIntegral<L>(u, table);
    } else if constexpr (C == ShaperCurve::Tube) {
        const D v = t.k * u + t.bias;
        return (ShaperRootIntegral<L>(v, table) * t.inverseKSquared - t.halfBiasLevel * u * u) * t.scale;
    } else if constexpr (C == ShaperCurve::Hard) {
        const D m = L::FromBits(L::Bits(u) & ~kShaperSignBit);
        const D inside = u * u * u * L::Dup(1.0 / 6.0);
        const D outsideMagnitude = L::Dup(0.5) * m * m - L::Dup(0.5) * m + L::Dup(1.0 / 6.0);
        const D outside = L::FromBits(L::Bits(outsideMagnitude) | (L::Bits(u) & kShaperSignBit));
        return ShaperBlend<L>(L::Mask(m <= L::Dup(1.0)), inside, outside);
    } else {
        return u - ShaperSine<L>(u);
    }
}

template <class L>
inline typename L::D ShaperSecondIntegral(const ShaperShape& shape, typename L::D u, const ShaperLogTable& table) {
    const ShaperTerms<L> terms(shape);
    switch (shape.curve) {
        case ShaperCurve::Tape: return ShaperCurveIntegral<L, ShaperCurve::Tape>(terms, u, table);
        case ShaperCurve::Tube: return ShaperCurveIntegral<L, ShaperCurve::Tube>(terms, u, table);
        case ShaperCurve::Hard: return ShaperCurveIntegral<L, ShaperCurve::Hard>(terms, u, table);
        case ShaperCurve::FoldBack: return ShaperCurveIntegral<L, ShaperCurve::FoldBack>(terms, u, table);
    }
    return u;
}

template <class L>
inline typename L::D ShaperAbs(typename L::D v) {
    return L::FromBits(L::Bits(v) & ~kShaperSignBit);
}

// The larger of a and b, either when they are equal.
template <class L>
inline typename L::D ShaperMax(typename L::D a, typename L::D b) {
    return ShaperBlend<L>(L::Mask(a < b), b, a);
}

// The kernel on lanes L, two vectors at a time so that their long chains
// overlap, the rest one by one; returns the largest |u|.
template <class L, ShaperCurve C>
inline double ShaperCurveBlock(const ShaperShape& shape, const float* pre, const float* in, double* u, double* f2,
                               std::size_t n) {
    using D = typename L::D;
    constexpr std::size_t W = L::kWidth;
    const ShaperLogTable& table = ShaperLogTable::Get();
    const ShaperTerms<L> terms(shape);
    std::size_t i = 0;
    D lanePeak = L::Dup(0.0);
    for (; i + 2 * W <= n; i += 2 * W) {
        const D a = L::Load(pre + i) * L::Load(in + i);
        const D b = L::Load(pre + i + W) * L::Load(in + i + W);
        L::Store(u + i, a);
        L::Store(u + i + W, b);
        L::Store(f2 + i, ShaperCurveIntegral<L, C>(terms, a, table));
        L::Store(f2 + i + W, ShaperCurveIntegral<L, C>(terms, b, table));
        lanePeak = ShaperMax<L>(lanePeak, ShaperMax<L>(ShaperAbs<L>(a), ShaperAbs<L>(b)));
    }
    for (; i + W <= n; i += W) {
        const D driven = L::Load(pre + i) * L::Load(in + i);
        L::Store(u + i, driven);
        L::Store(f2 + i, ShaperCurveIntegral<L, C>(terms, driven, table));
        lanePeak = ShaperMax<L>(lanePeak, ShaperAbs<L>(driven));
    }
    double peak = 0.0;
    for (std::size_t k = 0; k < W; ++k) peak = std::max(peak, L::Lane(lanePeak, k));
    const ShaperTerms<PlainLanes> one(shape);
    for (; i < n; ++i) {
        u[i] = static_cast<double>(pre[i]) * static_cast<double>(in[i]);
        f2[i] = ShaperCurveIntegral<PlainLanes, C>(one, u[i], table);
        peak = std::max(peak, std::fabs(u[i]));
    }
    return peak;
}

template <class L>
inline double ShaperIntegralBlock(const ShaperShape& shape, const float* pre, const float* in, double* u, double* f2,
                                  std::size_t n) {
    switch (shape.curve) {
        case ShaperCurve::Tape: return ShaperCurveBlock<L, ShaperCurve::Tape>(shape, pre, in, u, f2, n);
        case ShaperCurve::Tube: return ShaperCurveBlock<L, ShaperCurve::Tube>(shape, pre, in, u, f2, n);
        case ShaperCurve::Hard: return ShaperCurveBlock<L, ShaperCurve::Hard>(shape, pre, in, u, f2, n);
        case ShaperCurve::FoldBack: return ShaperCurveBlock<L, ShaperCurve::FoldBack>(shape, pre, in, u, f2, n);
    }
    return 0.0;
}

// out[i] = post[i] x mean[i] held within +-1, on lanes L, the rest one by one.
template <class L>
inline void ShaperScaleBlock(const double* mean, const float* post, float* out, std::size_t n) {
    std::size_t i = 0;
    for (; i + L::kWidth <= n; i += L::kWidth) {
        const typename L::D m = L::LoadDouble(mean + i);
        const typename L::D held = ShaperBlend<L>(L::Mask(m < L::Dup(-1.0)), L::Dup(-1.0),
                                                  ShaperBlend<L>(L::Mask(L::Dup(1.0) < m), L::Dup(1.0), m));
        L::StoreFloat(out + i, L::Load(post + i) * held);
    }
    for (; i < n; ++i) out[i] = static_cast<float>(static_cast<double>(post[i]) * std::clamp(mean[i], -1.0, 1.0));
}

// Lanes L of the mean, the rest one by one; each output in the same order of operations.
template <class L>
inline std::size_t ShaperMeanBlock(const double* u, const double* f2, double smallStep, double* mean,
                                   unsigned char* small, std::size_t n) {
    std::size_t i = 0, flagged = 0;
    for (; i + L::kWidth <= n; i += L::kWidth) {
        using D = typename L::D;
        const D u0 = L::LoadDouble(u + i + 2), u1 = L::LoadDouble(u + i + 1), u2 = L::LoadDouble(u + i);
        const D f0 = L::LoadDouble(f2 + i + 2), f1 = L::LoadDouble(f2 + i + 1), f2b = L::LoadDouble(f2 + i);
        const D step01 = u0 - u1, step12 = u1 - u2, span = u0 - u2;
        const D one = L::Dup(1.0), tolerance = L::Dup(smallStep);
        const typename L::U tiny = L::Mask(ShaperAbs<L>(step01) <= tolerance * (one + ShaperAbs<L>(u0))) |
                                   L::Mask(ShaperAbs<L>(step12) <= tolerance * (one + ShaperAbs<L>(u1))) |
                                   L::Mask(ShaperAbs<L>(span) <= tolerance * (one + ShaperAbs<L>(u0)));
        // Tiny lanes divide by 1 instead; their result is not used.
        const D safe = ShaperBlend<L>(tiny, one, step01 * step12 * span);
        L::Store(mean + i, L::Dup(2.0) * ((f0 - f1) * step12 - (f1 - f2b) * step01) / safe);
        flagged += L::StoreFlags(small + i, tiny);
    }
    for (; i < n; ++i) {
        const double u0 = u[i + 2], u1 = u[i + 1], u2 = u[i];
        const double step01 = u0 - u1, step12 = u1 - u2, span = u0 - u2;
        const bool tiny = std::fabs(step01) <= smallStep * (1.0 + std::fabs(u0)) ||
                          std::fabs(step12) <= smallStep * (1.0 + std::fabs(u1)) ||
                          std::fabs(span) <= smallStep * (1.0 + std::fabs(u0));
        const double safe = tiny ? 1.0 : step01 * step12 * span;
        mean[i] = 2.0 * ((f2[i + 2] - f2[i + 1]) * step12 - (f2[i + 1] - f2[i]) * step01) / safe;
        small[i] = tiny ? 1 : 0;
        flagged += tiny ? 1 : 0;
    }
    return flagged;
}

}  // namespace ora::numeric::simd
