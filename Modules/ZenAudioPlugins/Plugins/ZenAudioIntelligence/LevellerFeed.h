// Hands the gain list's measurements to the host's levelling engine and
// writes its answers back. Each time a new block of kBlockEntries measured
// entries is complete, the last kReadBehind entries are fed again, block by
// block ("Process" FIRST V0..V9), so the engine refines its recent answers
// with the lookahead it now has; answers are for the entries kBlockEntries
// before each block. When the input ends, the last block is completed with
// kNoSpeech and "Finish" collects the answers still outstanding.
//
// One background thread; allocates (texts of the exchange).
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

class GainList;

class LevellerFeed {
public:
    static constexpr std::uint64_t kReadBehind = 40;

    // Runs "AudioLevellerEngine" with these arguments; false when the host refused.
    using Engine = std::function<bool(const std::vector<std::string>& arguments, std::string& answer)>;

    // A new analysis: nothing fed yet.
    void Restart();

    // Feeds what is pending. `touched` is the number of entries the input has
    // reached, the last possibly incomplete. False when the engine refused a call.
    bool Run(GainList& list, const Engine& engine, bool inputEnded, std::uint64_t touched);

    // The engine's settings changed: the next run feeds the recent entries
    // again, new ones or not.
    void Refeed() { m_refeed = true; }

    std::uint64_t FedTo() const { return m_fedTo; }

private:
    bool Feed(GainList& list, const Engine& engine, std::uint64_t first, std::uint64_t measured);
    static void StoreAnswers(GainList& list, const std::string& answer, std::uint64_t first);

    std::uint64_t m_fedTo = 0;  // entries fed in whole blocks
    bool m_finished = false;
    bool m_refeed = false;
};
