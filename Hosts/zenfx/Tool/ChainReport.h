// What plug-ins did to their own channel through host actions (a template
// loading and setting its targets): heard from the studio model while the
// report lives, and printed with the chain it left.
#pragma once

#include <cstddef>
#include <ostream>
#include <string>
#include <vector>

#include "HostCore/Studio/StudioModel.h"

namespace zenfx {

class ChainReport {
public:
    // `debug`: also the model's debug messages (skipped mappings) on stderr.
    explicit ChainReport(zen::host::StudioModel& studio, bool debug = false);
    ~ChainReport();
    ChainReport(const ChainReport&) = delete;
    ChainReport& operator=(const ChainReport&) = delete;

    const std::vector<zen::host::StudioModel::ActionRecord>& Records() const { return m_records; }
    // Failed actions, one line each; empty when all went through.
    std::vector<std::string> Failures() const;

    // "zenfx: chain: ..." lines: every slot (index, name, bypass), then every
    // parameter the actions set (plug-in, parameter, integer sent, value).
    void Print(std::ostream& out, std::size_t channel) const;

    // "Reverb: T@-60dB 4180 -> 0.916 s", "Distortion: Internal Bypass 0 -> in".
    static std::string Describe(const zen::host::StudioModel::ActionRecord& record);

private:
    zen::host::StudioModel& m_studio;
    std::vector<zen::host::StudioModel::ActionRecord> m_records;
};

}  // namespace zenfx
