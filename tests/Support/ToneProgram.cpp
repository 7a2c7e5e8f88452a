#include "Support/ToneProgram.h"

#include <cmath>
#include <numeric>

#include "Support/Signals.h"

namespace zentest {

ToneProgram::ToneProgram(double sampleRate, std::size_t channels, std::vector<ToneSegment> segments, double frequency,
                         double phase)
    : m_channels(channels) {
    const auto rate = static_cast<long>(sampleRate);
    const auto f = static_cast<long>(frequency);
    const auto length = static_cast<std::size_t>(rate / std::gcd(rate, f));
    m_period.resize(length);
    for (std::size_t n = 0; n < length; ++n)
        m_period[n] = static_cast<float>(std::sin(2.0 * kPi * frequency * static_cast<double>(n) / sampleRate + phase));
    for (const ToneSegment& s : segments) {
        m_frames += static_cast<std::size_t>(std::lround(s.seconds * sampleRate));
        m_segmentEnd.push_back(m_frames);
        std::vector<float> gains(channels);
        for (std::size_t c = 0; c < channels; ++c) {
            const double db = s.dbfs.size() == 1 ? s.dbfs[0] : s.dbfs[c];
            gains[c] = std::isfinite(db) ? static_cast<float>(std::pow(10.0, db / 20.0)) : 0.0f;
        }
        m_gains.push_back(gains);
    }
}

std::size_t ToneProgram::Next(std::vector<std::vector<float>>& out, std::size_t n) {
    out.resize(m_channels);
    for (auto& ch : out) ch.assign(n, 0.0f);
    std::size_t segment = 0;
    std::size_t written = 0;
    for (std::size_t i = 0; i < n && m_position < m_frames; ++i, ++m_position, ++written) {
        while (m_position >= m_segmentEnd[segment]) ++segment;
        const float s = m_period[m_position % m_period.size()];
        for (std::size_t c = 0; c < m_channels; ++c) out[c][i] = s * m_gains[segment][c];
    }
    return written;
}

std::vector<std::vector<float>> ToneProgram::All() {
    std::vector<std::vector<float>> out;
    m_position = 0;
    Next(out, m_frames);
    return out;
}

}  // namespace zentest
