#include "LevellerFeed.h"

#include <QLoggingCategory>
#include <algorithm>
#include <cstdio>
#include <cstdlib>

#include "AIControlTemplate.h"
#include "GainList.h"
#include "zen/LevellerEngine.h"

namespace {

using zen::levelling::kBlockEntries;

std::string Decimal(float value) {
    char text[32];
    std::snprintf(text, sizeof text, "%.2f", static_cast<double>(value));
    return text;
}

}  // namespace

void LevellerFeed::Restart() {
    m_fedTo = 0;
    m_finished = false;
    m_refeed = false;
}

bool LevellerFeed::Run(GainList& list, const Engine& engine, bool inputEnded, std::uint64_t touched) {
    bool accepted = true;
    const std::uint64_t written = list.Written();
    const std::uint64_t whole = written - written % kBlockEntries;
    if ((whole > m_fedTo || (m_refeed && whole > 0)) && !m_finished) {
        m_refeed = false;
        const std::uint64_t read = whole >= kReadBehind ? whole - kReadBehind : 0;
        const std::uint64_t blocks = (whole - read) / kBlockEntries;
        qCDebug(zen::aiTrace, "RD: %d, WR: %d, Blocks: %d", static_cast<int>(read), static_cast<int>(written),
                static_cast<int>(blocks));
        for (std::uint64_t b = 0; b < blocks && accepted; ++b)
            accepted = Feed(list, engine, read + b * kBlockEntries, written);
        m_fedTo = whole;
    }
    if (inputEnded && !m_finished && std::max(written, touched) > 0) {
        m_finished = true;
        std::uint64_t end = m_fedTo;
        if (std::max(written, touched) > m_fedTo) {
            accepted = Feed(list, engine, m_fedTo, written) && accepted;
            end = m_fedTo + kBlockEntries;
        }
        std::string answer;
        if (engine({"Finish", std::to_string(end)}, answer))
            StoreAnswers(list, answer, end >= kBlockEntries ? end - kBlockEntries : 0);
        else
            accepted = false;
    }
    return accepted;
}

bool LevellerFeed::Feed(GainList& list, const Engine& engine, std::uint64_t first, std::uint64_t measured) {
    std::vector<std::string> arguments{"Process", std::to_string(first)};
    for (std::uint64_t e = first; e < first + kBlockEntries; ++e)
        arguments.push_back(Decimal(e < measured ? list.Measurement(e) : zen::levelling::kNoSpeech));
    std::string answer;
    if (!engine(arguments, answer)) return false;
    if (first >= kBlockEntries) StoreAnswers(list, answer, first - kBlockEntries);
    return true;
}

void LevellerFeed::StoreAnswers(GainList& list, const std::string& answer, std::uint64_t first) {
    const char* p = answer.c_str();
    std::int32_t values[4];
    int count = 0;
    for (std::uint64_t entry = first;;) {
        char* end = nullptr;
        const long v = std::strtol(p, &end, 10);
        if (end == p) break;
        p = end;
        values[count++] = static_cast<std::int32_t>(v);
        if (count == 4) {
            list.WriteAnswer(entry++, {values[0], values[1], values[2], values[3]});
            count = 0;
        }
    }
}
