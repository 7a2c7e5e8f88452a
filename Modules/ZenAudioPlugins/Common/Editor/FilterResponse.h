// The response of a cascade of second-order sections and a gain, from the
// coefficients a filter runs with: BiQuad's design record, the crossover's
// sections, or raw b0..a2. Displays take the designs from the algorithms
// themselves, so the drawn curve is the filter that runs.
#pragma once

#include <QPointF>
#include <complex>
#include <cstddef>
#include <vector>

#include "Algorithms/simd/BiquadPairKernels.h"
#include "Common/Algorithms/BiQuad.h"

class LinkwitzRileyCrossover;

class FilterResponse {
public:
    // H(z) = (b0 + b1 z^-1 + b2 z^-2) / (1 + a1 z^-1 + a2 z^-2).
    struct Section {
        double b0 = 1.0, b1 = 0.0, b2 = 0.0, a1 = 0.0, a2 = 0.0;
    };

    static Section FromBiQuad(const BiQuad::Coefficients& c);
    static Section FromLanes(const ora::numeric::BiquadSection& c);
    static Section Raw(double b0, double b1, double b2, double a0, double a1, double a2);

    explicit FilterResponse(double sampleRate) : m_sampleRate(sampleRate) {}

    FilterResponse& Add(const Section& section);
    FilterResponse& Add(const BiQuad::Coefficients& c) { return Add(FromBiQuad(c)); }
    FilterResponse& Add(const ora::numeric::BiquadSection& c) { return Add(FromLanes(c)); }
    // Sections `count` times over (a Linkwitz-Riley half is a Butterworth squared).
    FilterResponse& Add(const Section& section, int count);
    FilterResponse& AddGainDb(double db);

    double SampleRate() const { return m_sampleRate; }
    std::size_t SectionCount() const { return m_sections.size(); }

    std::complex<double> At(double frequency) const;
    double MagnitudeDb(double frequency) const;
    // (frequency, dB) at each frequency, for a curve display.
    std::vector<QPointF> Curve(const std::vector<double>& frequencies) const;

    // Band `band` (0 lowest) of the crossover as it is designed now: the
    // high halves of the splits below it, the low half of its own upper
    // split, and the all-passes of the splits above that it passes to stay
    // in phase with the others.
    static FilterResponse CrossoverBand(const LinkwitzRileyCrossover& crossover, std::size_t band);

private:
    double m_sampleRate;
    double m_gain = 1.0;
    std::vector<Section> m_sections;
};
