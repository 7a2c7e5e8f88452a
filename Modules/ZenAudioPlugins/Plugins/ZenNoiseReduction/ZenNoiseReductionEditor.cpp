// The editor of "Noise Reduction": the noise estimate and the gain applied
// across frequency, the reduction per channel and the settings.
#include "Common/Editor/EditorLayoutRegistry.h"
#include "Common/Editor/ReadoutDisplay.h"
#include "Common/Editor/SpectrumDisplay.h"
#include "Common/Editor/ZenEditor.h"

namespace {

constexpr double kNoiseLowDb = -140.0;
constexpr double kNoiseHighDb = 0.0;
constexpr double kGainLowDb = -60.0;
constexpr double kGainHighDb = 0.0;

void BuildNoiseReductionEditor(ZenEditor& editor) {
    const int noise = editor.FindMeter("NOISE_SPECTRUM");
    const int gain = editor.FindMeter("GAIN_SPECTRUM");
    const int profile = editor.FindMeter("PROFILE");
    if (noise >= 0)
        editor.AddDisplay(new SpectrumDisplay(QObject::tr("Noise Profile"), kNoiseLowDb, kNoiseHighDb,
                                              {{QObject::tr("Noise"), static_cast<std::uint32_t>(noise),
                                                SpectrumDisplay::Source::Array}}),
                          2);
    if (gain >= 0)
        editor.AddDisplay(new SpectrumDisplay(QObject::tr("Gain"), kGainLowDb, kGainHighDb,
                                              {{QObject::tr("Gain"), static_cast<std::uint32_t>(gain),
                                                SpectrumDisplay::Source::Array}}),
                          2);
    if (profile >= 0)
        editor.AddDisplay(ReadoutDisplay::ForState(QObject::tr("Profile"), static_cast<std::uint32_t>(profile),
                                                   QObject::tr("None"), QObject::tr("Learnt")),
                          0);
    editor.AddMeters(QObject::tr("Reduction"), {"REDUCTION"});
    editor.AddGroup(QObject::tr("Reduction"), {"REDUCTION", "SENSITIVITY", "SMOOTHING"});
    editor.AddGroup(QObject::tr("Noise Estimate"), {"ESTIMATE", "LEARN"});
    editor.AddGroup(QObject::tr("Monitor"), {"LISTEN"});
}

const EditorLayoutRegistry::Entry kLayout("ZenNoiseReduction", &BuildNoiseReductionEditor);

}  // namespace
