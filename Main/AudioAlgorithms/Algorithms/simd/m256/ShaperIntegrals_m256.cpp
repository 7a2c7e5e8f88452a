#include "Algorithms/simd/ShaperIntegralBodies.h"

namespace ora::numeric::simd {

namespace {

using v4df = double __attribute__((vector_size(32)));
using v4du = unsigned long long __attribute__((vector_size(32)));
using v4sf = float __attribute__((vector_size(16)));

struct WideLanes {
    using D = v4df;
    using U = v4du;
    static constexpr std::size_t kWidth = 4;
    static D Dup(double v) { return D{v, v, v, v}; }
    static D Load(const float* p) {
        v4sf f;
        std::memcpy(&f, p, sizeof f);
        return __builtin_convertvector(f, v4df);
    }
    static void Store(double* p, D v) { std::memcpy(p, &v, sizeof v); }
    static D LoadDouble(const double* p) {
        D v;
        std::memcpy(&v, p, sizeof v);
        return v;
    }
    static std::size_t StoreFlags(unsigned char* p, U mask) {
        // The lanes' sign bits at once; a set lane has every bit set.
        const int bits = __builtin_ia32_movmskpd256((D)mask);
        if (bits == 0) {
            std::memset(p, 0, 4);
            return 0;
        }
        for (int k = 0; k < 4; ++k) p[k] = static_cast<unsigned char>((bits >> k) & 1);
        return static_cast<std::size_t>(__builtin_popcount(static_cast<unsigned>(bits)));
    }
    static void StoreFloat(float* p, D v) {
        const v4sf f = __builtin_convertvector(v, v4sf);
        std::memcpy(p, &f, sizeof f);
    }
    static double Lane(D v, std::size_t k) { return v[k]; }
    static D Gather(const double* table, U index) {
        return D{table[index[0]], table[index[1]], table[index[2]], table[index[3]]};
    }
    static U Bits(D v) { return (U)v; }
    static D FromBits(U b) { return (D)b; }
    static D Sqrt(D v) { return __builtin_ia32_sqrtpd256(v); }
    template <class Comparison>
    static U Mask(Comparison condition) {
        return (U)condition;
    }
};

}  // namespace

double ShaperIntegrals_m256(const ShaperShape& shape, const float* pre, const float* in, double* u, double* f2,
                            std::size_t n) {
    return ShaperIntegralBlock<WideLanes>(shape, pre, in, u, f2, n);
}

std::size_t ShaperMean_m256(const double* u, const double* f2, double smallStep, double* mean, unsigned char* small,
                            std::size_t n) {
    return ShaperMeanBlock<WideLanes>(u, f2, smallStep, mean, small, n);
}

void ShaperScale_m256(const double* mean, const float* post, float* out, std::size_t n) {
    ShaperScaleBlock<WideLanes>(mean, post, out, n);
}

}  // namespace ora::numeric::simd
