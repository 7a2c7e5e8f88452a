#include "LevelBars.h"

#include <QPainter>
#include <algorithm>
#include <cmath>

#include "ZenEditor.h"

namespace {

const QString kMinus = QStringLiteral("\u2212");
constexpr double kBarLines = 10.0;  // height of a bar in text lines

// "INPUT_PEAK" takes "Class::INPUT_PEAK" and "Class::INPUT_PEAK_<n>".
bool Matches(const std::string& identifier, const std::string& name) {
    const std::size_t colon = identifier.rfind("::");
    const std::string tail = colon == std::string::npos ? identifier : identifier.substr(colon + 2);
    if (identifier == name || tail == name) return true;
    if (tail.size() <= name.size() + 1 || tail.compare(0, name.size(), name) != 0 || tail[name.size()] != '_')
        return false;
    return std::all_of(tail.begin() + static_cast<long>(name.size() + 1), tail.end(),
                       [](char c) { return c >= '0' && c <= '9'; });
}

bool IsDecibels(const zen::MeterInfo& info) {
    return info.kind == zen::MeterKind::Level || info.unit.rfind("dB", 0) == 0;
}

QString Reading(const LevelBars::Bar& bar) {
    const zen::MeterInfo& info = bar.info;
    const float value = bar.value;
    // A level at the floor of its range reads as silence.
    if (!std::isfinite(value) || (info.kind == zen::MeterKind::Level && !bar.hangs && value <= info.minimum))
        return QStringLiteral("\u2212\u221e");
    const float magnitude = std::fabs(value);
    QString text = QString::number(value, 'f', magnitude >= 100.0f ? 0 : magnitude >= 10.0f || IsDecibels(info) ? 1 : 2);
    if (text.startsWith('-')) text.replace(0, 1, kMinus);
    return text;
}

void UpdateHold(LevelBars::Bar& bar, int holdRefreshes, float fall) {
    if (!IsDecibels(bar.info)) return;
    // A reduction holds its deepest reading and returns upwards.
    const float sign = bar.hangs ? -1.0f : 1.0f;
    if (sign * bar.value >= sign * bar.hold || !std::isfinite(bar.hold)) {
        bar.hold = bar.value;
        bar.holdAge = 0;
    } else if (++bar.holdAge > holdRefreshes) {
        bar.hold = sign * std::max(sign * bar.value, sign * bar.hold - fall);
    }
}

// The narrowest width that wraps `name` into at most two lines.
double TwoLineWidth(const QFontMetricsF& metrics, const QString& name) {
    const QStringList words = name.split(' ', Qt::SkipEmptyParts);
    double best = metrics.horizontalAdvance(name);
    for (int split = 1; split < words.size(); ++split) {
        const double first = metrics.horizontalAdvance(words.mid(0, split).join(' '));
        const double second = metrics.horizontalAdvance(words.mid(split).join(' '));
        best = std::min(best, std::max(first, second));
    }
    return std::ceil(best) + 1.0;  // wrapping rounds widths
}

}  // namespace

LevelBars::LevelBars(std::vector<std::string> names, QWidget* parent) : EditorDisplay(parent), m_names(std::move(names)) {
    setSizePolicy(QSizePolicy::Preferred, QSizePolicy::Expanding);
}

std::vector<std::uint32_t> LevelBars::Resolve(const zen::EditorLink& link, const std::vector<std::string>& names) {
    std::vector<std::uint32_t> meters;
    zen::MeterInfo info;
    for (std::uint32_t i = 0; i < link.GetMeterCount(); ++i) {
        if (!link.GetMeterInfo(i, info)) continue;
        if (info.kind != zen::MeterKind::Level && info.kind != zen::MeterKind::Value) continue;
        if (std::any_of(names.begin(), names.end(), [&](const std::string& n) { return Matches(info.identifier, n); }))
            meters.push_back(i);
    }
    return meters;
}

void LevelBars::Refresh(const zen::EditorLink& link) {
    const std::uint32_t count = link.GetMeterCount();
    bool changed = !m_resolved || count != m_meterCount;
    if (changed) {
        m_resolved = true;
        m_meterCount = count;
        m_bars.clear();
        for (const std::uint32_t meter : Resolve(link, m_names)) {
            Bar bar;
            bar.meter = meter;
            link.GetMeterInfo(meter, bar.info);
            if (bar.info.maximum <= bar.info.minimum) {
                bar.info.minimum = kDefaultFloor;
                bar.info.maximum = kDefaultCeiling;
            }
            bar.hangs = bar.info.identifier.find("REDUCTION") != std::string::npos;
            bar.value = bar.hold = bar.hangs ? bar.info.maximum : bar.info.minimum;
            m_bars.push_back(bar);
        }
        updateGeometry();
    }
    const int holdRefreshes = static_cast<int>(kHoldSeconds * ZenEditor::kDisplayRate);
    const auto fall = static_cast<float>(kFallDecibelsPerSecond / ZenEditor::kDisplayRate);
    for (Bar& bar : m_bars) {
        const float before = bar.value;
        const float hold = bar.hold;
        bar.value = link.GetMeter(bar.meter);
        UpdateHold(bar, holdRefreshes, fall);
        changed = changed || bar.value != before || bar.hold != hold;
    }
    if (changed) update();
}


double LevelBars::ColumnWidth() const {
    const QFontMetricsF metrics(font());
    // Room for a reading and for each name in its two lines ("Input True
    // Peak 1" as "Input True" over "Peak 1").
    double width = metrics.horizontalAdvance(QStringLiteral("\u221288.8"));
    for (const Bar& bar : m_bars) width = std::max(width, TwoLineWidth(metrics, QString::fromStdString(bar.info.name)));
    return width + metrics.averageCharWidth() * 1.5;
}

QSize LevelBars::sizeHint() const {
    const QFontMetricsF metrics(font());
    const auto columns = static_cast<double>(std::max<std::size_t>(1, m_bars.size()));
    return {static_cast<int>(std::ceil(ColumnWidth() * columns)), static_cast<int>(metrics.height() * (kBarLines + 4.0))};
}

QSize LevelBars::minimumSizeHint() const {
    const QSize hint = sizeHint();
    return {hint.width(), hint.height() / 2};
}

void LevelBars::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    const QFontMetricsF metrics(font());
    const double line = metrics.height();
    const double column = ColumnWidth();
    const double barWidth = std::max(4.0, line * 0.6);
    // Reading above, two lines of name below.
    const QRectF area(0, line * 1.2, width(), std::max(line, height() - line * 3.6));
    const QColor trough = palette().color(QPalette::Base);
    const QColor fill = palette().color(QPalette::Highlight);
    const QColor over(0xe0, 0x5a, 0x4f);

    for (std::size_t i = 0; i < m_bars.size(); ++i) {
        const Bar& bar = m_bars[i];
        const double x = column * static_cast<double>(i);
        const QRectF slot(x + (column - barWidth) / 2.0, area.top(), barWidth, area.height());
        painter.fillRect(slot, trough);
        const auto toY = [&](float v) {
            const double t = std::clamp((static_cast<double>(v) - bar.info.minimum) / (bar.info.maximum - bar.info.minimum),
                                        0.0, 1.0);
            return slot.bottom() - t * slot.height();
        };
        if (std::isfinite(bar.value)) {
            // Value meters grow from zero where their range holds it.
            float base = bar.hangs ? bar.info.maximum : bar.info.minimum;
            if (!IsDecibels(bar.info) && bar.info.minimum < 0.0f && bar.info.maximum > 0.0f) base = 0.0f;
            const double y0 = toY(base);
            const double y1 = toY(bar.value);
            const bool clipping = !bar.hangs && IsDecibels(bar.info) && bar.value > 0.0f && bar.info.maximum > 0.0f;
            painter.fillRect(QRectF(slot.left(), std::min(y0, y1), slot.width(), std::fabs(y1 - y0)),
                             clipping ? over : fill);
        }
        if (IsDecibels(bar.info) && std::isfinite(bar.hold) &&
            (bar.hangs ? bar.hold < bar.info.maximum : bar.hold > bar.info.minimum)) {
            painter.fillRect(QRectF(slot.left(), toY(bar.hold) - 1.0, slot.width(), 2.0),
                             palette().color(QPalette::BrightText));
        }
        painter.setPen(palette().color(QPalette::Text));
        painter.drawText(QRectF(x, 0, column, line * 1.1), Qt::AlignCenter, Reading(bar));
        painter.setPen(palette().color(QPalette::WindowText));
        painter.drawText(QRectF(x, area.bottom() + line * 0.2, column, line * 2.3),
                         Qt::AlignHCenter | Qt::AlignTop | Qt::TextWordWrap, QString::fromStdString(bar.info.name));
    }
}
