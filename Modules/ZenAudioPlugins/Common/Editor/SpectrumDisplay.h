// A spectrum on a logarithmic frequency axis, from meters: an array meter of
// dB values spread evenly from 0 Hz to half the rate (a noise profile, a
// gain per bin), or the newest record of a spectrum ring (its bin count,
// then the powers, then the held peaks, full scale reading 1). The first
// trace is filled; a second one is drawn over it.
#pragma once

#include <QPointF>
#include <QString>
#include <cstdint>
#include <vector>

#include "CurveDisplay.h"

class SpectrumDisplay : public CurveDisplay {
    Q_OBJECT

public:
    enum class Source {
        Array,      // dB per point, 0 Hz to half the rate
        RingPower,  // spectrum ring record: the powers
        RingPeak,   // spectrum ring record: the held peaks
    };
    struct Trace {
        QString name;
        std::uint32_t meter;
        Source source;
    };

    SpectrumDisplay(const QString& title, double minimumDb, double maximumDb, std::vector<Trace> traces,
                    QWidget* parent = nullptr);

    // `count` dB values spread evenly from 0 Hz to half of `sampleRate`, as
    // points of a logarithmic axis (0 Hz left out).
    static std::vector<QPointF> ArrayPoints(const float* values, std::size_t count, double sampleRate);
    // A spectrum ring record's powers (`peaks` false) or held peaks, in dB.
    static std::vector<QPointF> RecordPoints(const float* record, std::size_t width, bool peaks, double sampleRate);
    // More points than a plot has pixels, merged into kMaxPoints bands even
    // on the logarithmic axis, each at its loudest (so no peak is lost).
    static std::vector<QPointF> Thinned(std::vector<QPointF> points);

    static constexpr std::size_t kMaxPoints = 512;

private:
    struct Reader {
        Trace trace;
        std::uint64_t cursor = 0;
        std::vector<float> values;  // the newest array or record
        bool valid = false;
    };

    void Read(const zen::EditorLink& link);
    bool Drain(const zen::EditorLink& link, Reader& reader);

    std::vector<Reader> m_readers;
    std::vector<float> m_scratch;
};
