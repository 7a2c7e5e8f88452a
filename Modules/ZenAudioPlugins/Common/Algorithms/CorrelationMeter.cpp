#include "CorrelationMeter.h"

#include <QCoreApplication>
#include <algorithm>
#include <cfloat>
#include <cmath>

CorrelationMeter::CorrelationMeter() : ZenAudioAlgorithm(Definitions()) {
    SetParameter(kTime, GetParameter(kTime));
}

const zen::ParameterTableDefinition& CorrelationMeter::Definitions() {
    static const zen::ParameterTableDefinition table = zen::MakeParameterTable(
        "CorrelationMeter", {
                                zen::LogarithmicParameter("TIME", QT_TRANSLATE_NOOP("CorrelationMeter", "Time"), 10.0f,
                                                          5000.0f, 300.0f, 1.0f, "ms"),
                            });
    return table;
}

bool CorrelationMeter::Prepare(float sampleRate, std::uint32_t maxBlock) {
    ZenAudioAlgorithm::Prepare(sampleRate, maxBlock);
    Reset();
    return true;
}

bool CorrelationMeter::SetParameter(std::uint64_t index, float value) {
    if (!ZenAudioAlgorithm::SetParameter(index, value)) return false;
    if (index == kTime) m_a = std::exp(-1.0 / (GetSampleRate() * static_cast<double>(value) / 1000.0));
    return true;
}

void CorrelationMeter::Reset() {
    m_ll = m_rr = m_lr = 0.0;
    m_sumLl = m_sumRr = m_sumLr = 0.0;
    m_frames = 0;
}

bool CorrelationMeter::Process(float* const* channels, std::uint64_t count) {
    if (GetChannelCount() != 2) return GetChannelCount() == 0;
    const float* left = channels[0];
    const float* right = channels[1];
    const double a = m_a;
    const double b = 1.0 - a;
    double ll = m_ll, rr = m_rr, lr = m_lr;
    double sumLl = m_sumLl, sumRr = m_sumRr, sumLr = m_sumLr;
    for (std::uint64_t n = 0; n < count; ++n) {
        const double l = std::fabs(left[n]) <= FLT_MAX ? left[n] : 0.0f;
        const double r = std::fabs(right[n]) <= FLT_MAX ? right[n] : 0.0f;
        ll = a * ll + b * (l * l);
        rr = a * rr + b * (r * r);
        lr = a * lr + b * (l * r);
        sumLl += l * l;
        sumRr += r * r;
        sumLr += l * r;
    }
    m_ll = ll, m_rr = rr, m_lr = lr;
    m_sumLl = sumLl, m_sumRr = sumRr, m_sumLr = sumLr;
    m_frames += count;
    return true;
}

CorrelationMeter::Image CorrelationMeter::Overall() const {
    if (m_frames == 0) return {};
    const auto n = static_cast<double>(m_frames);
    return ImageOf(m_sumLl / n, m_sumRr / n, m_sumLr / n);
}

CorrelationMeter::Image CorrelationMeter::ImageOf(double ll, double rr, double lr) {
    Image image;
    image.leftRms = std::sqrt(ll);
    image.rightRms = std::sqrt(rr);
    image.midRms = std::sqrt(std::max(0.0, (ll + 2.0 * lr + rr) / 4.0));
    image.sideRms = std::sqrt(std::max(0.0, (ll - 2.0 * lr + rr) / 4.0));
    if (ll > kSilentPower && rr > kSilentPower) image.correlation = std::clamp(lr / std::sqrt(ll * rr), -1.0, 1.0);
    if (ll + rr > kSilentPower) image.balance = (rr - ll) / (rr + ll);
    return image;
}
