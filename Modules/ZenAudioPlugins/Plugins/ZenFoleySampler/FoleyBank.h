// The sounds a sampler plays: pads numbered from 1, each with one or more
// takes. The built-in pads (synthesised once per process and shared) come
// first, then one pad per sound file of the user's folder in name order.
// A bank is immutable once built, so the audio thread reads it freely.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "FoleySound.h"

class FoleyBank {
public:
    struct Pad {
        std::string name;
        std::vector<FoleySound> takes;  // never empty
    };

    // The built-in pads only.
    FoleyBank();

    // The built-in pads and every .wav and .flac file of `folder`. Files
    // that cannot be read are skipped and listed in `skipped` as
    // "<file name>: <reason>"; a missing folder is listed by its path.
    static std::unique_ptr<FoleyBank> WithFolder(const std::string& folder, std::vector<std::string>& skipped);

    std::uint32_t PadCount() const { return static_cast<std::uint32_t>(m_builtIns->size() + m_user.size()); }
    std::uint32_t BuiltInCount() const { return static_cast<std::uint32_t>(m_builtIns->size()); }
    // Pad `number` counted from 1; null when there is none.
    const Pad* GetPad(std::uint32_t number) const;
    double LongestSeconds() const { return m_longestSeconds; }

private:
    void Measure();

    std::shared_ptr<const std::vector<Pad>> m_builtIns;
    std::vector<Pad> m_user;
    double m_longestSeconds = 0.0;
};
