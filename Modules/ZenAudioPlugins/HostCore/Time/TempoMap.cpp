#include "TempoMap.h"

#include <algorithm>
#include <cmath>
#include <string>

#include "HostCore/HostError.h"

namespace zen::host {

namespace {

// Beat counts within this of a whole beat are that beat: a bar line reached
// through a tempo's samples lands on the bar, not a hair before it.
constexpr double kBeatSnap = 1e-9;
constexpr double kMinimumSampleRate = 1000.0;
constexpr double kMaximumSampleRate = 1536000.0;

double QuartersPerBar(Meter m) { return 4.0 * m.numerator / m.denominator; }
double QuartersPerBeat(Meter m) { return 4.0 / m.denominator; }

}  // namespace

TempoMap::TempoMap(double sampleRate, double quartersPerMinute, Meter meter) : m_sampleRate(sampleRate) {
    if (!(sampleRate >= kMinimumSampleRate && sampleRate <= kMaximumSampleRate))
        throw HostError("sample rate " + std::to_string(sampleRate) + " Hz is out of range");
    CheckMeter(meter);
    CheckTempo(quartersPerMinute);
    m_meters.push_back({1, meter, 0.0});
    m_tempos.push_back({1, 1, quartersPerMinute});
    Rebuild();
}

void TempoMap::CheckMeter(Meter meter) {
    const int d = meter.denominator;
    const bool powerOfTwo = d >= 1 && d <= 32 && (d & (d - 1)) == 0;
    if (meter.numerator < 1 || meter.numerator > kMaximumNumerator || !powerOfTwo)
        throw HostError("meter " + std::to_string(meter.numerator) + "/" + std::to_string(d) +
                        " is not 1..64 over 1, 2, 4, 8, 16 or 32");
}

void TempoMap::CheckTempo(double quartersPerMinute) {
    if (!(quartersPerMinute >= kMinimumTempo && quartersPerMinute <= kMaximumTempo))
        throw HostError("tempo " + std::to_string(quartersPerMinute) + " is out of range 1 to 1000 per minute");
}

void TempoMap::SetTempo(std::int64_t bar, int beat, double quartersPerMinute) {
    CheckTempo(quartersPerMinute);
    if (bar < 1 || beat < 1 || beat > MeterAt(bar).numerator)
        throw HostError("bar " + std::to_string(bar) + " has no beat " + std::to_string(beat));
    const auto at = std::find_if(m_tempos.begin(), m_tempos.end(),
                                 [&](const TempoSegment& t) { return t.bar == bar && t.beat == beat; });
    if (at != m_tempos.end())
        at->quartersPerMinute = quartersPerMinute;
    else
        m_tempos.push_back({bar, beat, quartersPerMinute});
    Rebuild();
}

void TempoMap::SetMeter(std::int64_t bar, Meter meter) {
    CheckMeter(meter);
    if (bar < 1) throw HostError("bar " + std::to_string(bar) + " is before the first bar");
    // Tempo changes keep their bar and beat, so each must stay inside its bar.
    for (const TempoSegment& t : m_tempos)
        if (t.bar >= bar && t.beat > meter.numerator)
            throw HostError("a tempo change at bar " + std::to_string(t.bar) + " beat " + std::to_string(t.beat) +
                            " would fall outside a bar of " + std::to_string(meter.numerator));
    const auto at = std::find_if(m_meters.begin(), m_meters.end(), [&](const MeterSegment& m) { return m.bar == bar; });
    if (at != m_meters.end())
        at->meter = meter;
    else
        m_meters.push_back({bar, meter, 0.0});
    Rebuild();
}

const TempoMap::MeterSegment& TempoMap::MeterSegmentOfBar(std::int64_t bar) const {
    const auto it = std::upper_bound(m_meters.begin(), m_meters.end(), bar,
                                     [](std::int64_t b, const MeterSegment& m) { return b < m.bar; });
    return it == m_meters.begin() ? m_meters.front() : *(it - 1);
}

Meter TempoMap::MeterAt(std::int64_t bar) const { return MeterSegmentOfBar(bar).meter; }

double TempoMap::QuarterOf(std::int64_t bar, int beat, double fraction) const {
    const MeterSegment& m = MeterSegmentOfBar(bar);
    return m.quarter + static_cast<double>(bar - m.bar) * QuartersPerBar(m.meter) +
           (beat - 1 + fraction) * QuartersPerBeat(m.meter);
}

double TempoMap::SamplesPerQuarter(const TempoSegment& segment) const {
    return m_sampleRate * 60.0 / segment.quartersPerMinute;
}

void TempoMap::Rebuild() {
    std::sort(m_meters.begin(), m_meters.end(),
              [](const MeterSegment& a, const MeterSegment& b) { return a.bar < b.bar; });
    for (std::size_t i = 1; i < m_meters.size(); ++i) {
        const MeterSegment& previous = m_meters[i - 1];
        m_meters[i].quarter =
            previous.quarter + static_cast<double>(m_meters[i].bar - previous.bar) * QuartersPerBar(previous.meter);
    }
    for (TempoSegment& t : m_tempos) t.quarter = QuarterOf(t.bar, t.beat, 0.0);
    std::sort(m_tempos.begin(), m_tempos.end(),
              [](const TempoSegment& a, const TempoSegment& b) { return a.quarter < b.quarter; });
    m_tempos.front().sample = 0.0;
    for (std::size_t i = 1; i < m_tempos.size(); ++i) {
        const TempoSegment& previous = m_tempos[i - 1];
        m_tempos[i].sample = previous.sample + (m_tempos[i].quarter - previous.quarter) * SamplesPerQuarter(previous);
    }
}

BarBeat TempoMap::SampleToBarBeat(double sample) const {
    auto t = std::upper_bound(m_tempos.begin(), m_tempos.end(), sample,
                              [](double s, const TempoSegment& segment) { return s < segment.sample; });
    const TempoSegment& tempo = t == m_tempos.begin() ? m_tempos.front() : *(t - 1);
    const double quarter = tempo.quarter + (sample - tempo.sample) / SamplesPerQuarter(tempo);

    auto m = std::upper_bound(m_meters.begin(), m_meters.end(), quarter + kBeatSnap,
                              [](double q, const MeterSegment& segment) { return q < segment.quarter; });
    const MeterSegment& meter = m == m_meters.begin() ? m_meters.front() : *(m - 1);
    const double beatLength = QuartersPerBeat(meter.meter);
    double beats = (quarter - meter.quarter) / beatLength;  // beats since the meter's first bar line
    const double whole = std::round(beats);
    if (std::fabs(beats - whole) < kBeatSnap) beats = whole;
    const double beatsFloor = std::floor(beats);
    const auto perBar = static_cast<std::int64_t>(meter.meter.numerator);
    const auto beatIndex = static_cast<std::int64_t>(beatsFloor);
    // Floor division, so positions before bar 1 count down from bar 0.
    std::int64_t barOffset = beatIndex / perBar;
    if (beatIndex % perBar != 0 && beatIndex < 0) --barOffset;
    BarBeat position;
    position.bar = meter.bar + barOffset;
    position.beat = static_cast<int>(beatIndex - barOffset * perBar) + 1;
    position.fraction = beats - beatsFloor;
    return position;
}

double TempoMap::BarBeatToSample(const BarBeat& position) const {
    const double quarter = QuarterOf(position.bar, position.beat, position.fraction);
    auto t = std::upper_bound(m_tempos.begin(), m_tempos.end(), quarter,
                              [](double q, const TempoSegment& segment) { return q < segment.quarter; });
    const TempoSegment& tempo = t == m_tempos.begin() ? m_tempos.front() : *(t - 1);
    return tempo.sample + (quarter - tempo.quarter) * SamplesPerQuarter(tempo);
}

std::int64_t TempoMap::NearestSample(const BarBeat& position) const { return std::llround(BarBeatToSample(position)); }

double TempoMap::TempoAt(double sample) const {
    auto t = std::upper_bound(m_tempos.begin(), m_tempos.end(), sample,
                              [](double s, const TempoSegment& segment) { return s < segment.sample; });
    return (t == m_tempos.begin() ? m_tempos.front() : *(t - 1)).quartersPerMinute;
}

}  // namespace zen::host
