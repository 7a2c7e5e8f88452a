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
    static void StoreFlags(unsigned char* p, U mask) {
        for (int k = 0; k < 4; ++k) p[k] = mask[k] != 0 ? 1 : 0;
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

void ShaperIntegrals_m256(const ShaperShape& shape, const float* pre, const float* in, double* u, double* f2,
                          std::size_t n) {
    ShaperIntegralBlock<WideLanes>(shape, pre, in, u, f2, n);
}

void ShaperMean_m256(const double* u, const double* f2, double smallStep, double* mean, unsigned char* small,
                     std::size_t n) {
    ShaperMeanBlock<WideLanes>(u, f2, smallStep, mean, small, n);
}

}  // namespace ora::numeric::simd
