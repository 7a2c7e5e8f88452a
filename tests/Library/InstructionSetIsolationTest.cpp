// Code compiled for AVX, FMA or SSE4.1 must stay private to its object file:
// an inline function emitted there as a weak symbol could be the copy the
// linker keeps for every caller, and a baseline processor would then run
// instructions it does not have.
#include <gtest/gtest.h>

#include <cstdio>
#include <regex>
#include <sstream>
#include <string>
#include <vector>

namespace {

struct ArchiveSymbol {
    std::string member;
    char type = ' ';
    std::string name;
};

std::vector<ArchiveSymbol> DefinedSymbols(const std::string& archive) {
    std::vector<ArchiveSymbol> symbols;
    const std::string command = "nm -A -C --defined-only '" + archive + "' 2>/dev/null";
    FILE* pipe = popen(command.c_str(), "r");
    if (pipe == nullptr) return symbols;
    char line[8192];
    // "archive:member.o:address type name"
    const std::regex format(R"(^[^:]*:([^:]+\.o):[0-9a-fA-F]*\s+(\S)\s+(.*)$)");
    while (std::fgets(line, sizeof(line), pipe) != nullptr) {
        std::string text(line);
        if (!text.empty() && text.back() == '\n') text.pop_back();
        std::smatch match;
        if (std::regex_match(text, match, format)) symbols.push_back({match[1], match[2].str()[0], match[3]});
    }
    pclose(pipe);
    return symbols;
}

}  // namespace

TEST(InstructionSetIsolation, VectorFormsDefineNoSharedInlineCode) {
    const std::vector<ArchiveSymbol> symbols = DefinedSymbols(ZEN_ALGORITHMS_ARCHIVE_PATH);
    ASSERT_FALSE(symbols.empty()) << "nm found nothing in " << ZEN_ALGORITHMS_ARCHIVE_PATH;
    const std::regex extendedForm(R"(_m256|_avx2|_fma|_sse41)");
    int extendedMembers = 0;
    for (const ArchiveSymbol& symbol : symbols) {
        if (!std::regex_search(symbol.member, extendedForm)) continue;
        ++extendedMembers;
        // 'W' is weak code; weak data ('V', e.g. the personality reference) holds no instructions.
        EXPECT_NE(symbol.type, 'W') << symbol.member << " defines shared code " << symbol.name;
    }
    EXPECT_GT(extendedMembers, 0) << "no vector forms found: the member names changed?";
}
