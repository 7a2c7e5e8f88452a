#include "FFT/FftwBackend.h"

#include <algorithm>
#include <mutex>
#include <new>
#include <stdexcept>

#ifdef ORA_HAVE_FFTW
#include <fftw3.h>
#endif

namespace ora::fft {

#ifdef ORA_HAVE_FFTW

namespace {
// The planner is not thread-safe; only execution is.
std::mutex& PlannerMutex() {
    static std::mutex mutex;
    return mutex;
}
}  // namespace

// Plans run on their own aligned buffers: the caller's pointers may have any
// alignment, and FFTW's real inverse overwrites its input.
struct FftwBackend::Plans {
    std::size_t n = 0;
    float* real = nullptr;
    fftwf_complex* spectrum = nullptr;  // n / 2 + 1
    fftwf_complex* complexIn = nullptr;
    fftwf_complex* complexOut = nullptr;
    fftwf_plan realForward = nullptr;
    fftwf_plan realInverse = nullptr;
    fftwf_plan complexForward = nullptr;
    fftwf_plan complexInverse = nullptr;

    ~Plans() {
        std::lock_guard<std::mutex> lock(PlannerMutex());
        for (fftwf_plan plan : {realForward, realInverse, complexForward, complexInverse})
            if (plan != nullptr) fftwf_destroy_plan(plan);
        fftwf_free(real);
        fftwf_free(spectrum);
        fftwf_free(complexIn);
        fftwf_free(complexOut);
    }
};

bool FftwBackend::IsAvailable() { return true; }

FftwBackend::FftwBackend(std::size_t n) : m_plans(std::make_unique<Plans>()) {
    Plans& p = *m_plans;
    p.n = n;
    const int size = static_cast<int>(n);
    std::lock_guard<std::mutex> lock(PlannerMutex());
    p.real = fftwf_alloc_real(n);
    p.spectrum = fftwf_alloc_complex(n / 2 + 1);
    p.complexIn = fftwf_alloc_complex(n);
    p.complexOut = fftwf_alloc_complex(n);
    if (!p.real || !p.spectrum || !p.complexIn || !p.complexOut) throw std::bad_alloc();
    const unsigned flags = FFTW_ESTIMATE;
    p.realForward = fftwf_plan_dft_r2c_1d(size, p.real, p.spectrum, flags);
    p.realInverse = fftwf_plan_dft_c2r_1d(size, p.spectrum, p.real, flags);
    p.complexForward = fftwf_plan_dft_1d(size, p.complexIn, p.complexOut, FFTW_FORWARD, flags);
    p.complexInverse = fftwf_plan_dft_1d(size, p.complexIn, p.complexOut, FFTW_BACKWARD, flags);
    if (!p.realForward || !p.realInverse || !p.complexForward || !p.complexInverse) throw std::bad_alloc();
}

FftwBackend::~FftwBackend() = default;

void FftwBackend::ForwardReal(const float* in, Complex* out) noexcept {
    Plans& p = *m_plans;
    // Straight between the caller's arrays when they are aligned as the
    // plan's are (the real forward transform leaves its input alone).
    auto* input = const_cast<float*>(in);
    auto* output = reinterpret_cast<fftwf_complex*>(out);
    if (fftwf_alignment_of(input) == fftwf_alignment_of(p.real) &&
        fftwf_alignment_of(reinterpret_cast<float*>(output)) == fftwf_alignment_of(reinterpret_cast<float*>(p.spectrum))) {
        fftwf_execute_dft_r2c(p.realForward, input, output);
        return;
    }
    std::copy_n(in, p.n, p.real);
    fftwf_execute(p.realForward);
    std::copy_n(reinterpret_cast<const Complex*>(p.spectrum), p.n / 2 + 1, out);
}

void FftwBackend::InverseReal(const Complex* in, float* out) noexcept {
    Plans& p = *m_plans;
    auto* bins = reinterpret_cast<Complex*>(p.spectrum);
    std::copy_n(in, p.n / 2 + 1, bins);
    bins[0].imag(0.0f);
    bins[p.n / 2].imag(0.0f);
    if (fftwf_alignment_of(out) == fftwf_alignment_of(p.real)) {
        fftwf_execute_dft_c2r(p.realInverse, p.spectrum, out);
        return;
    }
    fftwf_execute(p.realInverse);
    std::copy_n(p.real, p.n, out);
}

void FftwBackend::ForwardComplex(const Complex* in, Complex* out) noexcept {
    Plans& p = *m_plans;
    std::copy_n(in, p.n, reinterpret_cast<Complex*>(p.complexIn));
    fftwf_execute(p.complexForward);
    std::copy_n(reinterpret_cast<const Complex*>(p.complexOut), p.n, out);
}

void FftwBackend::InverseComplex(const Complex* in, Complex* out) noexcept {
    Plans& p = *m_plans;
    std::copy_n(in, p.n, reinterpret_cast<Complex*>(p.complexIn));
    fftwf_execute(p.complexInverse);
    std::copy_n(reinterpret_cast<const Complex*>(p.complexOut), p.n, out);
}

#else

struct FftwBackend::Plans {};

bool FftwBackend::IsAvailable() { return false; }
FftwBackend::FftwBackend(std::size_t) { throw std::runtime_error("built without FFTW"); }
FftwBackend::~FftwBackend() = default;
void FftwBackend::ForwardReal(const float*, Complex*) noexcept {}
void FftwBackend::InverseReal(const Complex*, float*) noexcept {}
void FftwBackend::ForwardComplex(const Complex*, Complex*) noexcept {}
void FftwBackend::InverseComplex(const Complex*, Complex*) noexcept {}

#endif

}  // namespace ora::fft
