#include "FilterResponse.h"

#include <cmath>

#include "Common/Algorithms/LinkwitzRileyCrossover.h"

namespace {

constexpr double kPi = 3.141592653589793;
// Reads for a magnitude of exactly zero (a notch at its centre).
constexpr double kFloorDb = -300.0;

// Both records hold the recursion w = g x + c0 w2 + c1 w1, y = w + c2 w2 + c3 w1.
template <typename Record>
FilterResponse::Section FromRecord(const Record& c) {
    return {c.g, c.g * c.c3, c.g * c.c2, -c.c1, -c.c0};
}

}  // namespace

FilterResponse::Section FilterResponse::FromBiQuad(const BiQuad::Coefficients& c) { return FromRecord(c); }

FilterResponse::Section FilterResponse::FromLanes(const ora::numeric::BiquadSection& c) { return FromRecord(c); }

FilterResponse::Section FilterResponse::Raw(double b0, double b1, double b2, double a0, double a1, double a2) {
    return {b0 / a0, b1 / a0, b2 / a0, a1 / a0, a2 / a0};
}

FilterResponse& FilterResponse::Add(const Section& section) {
    m_sections.push_back(section);
    return *this;
}

FilterResponse& FilterResponse::Add(const Section& section, int count) {
    for (int i = 0; i < count; ++i) m_sections.push_back(section);
    return *this;
}

FilterResponse& FilterResponse::AddGainDb(double db) {
    m_gain *= std::pow(10.0, db / 20.0);
    return *this;
}

std::complex<double> FilterResponse::At(double frequency) const {
    const std::complex<double> z1 = std::polar(1.0, -2.0 * kPi * frequency / m_sampleRate);  // z^-1
    const std::complex<double> z2 = z1 * z1;
    std::complex<double> h = m_gain;
    for (const Section& s : m_sections) h *= (s.b0 + s.b1 * z1 + s.b2 * z2) / (1.0 + s.a1 * z1 + s.a2 * z2);
    return h;
}

double FilterResponse::MagnitudeDb(double frequency) const {
    const double magnitude = std::abs(At(frequency));
    return magnitude > 0.0 ? 20.0 * std::log10(magnitude) : kFloorDb;
}

std::vector<QPointF> FilterResponse::Curve(const std::vector<double>& frequencies) const {
    std::vector<QPointF> points;
    points.reserve(frequencies.size());
    for (double f : frequencies) points.emplace_back(f, MagnitudeDb(f));
    return points;
}

FilterResponse FilterResponse::CrossoverBand(const LinkwitzRileyCrossover& crossover, std::size_t band) {
    const double fs = crossover.GetSampleRate();
    FilterResponse response(fs);
    const std::size_t splits = crossover.GetBandCount() - 1;
    for (std::size_t s = 0; s < splits; ++s) {
        const double f = crossover.GetSplitFrequency(s);
        if (s < band)
            response.Add(FromLanes(LinkwitzRileyCrossover::HighPass(f, fs)), 2);
        else if (s == band)
            response.Add(FromLanes(LinkwitzRileyCrossover::LowPass(f, fs)), 2);
        else
            response.Add(FromLanes(LinkwitzRileyCrossover::AllPass(f, fs)));
    }
    return response;
}
