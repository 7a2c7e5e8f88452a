// Axes, grid and labels for the plotting displays, and the mapping between
// data and pixels. A horizontal axis is linear or logarithmic (frequencies,
// labelled 20, 50, 100, 200, 500, 1k, 2k, 5k, 10k, 20k); the vertical axis is
// linear in its unit (dB, LUFS, seconds). Sizes follow the font, so the plot
// reads the same at every scale factor.
#pragma once

#include <QPainter>
#include <QPointF>
#include <QRectF>
#include <QString>
#include <vector>

class QWidget;

class PlotArea {
public:
    enum class Scale { Linear, Logarithmic };

    void SetHorizontal(double minimum, double maximum, Scale scale, const QString& unit);
    void SetVertical(double minimum, double maximum, const QString& unit);

    // Lays out the plot inside `bounds` (room for the labels) and draws the
    // frame, grid and labels.
    void Draw(QPainter& painter, const QRectF& bounds);
    // The plotting displays' frame: the widget's background, `title` on its
    // first line, the plot below. Returns the height of a line of text.
    double DrawTitled(QPainter& painter, const QWidget& widget, const QString& title);

    // Data <-> pixel, valid after Draw (or Layout) for the same bounds.
    void Layout(const QFontMetricsF& metrics, const QRectF& bounds);
    QPointF ToPixel(double x, double y) const;
    double ToDataX(double pixelX) const;
    const QRectF& Plot() const { return m_plot; }

    // Draws a polyline of data points clipped to the plot.
    void DrawCurve(QPainter& painter, const std::vector<QPointF>& points) const;

    // `count` horizontal positions spread evenly over the axis (log-spaced
    // on a logarithmic axis): where response curves are sampled.
    std::vector<double> SamplePositions(int count) const;

    // The axis as set.
    double MinimumX() const { return m_xMin; }
    double MaximumX() const { return m_xMax; }
    double MinimumY() const { return m_yMin; }
    double MaximumY() const { return m_yMax; }
    Scale HorizontalScale() const { return m_xScale; }

    // Grid positions: 1-2-5 per decade on a logarithmic axis, round steps
    // otherwise; levels every 6 dB (3, 12 or 24 by range).
    std::vector<double> HorizontalTicks() const;
    double VerticalStep() const;

private:
    double ToPixelX(double x) const;
    QString HorizontalLabel(double x) const;

    double m_xMin = 20.0, m_xMax = 20000.0, m_yMin = -24.0, m_yMax = 24.0;
    Scale m_xScale = Scale::Logarithmic;
    QString m_xUnit = "Hz", m_yUnit = "dB";
    QRectF m_plot;
};
