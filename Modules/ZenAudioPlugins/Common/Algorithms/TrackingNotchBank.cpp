#include "TrackingNotchBank.h"

#include <QCoreApplication>
#include <algorithm>
#include <cmath>

namespace {

constexpr double kTwoPi = 6.283185307179586;

}  // namespace

TrackingNotchBank::TrackingNotchBank() : ZenAudioAlgorithm(Definitions()) {
    SetChannelCount(1);
    Redesign();
}

const zen::ParameterTableDefinition& TrackingNotchBank::Definitions() {
    using namespace zen;
    static const ParameterTableDefinition table = MakeParameterTable(
        "TrackingNotchBank",
        {
            ContinuousParameter("FUNDAMENTAL", QT_TRANSLATE_NOOP("TrackingNotchBank", "Fundamental"), 40.0f, 70.0f,
                                50.0f, 0.01f, "Hz"),
            ContinuousParameter("HARMONICS", QT_TRANSLATE_NOOP("TrackingNotchBank", "Harmonics"), 1.0f,
                                static_cast<float>(kMaxHarmonics), 10.0f, 1.0f),
            ContinuousParameter("WIDTH", QT_TRANSLATE_NOOP("TrackingNotchBank", "Width"), 0.1f, 10.0f, 1.0f, 0.01f,
                                "Hz"),
            SwitchParameter("TRACKING", QT_TRANSLATE_NOOP("TrackingNotchBank", "Tracking"), 1.0f),
        });
    return table;
}

bool TrackingNotchBank::Prepare(float sampleRate, std::uint32_t maxBlock) {
    m_scratch.assign(m_channels.size() * std::max<std::uint32_t>(1, maxBlock), 0.0f);
    m_in.assign(m_channels.size(), nullptr);
    m_hum.assign(m_channels.size(), nullptr);
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Redesign();
    Reset();
    return true;
}

void TrackingNotchBank::SetChannelCount(std::uint64_t channels) {
    ZenAudioAlgorithm::SetChannelCount(channels);
    m_channels.resize(channels);
}

bool TrackingNotchBank::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    switch (index) {
        case kFundamental:
            // The same value again leaves the tracking where it is.
            if (value == m_nominal) break;
            m_nominal = value;
            SetFrequency(value);
            m_frequencyRate = 0.0;
            break;
        case kHarmonics:
            m_harmonics = static_cast<std::size_t>(std::clamp<long>(std::lround(value), 1, kMaxHarmonics));
            // A harmonic taken up again starts from nothing, not from what it once learnt.
            for (ChannelState& c : m_channels)
                for (std::size_t k = m_harmonics; k < kMaxHarmonics; ++k) c.weight[k] = c.previous[k] = 0.0;
            break;
        case kWidth: m_width = value; break;
        case kTracking:
            if (m_tracking == (value == 1.0f)) break;
            m_tracking = value == 1.0f;
            if (!m_tracking) SetFrequency(m_nominal);
            m_frequencyRate = 0.0;
            break;
        default: break;
    }
    Redesign();
    return true;
}

void TrackingNotchBank::Redesign() {
    const double rate = GetSampleRate();
    // A canceller of step a is a one-pole low-pass of bandwidth a fs / 2 pi
    // around its harmonic: half the notch's width.
    for (std::size_t k = 0; k < kMaxHarmonics; ++k)
        m_step[k] = kTwoPi * 0.5 * m_width * static_cast<double>(k + 1) / rate;
}

void TrackingNotchBank::SetFrequency(double hertz) {
    m_frequency = hertz;
    const double w = kTwoPi * hertz / GetSampleRate();
    m_rotation = {std::cos(w), std::sin(w)};
}

void TrackingNotchBank::Reset() {
    for (ChannelState& c : m_channels) c = ChannelState{};
    m_phasor = {1.0, 0.0};
    m_frequencyRate = 0.0;
    m_sinceUpdate = 0;
    SetFrequency(m_nominal);
}

void TrackingNotchBank::UpdateFrequency() noexcept {
    // Each harmonic's turn since the last update, as a fundamental's
    // frequency error, weighted by how strong the harmonic is.
    double sum = 0.0, weights = 0.0;
    for (std::size_t k = 0; k < m_harmonics; ++k) {
        std::complex<double> turn = 0.0;
        for (ChannelState& c : m_channels) {
            turn += c.weight[k] * std::conj(c.previous[k]);
            c.previous[k] = c.weight[k];
        }
        const double weight = std::abs(turn);
        if (weight > 0.0) {
            sum += std::arg(turn) / static_cast<double>(k + 1) * weight;
            weights += weight;
        }
    }
    m_phasor /= std::abs(m_phasor);  // keep the oscillator on the unit circle
    if (!m_tracking || !(weights > 1e-20)) return;
    const double error = sum / weights * GetSampleRate() / (kTwoPi * kUpdateInterval);
    m_frequencyRate += kLoopRateGain * error;
    double next = m_frequency + kLoopGain * error + m_frequencyRate;
    if (next < m_nominal - kTrackingRange || next > m_nominal + kTrackingRange) {
        next = std::clamp(next, m_nominal - kTrackingRange, m_nominal + kTrackingRange);
        m_frequencyRate = 0.0;
    }
    SetFrequency(next);
}

std::complex<double> TrackingNotchBank::HumTransfer(double frequency, double fundamental) const {
    const double rate = GetSampleRate();
    const std::complex<double> z1 = std::polar(1.0, -kTwoPi * frequency / rate);
    const std::complex<double> z2 = z1 * z1;
    std::complex<double> g = 0.0;
    for (std::size_t k = 0; k < m_harmonics; ++k) {
        const double c = std::cos(kTwoPi * fundamental * static_cast<double>(k + 1) / rate);
        g += m_step[k] * (2.0 * c * z1 - 2.0 * z2) / (1.0 - 2.0 * c * z1 + z2);
    }
    // On a harmonic itself the canceller's gain is infinite: all of it is hum.
    if (!std::isfinite(g.real()) || !std::isfinite(g.imag())) return 1.0;
    return g / (1.0 + g);
}

void TrackingNotchBank::EstimateHum(const float* const* input, float* const* hum, std::uint64_t count) noexcept {
    const std::size_t harmonics = m_harmonics;
    std::array<std::complex<double>, kMaxHarmonics> reference;
    for (std::uint64_t i = 0; i < count; ++i) {
        reference[0] = m_phasor;
        for (std::size_t k = 1; k < harmonics; ++k) reference[k] = reference[k - 1] * m_phasor;
        for (std::size_t c = 0; c < m_channels.size(); ++c) {
            ChannelState& state = m_channels[c];
            double x = input[c][i];
            // Non-finite samples teach nothing; huge ones no more than the limit.
            if (!std::isfinite(x)) x = 0.0;
            x = std::clamp(x, -kInputLimit, kInputLimit);
            double estimate = 0.0;
            for (std::size_t k = 0; k < harmonics; ++k)
                estimate += 2.0 * (state.weight[k].real() * reference[k].real() -
                                   state.weight[k].imag() * reference[k].imag());
            const double error = x - estimate;
            for (std::size_t k = 0; k < harmonics; ++k) {
                const std::complex<double> back = std::conj(reference[k]);
                state.weight[k] += m_step[k] * error * back;
            }
            hum[c][i] = static_cast<float>(estimate);
        }
        m_phasor *= m_rotation;
        if (++m_sinceUpdate == kUpdateInterval) {
            m_sinceUpdate = 0;
            UpdateFrequency();
        }
    }
}

bool TrackingNotchBank::Process(float* const* channels, std::uint64_t count) {
    const std::size_t block = m_scratch.size() / std::max<std::size_t>(1, m_channels.size());
    if (block == 0) return m_channels.empty();
    for (std::uint64_t done = 0; done < count; done += block) {
        const std::uint64_t n = std::min<std::uint64_t>(block, count - done);
        for (std::size_t c = 0; c < m_channels.size(); ++c) {
            m_in[c] = channels[c] + done;
            m_hum[c] = m_scratch.data() + c * block;
        }
        EstimateHum(m_in.data(), m_hum.data(), n);
        for (std::size_t c = 0; c < m_channels.size(); ++c)
            for (std::uint64_t i = 0; i < n; ++i) channels[c][done + i] -= m_hum[c][i];
    }
    return true;
}
