#include "Support/LevellingFigures.h"

#include <algorithm>
#include <cmath>

#include "Common/Algorithms/LoudnessMeter.h"
#include "zen/LevellerEngine.h"

namespace zentest {

namespace {

constexpr double kShortTermSeconds = 3.0;
constexpr double kRateWindowSeconds = 0.1;

double Db(float gain) { return 20.0 * std::log10(std::max(gain, 1e-10f)); }

double ShortTermSigma(std::vector<float> speech) {
    LoudnessMeter meter;
    meter.SetChannelCount(1);
    meter.Prepare(static_cast<float>(kDialogueRate), 4800);
    const auto hop = static_cast<std::size_t>(kDialogueRate / 10);
    std::vector<double> values;
    for (std::size_t n = 0; n + hop <= speech.size(); n += hop) {
        float* channel[] = {speech.data() + n};
        meter.Process(channel, hop);
        if (static_cast<double>(n + hop) >= kShortTermSeconds * kDialogueRate) values.push_back(meter.ShortTerm());
    }
    double mean = 0.0, square = 0.0;
    for (const double v : values) mean += v;
    mean /= static_cast<double>(values.size());
    for (const double v : values) square += (v - mean) * (v - mean);
    return std::sqrt(square / static_cast<double>(values.size()));
}

}  // namespace

LevellingFigures MeasureLevelling(const DialogueFile& file, const std::vector<float>& output,
                                  const std::vector<float>& applied) {
    std::vector<float> speech;
    for (const DialogueFile::Phrase& p : file.phrases)
        speech.insert(speech.end(), output.begin() + static_cast<std::ptrdiff_t>(p.begin),
                      output.begin() + static_cast<std::ptrdiff_t>(p.end));
    LevellingFigures figures;
    figures.sigma = ShortTermSigma(speech);
    figures.integrated = IntegratedLoudness(speech);
    if (applied.empty()) return figures;

    const auto window = static_cast<std::size_t>(kRateWindowSeconds * kDialogueRate);
    for (std::size_t n = zen::levelling::kEntryFrames; n + window < applied.size(); n += 16)
        figures.fastestChange = std::max(figures.fastestChange, std::abs(Db(applied[n + window]) - Db(applied[n])));
    figures.pausePump = -1e9;
    for (std::size_t k = 0; k + 1 < file.phrases.size(); ++k) {
        const std::size_t from = file.phrases[k].end, to = file.phrases[k + 1].begin;
        const double bound = std::max(Db(applied[from - 1]), Db(applied[to]));
        const float loudest = *std::max_element(applied.begin() + static_cast<std::ptrdiff_t>(from),
                                                applied.begin() + static_cast<std::ptrdiff_t>(to));
        figures.pausePump = std::max(figures.pausePump, Db(loudest) - bound);
    }
    return figures;
}

}  // namespace zentest
