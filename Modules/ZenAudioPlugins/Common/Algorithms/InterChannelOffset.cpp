#include "InterChannelOffset.h"

#include <QCoreApplication>
#include <algorithm>
#include <cfloat>
#include <cmath>

#include "PowerOfTwo.h"

namespace {

// Below this mean square (-100 dBFS) a channel has nothing to correlate.
constexpr double kSilentPower = 1e-10;

}  // namespace

InterChannelOffset::InterChannelOffset() : ZenAudioAlgorithm(Definitions()) { SetChannelCount(2); }

const zen::ParameterTableDefinition& InterChannelOffset::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "InterChannelOffset",
        {
            LogarithmicParameter("TIME", QT_TRANSLATE_NOOP("InterChannelOffset", "Time"), 50.0f, 10000.0f, 500.0f,
                                 1.0f, "ms"),
        });
    return table;
}

bool InterChannelOffset::Prepare(float sampleRate, std::uint32_t maxBlock) {
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    m_maxLag = static_cast<std::uint32_t>(std::lround(m_rangeMs * 0.001 * sampleRate));
    m_frame = zen::NextPowerOfTwo(std::max(1u, m_maxLag) * kFramePerLag);
    const std::uint32_t length = 2 * m_frame;  // no wrap within +-m_maxLag
    m_fft = std::make_unique<ora::fft::FFT>(length);
    m_left.assign(m_frame, 0.0f);
    m_right.assign(m_frame, 0.0f);
    m_work.assign(length, 0.0f);
    m_correlation.assign(length, 0.0f);
    m_leftBins.assign(m_fft->Bins(), {});
    m_rightBins.assign(m_fft->Bins(), {});
    m_cross.assign(m_fft->Bins(), {});
    SetParameter(kTime, GetParameter(kTime));
    Reset();
    return true;
}

bool InterChannelOffset::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    if (index == kTime && m_frame > 0)
        m_a = std::exp(-static_cast<double>(m_frame) / (GetSampleRate() * static_cast<double>(value) * 0.001));
    return true;
}

void InterChannelOffset::Reset() {
    m_filled = 0;
    std::fill(m_cross.begin(), m_cross.end(), std::complex<double>{});
    m_leftPower = m_rightPower = 0.0;
    m_estimate = {};
    m_count = 0;
}

bool InterChannelOffset::Process(float* const* channels, std::uint64_t count) {
    if (GetChannelCount() != 2 || m_frame == 0) return false;
    std::uint64_t done = 0;
    while (done < count) {
        const auto n = static_cast<std::uint32_t>(std::min<std::uint64_t>(count - done, m_frame - m_filled));
        for (std::uint32_t i = 0; i < n; ++i) {
            const float l = channels[0][done + i];
            const float r = channels[1][done + i];
            m_left[m_filled + i] = std::fabs(l) <= FLT_MAX ? l : 0.0f;
            m_right[m_filled + i] = std::fabs(r) <= FLT_MAX ? r : 0.0f;
        }
        m_filled += n;
        done += n;
        if (m_filled == m_frame) {
            Analyse();
            m_filled = 0;
        }
    }
    return true;
}

void InterChannelOffset::Analyse() noexcept {
    const std::size_t length = m_work.size();
    std::copy(m_left.begin(), m_left.end(), m_work.begin());
    std::fill(m_work.begin() + m_frame, m_work.end(), 0.0f);
    m_fft->ForwardReal(m_work.data(), m_leftBins.data());
    std::copy(m_right.begin(), m_right.end(), m_work.begin());
    m_fft->ForwardReal(m_work.data(), m_rightBins.data());

    double ll = 0.0, rr = 0.0;
    for (std::uint32_t i = 0; i < m_frame; ++i) {
        ll += double{m_left[i]} * m_left[i];
        rr += double{m_right[i]} * m_right[i];
    }
    // The first frame starts the averages.
    const double a = m_count == 0 ? 0.0 : m_a;
    const double b = 1.0 - a;
    m_leftPower = a * m_leftPower + b * ll / m_frame;
    m_rightPower = a * m_rightPower + b * rr / m_frame;
    for (std::size_t k = 0; k < m_cross.size(); ++k) {
        const std::complex<double> x = std::conj(std::complex<double>(m_leftBins[k])) * std::complex<double>(m_rightBins[k]);
        m_cross[k] = a * m_cross[k] + b * x;
        // Non-finite sums cannot arise from finite frames; guard the average anyway.
        if (!std::isfinite(m_cross[k].real()) || !std::isfinite(m_cross[k].imag())) m_cross[k] = {};
        m_leftBins[k] = ora::fft::Complex(static_cast<float>(m_cross[k].real()), static_cast<float>(m_cross[k].imag()));
    }
    // r[k] = sum l[n] r[n + k] per frame: circular, lag k at index k mod length.
    m_fft->InverseReal(m_leftBins.data(), m_correlation.data());

    Estimate e;
    e.valid = true;
    e.leftPower = m_leftPower;
    e.rightPower = m_rightPower;
    if (m_leftPower > kSilentPower && m_rightPower > kSilentPower) {
        int best = 0;
        float bestMagnitude = -1.0f;
        const int maxLag = static_cast<int>(m_maxLag);
        for (int lag = -maxLag; lag <= maxLag; ++lag) {
            const float v = m_correlation[static_cast<std::size_t>((lag + static_cast<int>(length))) % length];
            if (std::fabs(v) > bestMagnitude) {
                bestMagnitude = std::fabs(v);
                best = lag;
            }
        }
        const double value = m_correlation[static_cast<std::size_t>((best + static_cast<int>(length))) % length];
        // Unscaled inverse: divide by the length, then by the frame for a mean.
        const double product = value / static_cast<double>(length) / m_frame;
        e.lag = best;
        e.correlation = std::clamp(product / std::sqrt(m_leftPower * m_rightPower), -1.0, 1.0);
    }
    m_estimate = e;
    ++m_count;
}
