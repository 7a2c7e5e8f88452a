#include "TriggerList.h"

#include <algorithm>
#include <cmath>
#include <fstream>
#include <sstream>

#include "ZenfxError.h"

namespace zenfx {

std::vector<Trigger> ParseTriggerList(const std::string& text, const std::string& fileName, int sampleRate) {
    std::vector<Trigger> triggers;
    std::istringstream lines(text);
    std::string line;
    for (int number = 1; std::getline(lines, line); ++number) {
        line = line.substr(0, line.find('#'));
        std::istringstream fields(line);
        std::string timeText, padText, extra;
        if (!(fields >> timeText)) continue;
        const std::string where = fileName + ":" + std::to_string(number) + ": ";
        if (!(fields >> padText) || (fields >> extra))
            throw ZenfxError(where + "expected TIME PAD, got '" + line + "'", kExitUsage);
        std::size_t used = 0;
        double seconds = -1.0;
        long pad = 0;
        try {
            seconds = std::stod(timeText, &used);
            if (used != timeText.size()) seconds = -1.0;
            pad = std::stol(padText, &used);
            if (used != padText.size()) pad = 0;
        } catch (const std::exception&) {
        }
        if (!(seconds >= 0.0) || !std::isfinite(seconds) || seconds > 86400.0)
            throw ZenfxError(where + "the time '" + timeText + "' is not seconds from 0 to 86400", kExitUsage);
        if (pad < 1 || pad > 100000)
            throw ZenfxError(where + "the pad '" + padText + "' is not a whole number from 1", kExitUsage);
        triggers.push_back({static_cast<std::uint64_t>(std::llround(seconds * sampleRate)),
                            static_cast<std::uint32_t>(pad)});
    }
    std::stable_sort(triggers.begin(), triggers.end(),
                     [](const Trigger& a, const Trigger& b) { return a.frame < b.frame; });
    return triggers;
}

std::vector<Trigger> ReadTriggerList(const std::string& path, int sampleRate) {
    std::ifstream file(path);
    if (!file) throw ZenfxError("cannot read the trigger list '" + path + "'");
    std::ostringstream text;
    text << file.rdbuf();
    return ParseTriggerList(text.str(), path, sampleRate);
}

std::size_t SpaceTriggers(std::vector<Trigger>& triggers) {
    std::size_t moved = 0;
    for (std::size_t i = 1; i < triggers.size(); ++i) {
        const std::uint64_t earliest = triggers[i - 1].frame + kTriggerSpacing;
        if (triggers[i].frame < earliest) {
            triggers[i].frame = earliest;
            ++moved;
        }
    }
    return moved;
}

}  // namespace zenfx
