#include "MeterReader.h"

#include <algorithm>

void MeterReader::Find(const zen::EditorLink& link) {
    const std::uint32_t count = link.GetMeterCount();
    if (count == m_foundFor) return;
    m_foundFor = count;
    m_indices.clear();
    const std::string channelPrefix = m_name + "_";
    for (std::uint32_t i = 0; i < count; ++i) {
        zen::MeterInfo info;
        if (!link.GetMeterInfo(i, info)) continue;
        const std::size_t colons = info.identifier.find("::");
        const std::string name = colons == std::string::npos ? info.identifier : info.identifier.substr(colons + 2);
        const bool channel = name.compare(0, channelPrefix.size(), channelPrefix) == 0 &&
                             name.size() > channelPrefix.size() &&
                             name.find_first_not_of("0123456789", channelPrefix.size()) == std::string::npos;
        if (name == m_name || channel) m_indices.push_back(i);
    }
}

std::optional<float> MeterReader::Read(const zen::EditorLink& link) {
    const std::vector<float> readings = ReadAll(link);
    if (readings.empty()) return std::nullopt;
    return *std::max_element(readings.begin(), readings.end());
}

std::vector<float> MeterReader::ReadAll(const zen::EditorLink& link) {
    Find(link);
    std::vector<float> readings;
    readings.reserve(m_indices.size());
    for (std::uint32_t i : m_indices) readings.push_back(link.GetMeter(i));
    return readings;
}
