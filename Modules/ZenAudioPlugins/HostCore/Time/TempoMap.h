// The session's time domain: samples <-> seconds <-> bars and beats, with
// tempo changes at any beat and meter changes at bar lines. Tempo counts
// quarter notes per minute; a beat is one note of the meter's denominator.
//
// Positions between samples stay exact: a tempo change may fall between two
// samples, and BarBeatToSample gives that fractional position. A sample
// taken to bars and beats and back is the same sample (NearestSample).
#pragma once

#include <cstdint>
#include <vector>

namespace zen::host {

struct Meter {
    int numerator = 4;
    int denominator = 4;  // 1, 2, 4, 8, 16 or 32
};

// Bar and beat count from 1; fraction is the part of the beat, 0 <= f < 1.
struct BarBeat {
    std::int64_t bar = 1;
    int beat = 1;
    double fraction = 0.0;
};

class TempoMap {
public:
    static constexpr double kMinimumTempo = 1.0;  // quarter notes per minute
    static constexpr double kMaximumTempo = 1000.0;
    static constexpr int kMaximumNumerator = 64;

    // Throws HostError for a rate, tempo or meter out of range.
    explicit TempoMap(double sampleRate, double quartersPerMinute = 120.0, Meter meter = {});

    // From (bar, beat) on; a change at the same place replaces the old one.
    // Throws HostError for a beat the bar does not have or a tempo out of
    // range. Bar 1 beat 1 sets the initial tempo.
    void SetTempo(std::int64_t bar, int beat, double quartersPerMinute);
    // From the start of `bar` on. Tempo changes keep their bar and beat.
    void SetMeter(std::int64_t bar, Meter meter);

    double SampleRate() const { return m_sampleRate; }
    double SamplesToSeconds(double samples) const { return samples / m_sampleRate; }
    double SecondsToSamples(double seconds) const { return seconds * m_sampleRate; }

    BarBeat SampleToBarBeat(double sample) const;
    double BarBeatToSample(const BarBeat& position) const;
    std::int64_t NearestSample(const BarBeat& position) const;
    BarBeat SecondsToBarBeat(double seconds) const { return SampleToBarBeat(SecondsToSamples(seconds)); }
    double BarBeatToSeconds(const BarBeat& position) const { return SamplesToSeconds(BarBeatToSample(position)); }

    double TempoAt(double sample) const;
    Meter MeterAt(std::int64_t bar) const;

private:
    struct MeterSegment {
        std::int64_t bar;
        Meter meter;
        double quarter;  // quarter notes from bar 1 to this bar line
    };
    struct TempoSegment {
        std::int64_t bar;
        int beat;
        double quartersPerMinute;
        double quarter = 0.0;  // derived
        double sample = 0.0;   // derived
    };

    static void CheckMeter(Meter meter);
    static void CheckTempo(double quartersPerMinute);
    const MeterSegment& MeterSegmentOfBar(std::int64_t bar) const;
    double QuarterOf(std::int64_t bar, int beat, double fraction) const;
    double SamplesPerQuarter(const TempoSegment& segment) const;
    void Rebuild();

    double m_sampleRate;
    std::vector<MeterSegment> m_meters;  // by bar, the first at bar 1
    std::vector<TempoSegment> m_tempos;  // by position, the first at bar 1 beat 1
};

}  // namespace zen::host
