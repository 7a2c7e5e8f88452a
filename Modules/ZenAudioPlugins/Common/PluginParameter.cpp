#include "PluginParameter.h"

#include <algorithm>
#include <cmath>

namespace zen {

namespace {
constexpr double kLogTaperOffset = 1e-10;
}

void PluginParameter::Init(const ParameterDefinition& definition) {
    m_definition = &definition;
    m_taper = static_cast<std::uint32_t>(definition.Taper());
    m_minimum = definition.minimum;
    m_maximum = definition.maximum;
    m_discreteValues.clear();
    if (definition.Taper() == ParameterTaper::List) {
        const float stride = definition.step > 0.0f ? definition.step : 1.0f;
        const auto count = static_cast<int>(std::floor((m_maximum - m_minimum) / stride + 0.5f)) + 1;
        for (int i = 0; i < count; ++i) m_discreteValues.push_back(m_minimum + static_cast<float>(i) * stride);
    }
    m_value.store(definition.defaultValue);
    RefreshPosition();
}

float PluginParameter::Exchange(float value) {
    const float previous = m_value.exchange(value, std::memory_order_acq_rel);
    RefreshPosition();
    MarkChanged();
    return previous;
}

float PluginParameter::ValueToPosition(float value) const {
    switch (GetTaper()) {
        case ParameterTaper::Logarithmic: {
            const double m = static_cast<double>(m_minimum) + kLogTaperOffset;
            return static_cast<float>(std::log(static_cast<double>(value) / m) /
                                      std::log(static_cast<double>(m_maximum) / m));
        }
        case ParameterTaper::List: {
            const auto it = std::lower_bound(m_discreteValues.begin(), m_discreteValues.end(), value);
            if (it == m_discreteValues.end()) return 0.0f;  // above every entry: 0, not 1
            const auto index = static_cast<float>(it - m_discreteValues.begin());
            const auto count = m_discreteValues.size();
            return index / static_cast<float>(count > 1 ? count - 1 : 1);
        }
        case ParameterTaper::Linear:
        default:
            return (value - m_minimum) / (m_maximum - m_minimum);
    }
}

float PluginParameter::PositionToValue(float position) const {
    position = std::min(std::max(position, 0.0f), 1.0f);
    switch (GetTaper()) {
        case ParameterTaper::Logarithmic: {
            const double m = static_cast<double>(m_minimum) + kLogTaperOffset;
            const double v = m * std::pow(static_cast<double>(m_maximum) / m, static_cast<double>(position));
            return std::min(std::max(static_cast<float>(v), m_minimum), m_maximum);
        }
        case ParameterTaper::List: {
            if (m_discreteValues.empty()) return m_minimum;
            const auto last = static_cast<float>(m_discreteValues.size() - 1);
            return m_discreteValues[static_cast<std::size_t>(std::lround(position * last))];
        }
        case ParameterTaper::Linear:
        default:
            return m_minimum + position * (m_maximum - m_minimum);
    }
}

}  // namespace zen
