// A plot of curves over a frequency or level axis: filter and crossover
// responses, transfer curves with their operating point, spectra. The update
// function reads the link at each refresh and sets the curves (sampled at
// Plot().SamplePositions) and the marker.
#pragma once

#include <QColor>
#include <QPointF>
#include <QString>
#include <functional>
#include <optional>
#include <vector>

#include "EditorDisplay.h"
#include "PlotArea.h"

class CurveDisplay : public EditorDisplay {
    Q_OBJECT

public:
    struct Curve {
        QString name;
        std::vector<QPointF> points;  // data units, ascending x
        bool filled = false;          // shaded down to the axis (spectra)
    };
    using Update = std::function<void(const zen::EditorLink& link, CurveDisplay& display)>;

    CurveDisplay(const QString& title, Update update, QWidget* parent = nullptr);

    PlotArea& Plot() { return m_plot; }
    const PlotArea& Plot() const { return m_plot; }
    void SetCurve(std::size_t index, std::vector<QPointF> points, const QString& name = {}, bool filled = false);
    void SetMarker(std::optional<QPointF> point);

    const std::vector<Curve>& Curves() const { return m_curves; }
    std::optional<QPointF> Marker() const { return m_marker; }

    void Refresh(const zen::EditorLink& link) override;

protected:
    void paintEvent(QPaintEvent* event) override;
    QSize sizeHint() const override;

private:
    QString m_title;
    PlotArea m_plot;
    Update m_update;
    std::vector<Curve> m_curves;
    std::optional<QPointF> m_marker;
};
