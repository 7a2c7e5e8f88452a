// The FFT wrapper against a direct DFT, on every back end this build has.
#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <random>
#include <stdexcept>
#include <vector>

#include "FFT/FFT.h"

using ora::fft::Backend;
using ora::fft::Complex;
using ora::fft::FFT;

namespace {

std::vector<std::complex<double>> Dft(const std::vector<std::complex<double>>& x, int sign) {
    const std::size_t n = x.size();
    std::vector<std::complex<double>> y(n);
    for (std::size_t k = 0; k < n; ++k) {
        std::complex<double> sum = 0.0;
        for (std::size_t j = 0; j < n; ++j)
            sum += x[j] * std::polar(1.0, sign * 2.0 * M_PI * static_cast<double>((j * k) % n) / static_cast<double>(n));
        y[k] = sum;
    }
    return y;
}

std::vector<Backend> Backends() {
    std::vector<Backend> all{Backend::Kiss};
    if (FFT::IsAvailable(Backend::Fftw)) all.push_back(Backend::Fftw);
    return all;
}

class FFTBackends : public ::testing::TestWithParam<Backend> {};

// Single-precision error grows with log n; relative to the signal's energy.
double Tolerance(std::size_t n) { return 2e-6 * std::log2(static_cast<double>(n)) * std::sqrt(static_cast<double>(n)); }

}  // namespace

TEST_P(FFTBackends, RealAndComplexTransformsMatchTheDirectDft) {
    std::mt19937 rng(7);
    std::uniform_real_distribution<float> u(-1.0f, 1.0f);
    for (std::size_t n : {2u, 6u, 16u, 30u, 256u, 1000u, 1024u}) {
        FFT fft(n, GetParam());
        ASSERT_EQ(fft.Bins(), n / 2 + 1);
        std::vector<float> real(n);
        std::vector<Complex> cplx(n);
        std::vector<std::complex<double>> realD(n), cplxD(n);
        for (std::size_t i = 0; i < n; ++i) {
            real[i] = u(rng);
            cplx[i] = {u(rng), u(rng)};
            realD[i] = real[i];
            cplxD[i] = {cplx[i].real(), cplx[i].imag()};
        }
        const auto expectReal = Dft(realD, -1);
        const auto expectForward = Dft(cplxD, -1);
        const auto expectInverse = Dft(cplxD, +1);

        std::vector<Complex> bins(n / 2 + 1), forward(n), inverse(n);
        fft.ForwardReal(real.data(), bins.data());
        fft.ForwardComplex(cplx.data(), forward.data());
        fft.InverseComplex(cplx.data(), inverse.data());
        const double tol = Tolerance(n);
        for (std::size_t k = 0; k <= n / 2; ++k) {
            EXPECT_NEAR(bins[k].real(), expectReal[k].real(), tol) << "n " << n << " bin " << k;
            EXPECT_NEAR(bins[k].imag(), expectReal[k].imag(), tol) << "n " << n << " bin " << k;
        }
        for (std::size_t k = 0; k < n; ++k) {
            EXPECT_NEAR(forward[k].real(), expectForward[k].real(), tol) << "n " << n << " bin " << k;
            EXPECT_NEAR(forward[k].imag(), expectForward[k].imag(), tol) << "n " << n << " bin " << k;
            EXPECT_NEAR(inverse[k].real(), expectInverse[k].real(), tol) << "n " << n << " bin " << k;
            EXPECT_NEAR(inverse[k].imag(), expectInverse[k].imag(), tol) << "n " << n << " bin " << k;
        }

        // The real inverse is unscaled and leaves its input alone.
        const std::vector<Complex> kept = bins;
        std::vector<float> back(n);
        fft.InverseReal(bins.data(), back.data());
        EXPECT_EQ(bins, kept);
        for (std::size_t i = 0; i < n; ++i) EXPECT_NEAR(back[i], real[i] * static_cast<float>(n), tol * n) << n;
    }
}

TEST_P(FFTBackends, RealInverseIgnoresImaginaryPartsOfDcAndNyquist) {
    const std::size_t n = 64;
    FFT fft(n, GetParam());
    std::vector<Complex> bins(n / 2 + 1, Complex{0.0f, 0.0f});
    bins[0] = {1.0f, 5.0f};
    bins[n / 2] = {1.0f, -3.0f};
    std::vector<float> out(n);
    fft.InverseReal(bins.data(), out.data());
    for (std::size_t i = 0; i < n; ++i) EXPECT_NEAR(out[i], i % 2 == 0 ? 2.0f : 0.0f, 1e-5f) << i;
}

TEST_P(FFTBackends, MisalignedBuffersGiveTheSameResult) {
    const std::size_t n = 512;
    FFT fft(n, GetParam());
    std::vector<float> storage(n + 1);
    for (std::size_t i = 0; i < n; ++i) storage[i + 1] = std::sin(0.01f * static_cast<float>(i * i));
    std::vector<float> aligned(storage.begin() + 1, storage.end());
    std::vector<Complex> a(n / 2 + 2), b(n / 2 + 1);
    fft.ForwardReal(storage.data() + 1, a.data() + 1);
    fft.ForwardReal(aligned.data(), b.data());
    for (std::size_t k = 0; k <= n / 2; ++k) EXPECT_EQ(a[k + 1], b[k]) << k;
}

INSTANTIATE_TEST_SUITE_P(AllBackends, FFTBackends, ::testing::ValuesIn(Backends()),
                         [](const ::testing::TestParamInfo<Backend>& p) { return std::string(FFT::BackendName(p.param)); });

TEST(FFT, RefusesOddOrZeroLengths) {
    EXPECT_THROW(FFT(0, Backend::Kiss), std::invalid_argument);
    EXPECT_THROW(FFT(15, Backend::Kiss), std::invalid_argument);
    EXPECT_TRUE(FFT::IsAvailable(Backend::Kiss));
    EXPECT_STREQ(FFT::BackendName(Backend::Fftw), "fftw");
#ifdef ORA_HAVE_FFTW
    EXPECT_TRUE(FFT::IsAvailable(Backend::Fftw));
#endif
}
