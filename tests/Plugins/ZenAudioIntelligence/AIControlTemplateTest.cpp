// The control templates: every default and mapping lands inside its target's
// range as the host reads it, and templates set the plug-ins of a real
// studio channel ("CleanUpAmount" 1.0 sends 8, 6 and 5; the two plug-ins
// that share a number are told apart).
#include <gtest/gtest.h>

#include <cstring>
#include <map>
#include <string>

#include "FakeHost.h"
#include "HostCore/Studio/StudioModel.h"
#include "Plugins/ZenAudioIntelligence/AIControlTemplate.h"
#include "Plugins/ZenAudioIntelligence/AITemplateFactory.h"
#include "Plugins/ZenAudioIntelligence/ZenAudioIntelligence.h"
#include "Support/PluginHarness.h"
#include "zen/LevellerEngine.h"

namespace {

using zen::host::StudioModel;

class NullOwner final : public AITemplateOwner {
public:
    bool CallTemplateAction(const char*, const std::vector<std::string>&, std::string*) override { return false; }
    void SetEngineParameter(std::uint32_t, float) override {}
    void ForwardEngineParameter(std::uint32_t, float) override {}
};

// The parameters of a target plug-in ("zen:Reverb:1517179490") by label.
const std::map<std::string, zen::ParameterInfo>& TargetParameters(const std::string& target) {
    static std::map<std::string, std::map<std::string, zen::ParameterInfo>> cache;
    auto& found = cache[target];
    if (found.empty()) {
        const std::string name = target.substr(4, target.rfind(':') - 4);
        zentest::PluginHarness plugin(name);
        zen::ParameterInfo info;
        for (std::uint32_t i = 0; plugin.Audio().GetParameterInfo(i, info); ++i) found[info.label] = info;
    }
    return found;
}

// Where "SetIntParameter" with trunc(value x 10) lands for a host reading
// by the parameter's scale: true when inside its range.
::testing::AssertionResult LandsInside(const std::string& target, const std::string& parameter, float value) {
    const long long integer = AIControlTemplate::ToInteger(value);
    const double tenths = static_cast<double>(integer) / 10.0;
    if (target == AIControlTemplate::kEngine) {
        const int index = AIControlTemplate::EngineIndex(parameter.c_str());
        if (index < 0) return ::testing::AssertionFailure() << "no engine parameter " << parameter;
        const auto& p = zen::levelling::kLevellerParameters[static_cast<std::size_t>(index)];
        if (value >= p.minimum && value <= p.maximum) return ::testing::AssertionSuccess();
        return ::testing::AssertionFailure() << parameter << " " << value << " outside " << p.minimum << ".." << p.maximum;
    }
    if (parameter == AIControlTemplate::kInternalBypass) {
        if (integer >= 0 && integer <= 10000) return ::testing::AssertionSuccess();
        return ::testing::AssertionFailure() << target << " bypass " << integer;
    }
    const auto& parameters = TargetParameters(target);
    const auto it = parameters.find(parameter);
    if (it == parameters.end()) {
        // The reverb has no diffusion: the host skips that default.
        if (parameter == "Diffusion") return ::testing::AssertionSuccess();
        return ::testing::AssertionFailure() << target << " has no " << parameter;
    }
    const zen::ParameterInfo& info = it->second;
    const bool perMille = info.hostScale == zen::HostScale::PerMille;
    const double low = perMille ? 0.0 : info.minimum, high = perMille ? 1000.0 : info.maximum;
    if (tenths >= low - 1e-6 && tenths <= high + 1e-6) return ::testing::AssertionSuccess();
    return ::testing::AssertionFailure() << target << " " << parameter << " integer " << integer << " outside "
                                         << low << ".." << high << (perMille ? " per mille" : "");
}

std::string Name(StudioModel& studio, std::size_t channel, std::size_t slot) {
    return studio.GetChannel(channel).chain.at(slot).name;
}

float Value(StudioModel& studio, std::size_t channel, std::size_t slot, const char* label) {
    auto* controls = zen::InterfaceCast<ZenControlValueHost>(studio.GetChannel(channel).chain.at(slot).instance.get());
    const std::int32_t index = controls->FindParameter(label);
    EXPECT_GE(index, 0) << label;
    return studio.PluginAt(channel, slot).GetParameter(static_cast<std::uint32_t>(index));
}

}  // namespace

TEST(AIControlTemplate, EveryDefaultAndMappingLandsInsideItsTarget) {
    zentest::PluginHarness ai("AI");
    NullOwner owner;
    for (int number = 0; number < static_cast<int>(ai_templates::kNames.size()); ++number) {
        const auto t = ai_templates::Make(number, owner);
        ASSERT_NE(t, nullptr);
        EXPECT_STREQ(t->Name(), ai_templates::kNames[static_cast<std::size_t>(number)]);
        for (const auto& d : t->Defaults()) EXPECT_TRUE(LandsInside(d.target, d.parameter, d.value)) << t->Name();
        for (std::size_t c = 0; c < t->Controls().size(); ++c) {
            zen::ParameterInfo control;
            const std::int32_t index =
                zen::InterfaceCast<ZenControlValueHost>(&ai.Instance())
                    ->FindParameter((std::string("ZenAudioIntelligence::") + t->Controls()[c]).c_str());
            ASSERT_GE(index, 0) << t->Name() << " " << t->Controls()[c];
            ai.Audio().GetParameterInfo(static_cast<std::uint32_t>(index), control);
            // Straight lines: both ends of the control's range suffice.
            for (const auto& m : t->MappingsOf(c))
                for (float v : {control.minimum, control.maximum})
                    EXPECT_TRUE(LandsInside(m.target, m.parameter, m.Apply(v)))
                        << t->Name() << " " << control.label << " = " << v;
        }
    }
}

TEST(AIControlTemplate, CleanUpAmountSendsEightSixAndFive) {
    EXPECT_EQ(AIControlTemplate::ToInteger(-0.15f), -1);  // toward zero, signed

    StudioModel studio(*GetZenPluginInterface());
    const std::size_t dialogue = studio.AddChannel("Dialogue", 2);
    studio.InsertPlugin(dialogue, "AI");
    studio.Prepare(48000, 512);
    std::vector<StudioModel::ActionRecord> sets;
    studio.SetActionObserver([&](const StudioModel::ActionRecord& r) {
        if (r.action == "SetIntParameter") sets.push_back(r);
    });
    studio.RunBackgroundTasks(dialogue, false);
    // The template loads its target after itself, defaults first.
    ASSERT_EQ(studio.GetChannel(dialogue).chain.size(), 2u);
    EXPECT_EQ(Name(studio, dialogue, 1), "Dialogue Processor");
    ASSERT_FALSE(sets.empty());
    EXPECT_EQ(sets.front().arguments, (std::vector<std::string>{"1", "Rumble Filt", "0"}));
    EXPECT_FLOAT_EQ(Value(studio, dialogue, 1, "Exp Speed"), 1000.0f);

    sets.clear();
    studio.PluginAt(dialogue, 0).SetParameter(ZenAudioIntelligence::kCleanUpAmount, 1.0f);
    studio.RunBackgroundTasks(dialogue, false);
    std::vector<std::string> sent;
    for (const auto& r : sets) sent.push_back(r.arguments.at(1) + "=" + r.arguments.at(2));
    EXPECT_EQ(sent, (std::vector<std::string>{"De-Pop Amount=8", "De-Ess Amount=6", "Exp Amount=5"}));
    EXPECT_FLOAT_EQ(Value(studio, dialogue, 1, "De-Pop Amount"), 0.8f);
    EXPECT_FLOAT_EQ(Value(studio, dialogue, 1, "De-Ess Amount"), 0.6f);
    EXPECT_FLOAT_EQ(Value(studio, dialogue, 1, "Exp Amount"), 0.5f);
    EXPECT_EQ(studio.GetChannel(dialogue).chain.size(), 2u);  // found, not loaded again
}

TEST(AIControlTemplate, DistortionAndStereoWidthAreToldApartByName) {
    zentest::FakeHost host;
    host.chain = {"zen:Distortion:1516596851"};
    auto sfx = host.Create("AI:1516596833");
    auto* sfxAudio = zen::InterfaceCast<AudioPlugin>(sfx.get());
    sfxAudio->SetParameter(ZenAudioIntelligence::kTemplate, 2.0f);  // AI_SFX
    sfxAudio->SetParameter(ZenAudioIntelligence::kCrunch, 1.0f);
    static_cast<zen::BackgroundTask*>(sfx->QueryInterface(zen::BackgroundTask::kInterfaceName))->RunBackgroundTask(false);
    auto ambience = host.Create("AI:1516596833");
    zen::InterfaceCast<AudioPlugin>(ambience.get())->SetParameter(ZenAudioIntelligence::kTemplate, 3.0f);
    static_cast<zen::BackgroundTask*>(ambience->QueryInterface(zen::BackgroundTask::kInterfaceName))
        ->RunBackgroundTask(false);

    // The distortion was found, the reverb and the stereo width loaded.
    EXPECT_EQ(host.chain, (std::vector<std::string>{"zen:Distortion:1516596851", "zen:Reverb:1517179490",
                                                    "zen:Stereo Width:1516596851"}));
    std::map<std::string, std::vector<std::string>> setsBySlot;
    for (const auto& a : host.CallsOf("SetIntParameter")) setsBySlot[a.at(0)].push_back(a.at(1) + "=" + a.at(2));
    const auto has = [&](const std::string& slot, const std::string& set) {
        const auto& s = setsBySlot[slot];
        return std::find(s.begin(), s.end(), set) != s.end();
    };
    EXPECT_TRUE(has("0", "Internal Bypass=0"));     // crunch on: distortion runs
    EXPECT_TRUE(has("0", "Ceiling=7500"));          // 1000 - 250
    EXPECT_TRUE(has("2", "Width=6250"));            // "Wide"
    EXPECT_TRUE(has("2", "Internal Bypass=10000"));  // width control off
    for (const auto& s : setsBySlot["0"]) EXPECT_NE(s.rfind("Width", 0), 0u) << s;
    for (const auto& s : setsBySlot["2"]) EXPECT_NE(s.rfind("Ceiling", 0), 0u) << s;
}
