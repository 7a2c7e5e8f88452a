// A scrolling history of one or more values (gain reduction, loudness), a
// point per refresh over the last `seconds`, newest at the right. The update
// function reads the link and returns this refresh's values.
#pragma once

#include <QColor>
#include <QString>
#include <functional>
#include <vector>

#include "EditorDisplay.h"
#include "PlotArea.h"

class HistoryDisplay : public EditorDisplay {
    Q_OBJECT

public:
    using Update = std::function<std::vector<float>(const zen::EditorLink& link)>;

    HistoryDisplay(const QString& title, double minimum, double maximum, const QString& unit, double seconds,
                   Update update, QWidget* parent = nullptr);

    void SetTraceNames(const std::vector<QString>& names);
    void Refresh(const zen::EditorLink& link) override;

    // Newest last; one vector per trace.
    const std::vector<std::vector<float>>& Traces() const { return m_traces; }

protected:
    void paintEvent(QPaintEvent* event) override;
    QSize sizeHint() const override;

private:
    QString m_title;
    PlotArea m_plot;
    Update m_update;
    std::size_t m_capacity;
    std::vector<QString> m_names;
    std::vector<std::vector<float>> m_traces;
};
