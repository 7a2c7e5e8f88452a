#include "FFT/Plugins/RtPghi.h"

#include <algorithm>
#include <cmath>

#include "FFT/PhaseMath.h"

namespace ora::fft {

bool RtPghi::Configure(Frame& frame, const Context& context) {
    m_bins = context.bins;
    m_heap.assign(2 * context.bins + 2, Entry{0.0f, 0, false});
    m_order.assign(context.bins, 0);
    m_done.assign(context.bins, 0);
    m_prevMag.Resize(context.rows * context.bins);
    for (variable v : {variable::SFEAT, variable::PHASE_IN, variable::TGRAD, variable::FGRAD_LEFT,
                       variable::FGRAD_RIGHT, variable::PHASE_START})
        if (!frame.RequireVector(v, type::FREQ_REAL_VECTOR, context.rows, context.bins)) return false;
    return true;
}

void RtPghi::Reset() noexcept { m_prevMag.Clear(); }

void RtPghi::SetLog10Tolerance(float log10Tol) { m_tolerance = std::pow(10.0f, log10Tol); }

void RtPghi::HeapPush(Entry e) noexcept {
    std::size_t i = m_heapSize++;
    while (i > 0) {
        const std::size_t parent = (i - 1) / 2;
        if (!(m_heap[parent].magnitude < e.magnitude)) break;
        m_heap[i] = m_heap[parent];
        i = parent;
    }
    m_heap[i] = e;
}

RtPghi::Entry RtPghi::HeapPop() noexcept {
    const Entry top = m_heap[0];
    const Entry last = m_heap[--m_heapSize];
    std::size_t i = 0;
    for (;;) {
        std::size_t child = 2 * i + 1;
        if (child >= m_heapSize) break;
        if (child + 1 < m_heapSize && m_heap[child].magnitude < m_heap[child + 1].magnitude) ++child;
        if (!(last.magnitude < m_heap[child].magnitude)) break;
        m_heap[i] = m_heap[child];
        i = child;
    }
    m_heap[i] = last;
    return top;
}

void RtPghi::ProcessRow(std::size_t row, const float* mag, const float* phase, const float* tgrad, const float* left,
                        const float* right, float* psi, double hop) noexcept {
    const std::size_t bins = m_bins;
    float* prevMag = m_prevMag.data() + row * bins;
    const float tol = m_tolerance * *std::max_element(mag, mag + bins);

    std::size_t remaining = 0;
    m_heapSize = 0;
    for (std::size_t k = 0; k < bins; ++k) {
        if (mag[k] > tol) {
            m_done[k] = 0;
            m_order[remaining++] = static_cast<std::int32_t>(k);
            if (prevMag[k] > tol) HeapPush({prevMag[k], static_cast<std::int32_t>(k), true});
        } else {
            m_done[k] = 1;
        }
    }
    std::sort(m_order.begin(), m_order.begin() + static_cast<std::ptrdiff_t>(remaining),
              [mag](std::int32_t a, std::int32_t b) { return mag[a] > mag[b]; });
    const std::size_t significant = remaining;
    std::size_t next = 0;  // strongest coefficient not reached yet, for fresh starts

    while (remaining > 0) {
        if (m_heapSize == 0) {
            while (next < significant && m_done[static_cast<std::size_t>(m_order[next])]) ++next;
            const auto k = static_cast<std::size_t>(m_order[next]);
            psi[k] = phase[k];
            m_done[k] = 1;
            --remaining;
            HeapPush({mag[k], static_cast<std::int32_t>(k), false});
            continue;
        }
        const Entry e = HeapPop();
        const auto k = static_cast<std::size_t>(e.bin);
        if (e.previous) {
            if (m_done[k]) continue;
            psi[k] = static_cast<float>(Princarg(psi[k] + hop * tgrad[k]));
            m_done[k] = 1;
            --remaining;
            HeapPush({mag[k], e.bin, false});
            continue;
        }
        if (k + 1 < bins && !m_done[k + 1]) {
            psi[k + 1] = static_cast<float>(Princarg(static_cast<double>(psi[k]) + right[k]));
            m_done[k + 1] = 1;
            --remaining;
            HeapPush({mag[k + 1], e.bin + 1, false});
        }
        if (k > 0 && !m_done[k - 1]) {
            psi[k - 1] = static_cast<float>(Princarg(static_cast<double>(psi[k]) - left[k]));
            m_done[k - 1] = 1;
            --remaining;
            HeapPush({mag[k - 1], e.bin - 1, false});
        }
    }
    for (std::size_t k = 0; k < bins; ++k)
        if (!(mag[k] > tol)) psi[k] = phase[k];
    std::copy(mag, mag + bins, prevMag);
}

void RtPghi::Process(Frame& frame, Context& context) noexcept {
    if (!m_enabled) return;
    const float* mag = frame.Real(variable::SFEAT, type::FREQ_REAL_VECTOR);
    const float* phase = frame.Real(variable::PHASE_IN, type::FREQ_REAL_VECTOR);
    const float* tgrad = frame.Real(variable::TGRAD, type::FREQ_REAL_VECTOR);
    const float* left = frame.Real(variable::FGRAD_LEFT, type::FREQ_REAL_VECTOR);
    const float* right = frame.Real(variable::FGRAD_RIGHT, type::FREQ_REAL_VECTOR);
    float* psi = frame.Real(variable::PHASE_START, type::FREQ_REAL_VECTOR);
    if (!mag || !phase || !tgrad || !left || !right || !psi) return;
    const std::size_t bins = context.bins;
    for (std::size_t r = context.FirstReconstructedRow(); r < context.EndReconstructedRow(); ++r) {
        const std::size_t o = r * bins;
        if (context.frameIndex == 0) {
            std::copy(phase + o, phase + o + bins, psi + o);
            std::copy(mag + o, mag + o + bins, m_prevMag.data() + o);
            continue;
        }
        ProcessRow(r, mag + o, phase + o, tgrad + o, left + o, right + o, psi + o,
                   static_cast<double>(context.synthesisHop));
    }
}

}  // namespace ora::fft
