// Reads a link's meters by name at display time. Indices are looked up
// again whenever the meter count changes, because per-channel meters
// expand when the plug-in is prepared for its channels.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "zen/EditorLink.h"

class MeterReader {
public:
    // `name` is the part of the identifier after "::" ("GAIN_REDUCTION");
    // a per-channel meter ("INPUT_PEAK") is every "INPUT_PEAK_<n>".
    explicit MeterReader(std::string name) : m_name(std::move(name)) {}

    // The reading, or the loudest channel's; none when the link has no such meter.
    std::optional<float> Read(const zen::EditorLink& link);
    // Every channel's reading (one for a single meter).
    std::vector<float> ReadAll(const zen::EditorLink& link);

private:
    void Find(const zen::EditorLink& link);

    std::string m_name;
    std::uint32_t m_foundFor = UINT32_MAX;  // meter count of the last look-up
    std::vector<std::uint32_t> m_indices;
};
