#include "ChainReport.h"

#include <iostream>

#include "ParameterValue.h"

namespace zenfx {

ChainReport::ChainReport(zen::host::StudioModel& studio, bool debug) : m_studio(studio) {
    m_studio.SetActionObserver(
        [this](const zen::host::StudioModel::ActionRecord& record) { m_records.push_back(record); });
    if (debug) m_studio.SetDebugOutput([](const std::string& message) { std::cerr << "zenfx: debug: " << message << "\n"; });
}

ChainReport::~ChainReport() {
    m_studio.SetActionObserver(nullptr);
    m_studio.SetDebugOutput(nullptr);
}

std::vector<std::string> ChainReport::Failures() const {
    std::vector<std::string> failures;
    for (const auto& record : m_records)
        if (!record.ok) failures.push_back(Describe(record));
    return failures;
}

std::string ChainReport::Describe(const zen::host::StudioModel::ActionRecord& record) {
    const auto argument = [&](std::size_t i) { return i < record.arguments.size() ? record.arguments[i] : ""; };
    std::string text;
    if (record.action == "LoadPlugin") {
        text = "loaded " + argument(0) + (record.ok ? " into slot " + record.result : "");
    } else if (record.action == "SetIntParameter" || record.action == "SetParameter") {
        text = record.target + ": " + argument(1) + " " + argument(2) + " -> ";
        if (record.parameterSet) text += FormatParameterValue(record.parameter, record.value);
        else text += record.note.empty() ? "not set" : record.note;
    } else {
        text = record.action + " " + argument(0) + " " + argument(1) + (record.note.empty() ? "" : " -> " + record.note);
    }
    if (!record.ok) text += " (failed: " + record.result + ")";
    return text;
}

void ChainReport::Print(std::ostream& out, std::size_t channel) const {
    const auto& chain = m_studio.GetChannel(channel).chain;
    out << "zenfx: chain:\n";
    for (std::size_t i = 0; i < chain.size(); ++i)
        out << "zenfx:   " << i << "  " << chain[i].name << (chain[i].audio->IsBypassed() ? "  (bypassed)" : "")
            << "\n";
    if (m_records.empty()) return;
    out << "zenfx: set by the chain's plug-ins:\n";
    for (const auto& record : m_records)
        if (record.action != "LoadPlugin") out << "zenfx:   " << Describe(record) << "\n";
}

}  // namespace zenfx
