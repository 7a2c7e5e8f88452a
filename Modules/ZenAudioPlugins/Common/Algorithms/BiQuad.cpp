#include "BiQuad.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

namespace {

constexpr double kPi = 3.141592653589793;
// Added to and taken from the stored state: values that would turn denormal vanish.
constexpr double kDenormalGuard = 1e-18;
constexpr double kDefaultQ = 0.333333333;

// A first-order section (n0 + n1 z^-1) / (d0 + d1 z^-1).
struct FirstOrder {
    double n0 = 1.0, n1 = 0.0, d0 = 1.0, d1 = 0.0;
};

}  // namespace

BiQuad::BiQuad() : ZenAudioAlgorithm(Definitions()) {
    SetChannelCount(1);
    // The design record follows the parameters' defaults from the start.
    for (std::uint64_t i = 0; i < GetParameterCount(); ++i) SetParameter(i, GetParameter(i));
}

const zen::ParameterTableDefinition& BiQuad::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "BiQuad", {
                      zen::SwitchParameter("IN", QT_TRANSLATE_NOOP("BiQuad", "In"), 0.0f),
                      zen::ListParameter("SHAPE", QT_TRANSLATE_NOOP("BiQuad", "Shape"),
                                         {QT_TRANSLATE_NOOP("BiQuad", "LPF"), QT_TRANSLATE_NOOP("BiQuad", "HPF"),
                                          QT_TRANSLATE_NOOP("BiQuad", "LShelf"), QT_TRANSLATE_NOOP("BiQuad", "HShelf"),
                                          QT_TRANSLATE_NOOP("BiQuad", "Bell")},
                                         4.0f),
                      zen::ContinuousParameter("GAIN", QT_TRANSLATE_NOOP("BiQuad", "Gain"), -18.0f, 18.0f, 0.0f,
                                               0.1f, "dB"),
                      zen::LogarithmicParameter("FREQ", QT_TRANSLATE_NOOP("BiQuad", "Freq"), 20.0f, 22000.0f,
                                                1000.0f, 1.0f, "Hz"),
                      zen::ContinuousParameter("Q", QT_TRANSLATE_NOOP("BiQuad", "Q"), 0.1f, 15.0f, 1.5f, 1.0f),
                  });
    return table;
}

bool BiQuad::Prepare(float sampleRate, std::uint32_t maxBlock) {
    m_coefficients = Coefficients{};
    m_q = kDefaultQ;
    m_gain = 1.0;
    m_f1 = 0.0;
    m_g1 = 1.0;
    m_f2 = 0.0;
    m_g2 = 1.0;
    SetSampleRate(static_cast<std::uint32_t>(sampleRate));
    SetMaxBlockSize(maxBlock);
    for (std::uint64_t i = 0; i < GetParameterCount(); ++i) SetParameter(i, GetParameter(i));
    return true;
}

void BiQuad::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    m_states.resize(channels);
}

bool BiQuad::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    switch (index) {
        case kIn: {
            const bool enabled = value == 1.0f;  // exactly 1: 0.999 is off
            if (enabled != m_enabled) Reset();
            m_enabled = enabled;
            break;
        }
        case kShape: {
            static const std::int32_t kTypes[] = {kLowPassType, kHighPassType, kLowShelfType, kHighShelfType,
                                                  kBellType};
            const auto shape = static_cast<std::int64_t>(value);
            m_type = shape >= 0 && shape <= 4 ? kTypes[shape] : kWire;
            break;
        }
        case kGain: m_gain = std::pow(10.0, static_cast<double>(value) / 20.0); break;
        case kFreq: m_frequency = value; break;
        case kQ: m_q = value; break;
        default: break;
    }
    Design();
    return true;
}

void BiQuad::SetShelfPair(double f1, double g1, double f2, double g2) {
    m_type = kShelfPair;
    m_f1 = f1;
    m_g1 = g1;
    m_f2 = f2;
    m_g2 = g2;
    Design();
}

void BiQuad::SetBandPass(double frequency, double q) {
    m_type = kBandPassType;
    m_frequency = frequency;
    m_q = q;
    Design();
}

void BiQuad::Design() {
    Coefficients c;  // the wire
    const double fs = GetSampleRate();
    const double f = m_frequency;
    const double K = std::tan(kPi * f / fs);
    // The bell and the band-pass warp Q with the bandwidth's upper edge.
    auto warpedQ = [&] { return 0.5 * K / (K - std::tan((1.0 - 0.5 / m_q) * kPi * f / fs)); };

    if (m_enabled) {
        switch (m_type) {
            case kLowPassType:
            case kHighPassType: {
                const double q = m_q;
                const double D = q * K * K + K + q;
                c.g = m_type == kLowPassType ? q * K * K / D : q / D;
                c.c0 = (K - q * K * K - q) / D;
                c.c1 = 2.0 * q * (1.0 - K * K) / D;
                c.c2 = 1.0;
                c.c3 = m_type == kLowPassType ? 2.0 : -2.0;
                break;
            }
            case kBandPassType: {
                const double q = warpedQ();
                const double D = q * K + K + q;  // q*K, not q*K*K
                c.g = K / D;
                c.c0 = (K - q * K * K - q) / D;
                c.c1 = 2.0 * q * (1.0 - K * K) / D;
                c.c2 = -1.0;
                c.c3 = 0.0;
                break;
            }
            case kBellType: {
                const double q = warpedQ();
                const double G = m_gain;
                const double A = std::sqrt(std::fabs(G));
                const double Da = A * q * K * K + K + A * q;
                const double Db = q * K * K + A * K + q;
                c.c0 = (K - A * q * K * K - A * q) / Da;
                c.c1 = 2.0 * q * A * (1.0 - K * K) / Da;
                c.c2 = (q * K * K - A * K + q) / Db;
                c.c3 = 2.0 * q * (K * K - 1.0) / Db;
                c.g = (G * K + A * q * K * K + A * q) / Da;
                break;
            }
            case kLowShelfType: {
                if (m_gain == 1.0) break;
                const double q = m_q;
                const double G = std::fabs(m_gain);
                const double A = std::sqrt(G);
                const double k = G > 1.0 ? K / A : K;  // boost only
                const double Da = q * k * k + k + q;
                const double Db = A * k + q * G * k * k + q;
                c.c0 = (k - q * k * k - q) / Da;
                c.c1 = 2.0 * q * (1.0 - k * k) / Da;
                c.c2 = (q * G * k * k - A * k + q) / Db;
                c.c3 = 2.0 * q * (G * k * k - 1.0) / Db;
                c.g = Db / Da;
                break;
            }
            case kHighShelfType: {
                if (m_gain == 1.0) break;
                const double q = m_q;
                // The shelf gain is capped by the squared ratio of Nyquist to f.
                const double L = std::min(std::fabs(m_gain), (fs / (2.0 * f)) * (fs / (2.0 * f)));
                const double B = std::sqrt(L);
                const double k = L < 1.0 ? K / B : K;  // cut only
                const double Db = q * k * k + k + q;
                const double Da = q * L * k * k + B * k + q;
                c.c2 = (q * k * k - k + q) / Db;
                c.c3 = 2.0 * q * (k * k - 1.0) / Db;
                c.c0 = (B * k - q * L * k * k - q) / Da;
                c.c1 = 2.0 * q * (1.0 - L * k * k) / Da;
                c.g = L * Db / Da;
                break;
            }
            case kShelfPair: {
                if (m_g1 == 1.0 && m_g2 == 1.0) break;
                FirstOrder low, high;
                if (m_g1 != 1.0 && m_f1 > 0.0) {
                    // (s + G w) / (s + w): G at DC, unity above f1.
                    const double G = std::fabs(m_g1);
                    double k = std::tan(kPi * m_f1 / fs);
                    if (G > 1.0) k /= G;
                    low = {1.0 + G * k, G * k - 1.0, 1.0 + k, k - 1.0};
                }
                if (m_g2 != 1.0 && m_f2 > 0.0) {
                    // (G s + w) / (s + w): unity at DC, G toward Nyquist.
                    const double G = std::min(std::fabs(m_g2), fs / (2.0 * m_f2));
                    double k = std::tan(kPi * m_f2 / fs);
                    if (G < 1.0) k /= G;
                    high = {G + k, k - G, 1.0 + k, k - 1.0};
                }
                const double b0 = low.n0 * high.n0, b1 = low.n0 * high.n1 + low.n1 * high.n0, b2 = low.n1 * high.n1;
                const double a0 = low.d0 * high.d0, a1 = low.d0 * high.d1 + low.d1 * high.d0, a2 = low.d1 * high.d1;
                c.g = b0 / a0;
                c.c0 = -a2 / a0;
                c.c1 = -a1 / a0;
                c.c2 = b2 / b0;
                c.c3 = b1 / b0;
                break;
            }
            default: break;
        }
    }
    m_coefficients = c;
}

void BiQuad::ProcessRun(State& state, const float* in, float* out, std::uint64_t count) const noexcept {
    const Coefficients c = m_coefficients;
    double w1 = state.w1, w2 = state.w2;
    for (std::uint64_t i = 0; i < count; ++i) {
        const double w = c.g * static_cast<double>(in[i]) + c.c0 * w2 + c.c1 * w1;
        const double y = w + c.c2 * w2 + c.c3 * w1;
        w2 = w1;
        w1 = (w + kDenormalGuard) - kDenormalGuard;
        out[i] = static_cast<float>(y);
    }
    // A non-finite input would otherwise ring in the state forever.
    if (!std::isfinite(w1) || !std::isfinite(w2)) w1 = w2 = 0.0;
    state.w1 = w1;
    state.w2 = w2;
}

bool BiQuad::ProcessChannel(std::uint64_t channel, float* samples, std::uint64_t count) {
    if (channel >= m_states.size()) {
        std::fill(samples, samples + count, 0.0f);
        return true;
    }
    ProcessRun(m_states[channel], samples, samples, count);
    return true;
}

bool BiQuad::Process(float* const* channels, std::uint64_t count) { return Process(channels, channels, count); }

void BiQuad::ProcessPair(State& left, State& right, const float* const* in, float* const* out,
                         std::uint64_t count) const noexcept {
    // Two recursions side by side: each waits on its own last value, so the
    // processor runs them in parallel.
    const Coefficients c = m_coefficients;
    double l1 = left.w1, l2 = left.w2, r1 = right.w1, r2 = right.w2;
    for (std::uint64_t i = 0; i < count; ++i) {
        const double wl = c.g * static_cast<double>(in[0][i]) + c.c0 * l2 + c.c1 * l1;
        const double wr = c.g * static_cast<double>(in[1][i]) + c.c0 * r2 + c.c1 * r1;
        const double yl = wl + c.c2 * l2 + c.c3 * l1;
        const double yr = wr + c.c2 * r2 + c.c3 * r1;
        l2 = l1;
        r2 = r1;
        l1 = (wl + kDenormalGuard) - kDenormalGuard;
        r1 = (wr + kDenormalGuard) - kDenormalGuard;
        out[0][i] = static_cast<float>(yl);
        out[1][i] = static_cast<float>(yr);
    }
    if (!std::isfinite(l1) || !std::isfinite(l2)) l1 = l2 = 0.0;
    if (!std::isfinite(r1) || !std::isfinite(r2)) r1 = r2 = 0.0;
    left = {l1, l2};
    right = {r1, r2};
}

bool BiQuad::Process(float* const* in, float* const* out, std::uint64_t count) {
    if (out == nullptr) out = in;
    if (GetChannelCount() == 2 && m_states.size() == 2) {
        ProcessPair(m_states[0], m_states[1], in, out, count);
        return true;
    }
    for (std::uint64_t c = 0; c < GetChannelCount(); ++c) {
        if (c >= m_states.size()) std::fill(out[c], out[c] + count, 0.0f);
        else ProcessRun(m_states[c], in[c], out[c], count);
    }
    return true;
}

void BiQuad::Reset() {
    for (State& s : m_states) s = State{};
}
