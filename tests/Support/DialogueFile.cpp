#include "Support/DialogueFile.h"

#include <cmath>
#include <string>

#include "Common/Algorithms/LoudnessMeter.h"
#include "Support/Signals.h"
#include "Support/SpokenSpeech.h"

namespace zentest {

namespace {

constexpr double kLeadSeconds = 1.0;
constexpr double kPauseSeconds = 2.4;
constexpr std::size_t kFirstBedPhrase = 3, kLastBedPhrase = 6;

struct Line {
    const char* text;
    double lufs;
};
// Steps of at most 8 dB between neighbours, across the whole -38..-14 range.
constexpr Line kLines[] = {
    {"The morning train left the station a little after six.", -24.0},
    {"Nobody on the platform seemed to notice the old man.", -30.0},
    {"He carried a small leather case and a folded newspaper.", -38.0},
    {"When the doors closed, he finally sat down by the window.", -32.0},
    {"The fields outside were still covered in a thin white frost.", -26.0},
    {"A conductor walked past and asked to see his ticket.", -20.0},
    {"He smiled, and said that he was going home at last.", -14.0},
    {"The woman across the aisle looked up from her book.", -19.0},
    {"She had heard that voice before, many years ago.", -25.0},
    {"For a moment neither of them said a single word.", -31.0},
    {"Then the train slowed down for the next small town.", -36.0},
    {"And the old man stood up, and waved goodbye to her.", -28.0},
};

void Scale(std::vector<float>& x, double db) {
    const auto g = static_cast<float>(std::pow(10.0, db / 20.0));
    for (float& v : x) v *= g;
}

// The audible part: from the first to the last sample within 40 dB of the peak.
std::pair<std::size_t, std::size_t> Audible(const std::vector<float>& x) {
    const float floor = Peak(x) * 0.01f;
    std::size_t begin = 0, end = x.size();
    while (begin < end && std::fabs(x[begin]) < floor) ++begin;
    while (end > begin && std::fabs(x[end - 1]) < floor) --end;
    return {begin, end};
}

}  // namespace

double IntegratedLoudness(const std::vector<float>& x) {
    LoudnessMeter meter;
    meter.SetChannelCount(1);
    meter.Prepare(static_cast<float>(kDialogueRate), 4096);
    std::vector<float> copy(x);
    for (std::size_t n = 0; n < copy.size(); n += 4096) {
        float* channel[] = {copy.data() + n};
        meter.Process(channel, std::min<std::size_t>(4096, copy.size() - n));
    }
    return meter.Integrated();
}

DialogueFile MakeLevelledDialogueTestFile() {
    DialogueFile file;
    file.samples.assign(static_cast<std::size_t>(kLeadSeconds * kDialogueRate), 0.0f);
    const auto pause = static_cast<std::size_t>(kPauseSeconds * kDialogueRate);
    std::size_t bedBegin = 0, bedEnd = 0;
    for (std::size_t i = 0; i < std::size(kLines); ++i) {
        std::vector<float> spoken = Speak(kLines[i].text, kDialogueRate);
        if (spoken.empty()) return {};
        const auto [begin, end] = Audible(spoken);
        spoken = std::vector<float>(spoken.begin() + static_cast<std::ptrdiff_t>(begin),
                                    spoken.begin() + static_cast<std::ptrdiff_t>(end));
        Scale(spoken, kLines[i].lufs - IntegratedLoudness(spoken));
        DialogueFile::Phrase phrase;
        phrase.begin = file.samples.size();
        phrase.end = phrase.begin + spoken.size();
        phrase.loudness = kLines[i].lufs;
        file.phrases.push_back(phrase);
        file.samples.insert(file.samples.end(), spoken.begin(), spoken.end());
        if (i == kFirstBedPhrase) bedBegin = phrase.begin;
        if (i == kLastBedPhrase) bedEnd = phrase.end + pause / 2;
        file.samples.insert(file.samples.end(), pause, 0.0f);
    }
    std::vector<float> bed = MusicLike(kDialogueRate, bedEnd - bedBegin);
    Scale(bed, kMusicBedLufs - IntegratedLoudness(bed));
    for (std::size_t n = 0; n < bed.size(); ++n) file.samples[bedBegin + n] += bed[n];
    return file;
}

}  // namespace zentest
