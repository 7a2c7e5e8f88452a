#include "FFT/Plugins/Dft2Out.h"

#include "FFT/PhaseMath.h"

namespace ora::fft {

namespace {

// out += a * b * scale
void AddProduct(const float* a, const float* b, float scale, float* out, std::size_t n) noexcept {
    std::size_t j = 0;
    for (; j + 4 <= n; j += 4) Store4(out + j, Load4(out + j) + Load4(a + j) * scale * Load4(b + j));
    for (; j < n; ++j) out[j] += a[j] * scale * b[j];
}

}  // namespace

bool Dft2Out::Configure(Frame& frame, const Context& context) {
    return frame.RequireVector(variable::TSIG, type::SIG_REAL_VECTOR, context.channels, context.fftLength) &&
           frame.RequireVector(variable::FSIG, type::FREQ_CPLX_VECTOR, context.channels, context.bins);
}

void Dft2Out::Process(Frame& frame, Context& context) noexcept {
    float* tsig = frame.Real(variable::TSIG, type::SIG_REAL_VECTOR);
    Complex* fsig = frame.Cplx(variable::FSIG, type::FREQ_CPLX_VECTOR);
    if (tsig == nullptr || fsig == nullptr) return;
    const std::size_t n = context.frameLength;
    const std::size_t m = context.fftLength;
    const std::size_t half = n / 2;
    const float* dual = context.window->Dual();
    const float scale = context.gain / static_cast<float>(m);
    for (std::size_t c = 0; c < context.channels; ++c) {
        float* t = tsig + c * m;
        context.fft->InverseReal(fsig + c * context.bins, t);
        float* out = (*context.out)[c].data();
        AddProduct(t + (m - half), dual, scale, out, half);
        AddProduct(t, dual + half, scale, out + half, n - half);
    }
}

}  // namespace ora::fft
