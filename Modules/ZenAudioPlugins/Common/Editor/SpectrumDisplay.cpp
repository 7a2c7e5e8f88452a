#include "SpectrumDisplay.h"

#include <algorithm>
#include <cmath>

namespace {

constexpr float kFloorPower = 1e-12f;  // -120 dB
constexpr double kLowestHz = 20.0;
constexpr double kHighestHz = 20000.0;

}  // namespace

SpectrumDisplay::SpectrumDisplay(const QString& title, double minimumDb, double maximumDb, std::vector<Trace> traces,
                                 QWidget* parent)
    : CurveDisplay(title, [this](const zen::EditorLink& link, CurveDisplay&) { Read(link); }, parent) {
    Plot().SetHorizontal(kLowestHz, kHighestHz, PlotArea::Scale::Logarithmic, "Hz");
    Plot().SetVertical(minimumDb, maximumDb, "dB");
    for (Trace& trace : traces) m_readers.push_back({std::move(trace), 0, {}, false});
}

std::vector<QPointF> SpectrumDisplay::ArrayPoints(const float* values, std::size_t count, double sampleRate) {
    std::vector<QPointF> points;
    if (count < 2) return points;
    const double spacing = sampleRate / 2.0 / static_cast<double>(count - 1);
    points.reserve(count - 1);
    for (std::size_t k = 1; k < count; ++k) points.emplace_back(spacing * static_cast<double>(k), values[k]);
    return points;
}

std::vector<QPointF> SpectrumDisplay::RecordPoints(const float* record, std::size_t width, bool peaks,
                                                   double sampleRate) {
    std::vector<QPointF> points;
    const auto bins = static_cast<std::size_t>(std::max(0.0f, record[0]));
    if (bins < 2 || 1 + 2 * bins > width) return points;
    const float* powers = record + 1 + (peaks ? bins : 0);
    const double spacing = sampleRate / 2.0 / static_cast<double>(bins - 1);
    points.reserve(bins - 1);
    for (std::size_t k = 1; k < bins; ++k)
        points.emplace_back(spacing * static_cast<double>(k), 10.0 * std::log10(std::max(powers[k], kFloorPower)));
    return points;
}

std::vector<QPointF> SpectrumDisplay::Thinned(std::vector<QPointF> points) {
    if (points.size() <= kMaxPoints) return points;
    const double low = std::log(points.front().x()), high = std::log(points.back().x());
    const double perBand = static_cast<double>(kMaxPoints - 1) / std::max(high - low, 1e-9);
    std::vector<QPointF> bands;
    bands.reserve(kMaxPoints);
    long band = -1;
    for (const QPointF& p : points) {
        const auto at = static_cast<long>((std::log(p.x()) - low) * perBand);
        if (at != band) {
            bands.push_back(p);
            band = at;
        } else if (p.y() > bands.back().y()) {
            bands.back().setY(p.y());
        }
    }
    return bands;
}

bool SpectrumDisplay::Drain(const zen::EditorLink& link, Reader& reader) {
    zen::MeterInfo info;
    if (!link.GetMeterInfo(reader.trace.meter, info) || info.size == 0) return false;
    if (reader.trace.source == Source::Array) {
        if (info.kind != zen::MeterKind::Array) return false;
        reader.values.resize(info.size);
        reader.valid = link.ReadMeterArray(reader.trace.meter, reader.values.data(), info.size);
        return reader.valid;
    }
    if (info.kind != zen::MeterKind::Ring) return false;
    // Only the newest record matters; the ring holds a few.
    m_scratch.resize(info.size);
    bool fresh = false;
    while (link.ReadMeterRing(reader.trace.meter, reader.cursor, m_scratch.data(), 1).records == 1) {
        reader.values.swap(m_scratch);
        m_scratch.resize(info.size);
        fresh = true;
    }
    reader.valid |= fresh;
    return fresh;
}

void SpectrumDisplay::Read(const zen::EditorLink& link) {
    const double rate = link.GetSampleRate();
    for (std::size_t i = 0; i < m_readers.size(); ++i) {
        Reader& reader = m_readers[i];
        if (!Drain(link, reader) && !reader.valid) {
            SetCurve(i, {}, reader.trace.name, i == 0);
            continue;
        }
        std::vector<QPointF> points =
            reader.trace.source == Source::Array
                ? ArrayPoints(reader.values.data(), reader.values.size(), rate)
                : RecordPoints(reader.values.data(), reader.values.size(), reader.trace.source == Source::RingPeak, rate);
        SetCurve(i, Thinned(std::move(points)), reader.trace.name, i == 0);
    }
}
