// The meters of a file run, as a user wants them at its end: every meter's
// final reading and, for level meters, the highest reading of the whole run
// (a block's peak says little about an hour of audio). Generic over the
// meter table: levels {final, max} in dB, values {final} (a loudness meter's
// integrated value is the file's loudness), arrays {final: [...]}, rings
// {final: null} (a history, not a reading).
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "zen/Zen.h"

namespace zenfx {

class MeterRecorder {
public:
    struct Plugin {
        std::string name;
        std::string key;
        AudioPlugin* audio = nullptr;
    };

    // After Prepare: the maxima start at the meters' readings at rest.
    explicit MeterRecorder(std::vector<Plugin> plugins);

    // After each block: folds the level meters' readings into their maxima.
    void Update();

    // {plugins: [{name, key, meters: [{identifier, name, unit, kind, final,
    // max (levels)}]}]}
    nlohmann::json Json() const;

private:
    struct Level {
        std::size_t plugin;
        std::uint32_t meter;
        float max;
    };
    std::vector<Plugin> m_plugins;
    std::vector<Level> m_levels;
};

}  // namespace zenfx
