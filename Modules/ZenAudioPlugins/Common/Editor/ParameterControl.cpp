#include "ParameterControl.h"

#include <QRegularExpression>
#include <algorithm>
#include <cmath>

#include "ParameterChoice.h"
#include "ParameterKnob.h"
#include "ParameterToggle.h"

namespace {

// The library's own offset, so that a logarithmic minimum of 0 maps.
constexpr double kLogTaperOffset = 1e-10;
constexpr float kKilo = 1000.0f;
const QString kMinus = QStringLiteral("\u2212");

float ListStride(const zen::ParameterInfo& info) { return info.step > 0.0f ? info.step : 1.0f; }

int ListCount(const zen::ParameterInfo& info) {
    return static_cast<int>(std::floor((info.maximum - info.minimum) / ListStride(info) + 0.5f)) + 1;
}

int ListIndex(const zen::ParameterInfo& info, float value) {
    const int index = static_cast<int>(std::lround((value - info.minimum) / ListStride(info)));
    return std::clamp(index, 0, ListCount(info) - 1);
}

QString Number(double value, int decimals) {
    QString text = QString::number(value, 'f', decimals);
    if (text.startsWith('-')) {
        // "-0.0" reads as a fault.
        if (QString::number(0.0, 'f', decimals) == text.mid(1)) return text.mid(1);
        text.replace(0, 1, kMinus);
    }
    return text;
}

bool IsDecibels(const QString& unit) {
    return unit.startsWith(QStringLiteral("dB")) || unit == QStringLiteral("LUFS") || unit == QStringLiteral("LU");
}

}  // namespace

ParameterControl* ParameterControl::Create(zen::EditorLink& link, std::uint32_t index, QWidget* parent) {
    zen::ParameterInfo info;
    if (!link.GetParameterInfo(index, info)) return nullptr;
    switch (info.kind) {
        case zen::ParameterKind::Switch:
            return new ParameterToggle(link, index, parent);
        case zen::ParameterKind::List:
            return new ParameterChoice(link, index, parent);
        case zen::ParameterKind::Continuous:
        default:
            return new ParameterKnob(link, index, parent);
    }
}

ParameterControl::ParameterControl(zen::EditorLink& link, std::uint32_t index, QWidget* parent)
    : QWidget(parent), m_link(link), m_index(index) {
    m_link.GetParameterInfo(index, m_info);
    m_shown = m_info.defaultValue;
    m_caption = QString::fromStdString(m_info.label);
    setToolTip(m_caption);
}

void ParameterControl::SetCaption(const QString& caption) {
    m_caption = caption;
    updateGeometry();
    update();
}

void ParameterControl::ApplyValue(float value) {
    if (std::isnan(value)) return;
    m_link.SetParameter(m_index, std::clamp(value, m_info.minimum, m_info.maximum));
    SyncFromLink();
}

void ParameterControl::SetValueFromUser(float value) {
    m_link.BeginEdit(m_index);
    ApplyValue(value);
    m_link.EndEdit(m_index);
}

void ParameterControl::SetPositionFromUser(float position) { SetValueFromUser(PositionToValue(m_info, position)); }

bool ParameterControl::EnterText(const QString& typed) {
    QString text = typed.trimmed();
    text.replace(kMinus, QStringLiteral("-"));
    if (text.isEmpty()) return false;

    if (m_info.kind == zen::ParameterKind::List) {
        for (std::size_t i = 0; i < m_info.choices.size(); ++i) {
            if (text.compare(QString::fromStdString(m_info.choices[i]), Qt::CaseInsensitive) == 0) {
                SetValueFromUser(m_info.minimum + static_cast<float>(i) * ListStride(m_info));
                return true;
            }
        }
    }
    if (m_info.kind == zen::ParameterKind::Switch) {
        if (text.compare(QStringLiteral("on"), Qt::CaseInsensitive) == 0) {
            SetValueFromUser(1.0f);
            return true;
        }
        if (text.compare(QStringLiteral("off"), Qt::CaseInsensitive) == 0) {
            SetValueFromUser(0.0f);
            return true;
        }
    }

    static const QRegularExpression kNumber(QStringLiteral("^([-+]?(?:\\d+\\.?\\d*|\\.\\d+)(?:[eE][-+]?\\d+)?)\\s*(.*)$"));
    const QRegularExpressionMatch match = kNumber.match(text);
    if (!match.hasMatch()) return false;
    bool ok = false;
    double value = match.captured(1).toDouble(&ok);
    if (!ok || !std::isfinite(value)) return false;

    // What follows the number: nothing, the unit, or a kilo prefix ("2.5k",
    // "2.5 kHz"); seconds where the unit is milliseconds.
    const QString unit = QString::fromStdString(m_info.unit);
    QString rest = match.captured(2).trimmed();
    if (!rest.isEmpty() && rest.compare(unit, Qt::CaseInsensitive) != 0) {
        if (unit == QStringLiteral("ms") && rest == QStringLiteral("s")) {
            value *= kKilo;
        } else if (rest.startsWith('k', Qt::CaseInsensitive) &&
                   (rest.size() == 1 || rest.mid(1).compare(unit, Qt::CaseInsensitive) == 0)) {
            value *= kKilo;
        } else {
            return false;
        }
    }
    if (m_info.kind == zen::ParameterKind::List) {
        // A number picks the nearest entry.
        value = m_info.minimum + static_cast<float>(ListIndex(m_info, static_cast<float>(value))) * ListStride(m_info);
    }
    SetValueFromUser(static_cast<float>(std::clamp(value, static_cast<double>(m_info.minimum),
                                                   static_cast<double>(m_info.maximum))));
    return true;
}

void ParameterControl::SyncFromLink() {
    const float value = m_link.GetParameter(m_index);
    if (m_synced && value == m_shown) return;
    m_synced = true;
    m_shown = value;
    ShowValue(value);
    emit ValueShown(value);
}

QString ParameterControl::ValueText(float value) const {
    switch (m_info.kind) {
        case zen::ParameterKind::Switch:
            return value >= 0.5f ? tr("On") : tr("Off");
        case zen::ParameterKind::List: {
            const int index = ListIndex(m_info, value);
            if (index < static_cast<int>(m_info.choices.size()))
                return QString::fromStdString(m_info.choices[static_cast<std::size_t>(index)]);
            return Number(value, 0);
        }
        case zen::ParameterKind::Continuous:
        default:
            break;
    }
    const QString unit = QString::fromStdString(m_info.unit);
    const double v = value;
    const double magnitude = std::fabs(v);
    QString number;
    QString shownUnit = unit;
    if (unit == QStringLiteral("Hz")) {
        if (magnitude >= kKilo) {
            number = Number(v / kKilo, magnitude >= 10.0 * kKilo ? 1 : 2);
            shownUnit = QStringLiteral("kHz");
        } else {
            number = Number(v, magnitude >= 100.0 ? 0 : 1);
        }
    } else if (IsDecibels(unit)) {
        number = Number(v, 1);
    } else if (unit == QStringLiteral("%")) {
        number = Number(v, 0);
    } else if (unit == QStringLiteral("ms")) {
        number = Number(v, magnitude >= 100.0 ? 0 : magnitude >= 10.0 ? 1 : 2);
    } else {
        // Decimals from the display resolution, at most three.
        int decimals = 2;
        if (m_info.step > 0.0f)
            decimals = std::clamp(static_cast<int>(std::ceil(-std::log10(static_cast<double>(m_info.step)) - 1e-6)), 0, 3);
        number = Number(v, decimals);
    }
    return shownUnit.isEmpty() ? number : number + ' ' + shownUnit;
}

std::vector<float> ParameterControl::ListValues(const zen::ParameterInfo& info) {
    std::vector<float> values;
    for (int i = 0; i < ListCount(info); ++i) values.push_back(info.minimum + static_cast<float>(i) * ListStride(info));
    return values;
}

float ParameterControl::ValueToPosition(const zen::ParameterInfo& info, float value) {
    switch (info.taper) {
        case zen::ParameterTaper::Logarithmic: {
            const double m = static_cast<double>(info.minimum) + kLogTaperOffset;
            return static_cast<float>(std::log(static_cast<double>(value) / m) /
                                      std::log(static_cast<double>(info.maximum) / m));
        }
        case zen::ParameterTaper::List: {
            // The first entry not below the value; above every entry: 0.
            const int count = ListCount(info);
            for (int i = 0; i < count; ++i) {
                if (info.minimum + static_cast<float>(i) * ListStride(info) >= value)
                    return static_cast<float>(i) / static_cast<float>(count > 1 ? count - 1 : 1);
            }
            return 0.0f;
        }
        case zen::ParameterTaper::Linear:
        default:
            return (value - info.minimum) / (info.maximum - info.minimum);
    }
}

float ParameterControl::PositionToValue(const zen::ParameterInfo& info, float position) {
    position = std::clamp(position, 0.0f, 1.0f);
    switch (info.taper) {
        case zen::ParameterTaper::Logarithmic: {
            const double m = static_cast<double>(info.minimum) + kLogTaperOffset;
            const double v = m * std::pow(static_cast<double>(info.maximum) / m, static_cast<double>(position));
            return std::clamp(static_cast<float>(v), info.minimum, info.maximum);
        }
        case zen::ParameterTaper::List: {
            const auto last = static_cast<float>(ListCount(info) - 1);
            return info.minimum + static_cast<float>(std::lround(position * last)) * ListStride(info);
        }
        case zen::ParameterTaper::Linear:
        default:
            return info.minimum + position * (info.maximum - info.minimum);
    }
}
