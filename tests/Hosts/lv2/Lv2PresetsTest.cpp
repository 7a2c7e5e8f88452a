// The shipped bundle's factory presets and surround layouts as a Linux host
// reads them through lilv.
#include <gtest/gtest.h>
#include <lv2/port-groups/port-groups.h>

#include <set>

#include "Catalog.h"
#include "Library.h"
#include "LilvHost.h"

using zentest::LilvHost;
using zentest::Lv2Port;

namespace {

zenlv2::Library& ShippedLibrary() {
    static zenlv2::Library library({ZEN_LIBRARY_PATH});
    return library;
}

LilvHost& ShippedHost() {
    static LilvHost host(ZEN_LV2_BUNDLE);
    return host;
}

struct Surround {
    std::uint32_t channels;
    const char* layout;
    const char* groupClass;
    std::vector<std::string> designations;  // in the library's WAV order
};

const Surround kSurrounds[] = {
    {6, "5.1", LV2_PORT_GROUPS__FivePointOneGroup,
     {LV2_PORT_GROUPS__left, LV2_PORT_GROUPS__right, LV2_PORT_GROUPS__center, LV2_PORT_GROUPS__lowFrequencyEffects,
      LV2_PORT_GROUPS__rearLeft, LV2_PORT_GROUPS__rearRight}},
    {8, "7.1", LV2_PORT_GROUPS__SevenPointOneGroup,
     {LV2_PORT_GROUPS__left, LV2_PORT_GROUPS__right, LV2_PORT_GROUPS__center, LV2_PORT_GROUPS__lowFrequencyEffects,
      LV2_PORT_GROUPS__rearLeft, LV2_PORT_GROUPS__rearRight, LV2_PORT_GROUPS__sideLeft,
      LV2_PORT_GROUPS__sideRight}},
};

}  // namespace

TEST(Lv2Presets, PluginsWiderThanStereoAreOfferedIn51And71WithTheirLoudspeakers) {
    ASSERT_TRUE(ShippedLibrary().IsLoaded()) << ShippedLibrary().Error();
    std::size_t surround = 0, narrow = 0;
    for (const auto& [key, entry] : ShippedLibrary().Interface().GetPluginList(zen::kAudioPluginKind)) {
        const auto instance = ShippedLibrary().Create(key);
        AudioPlugin& audio = *zen::InterfaceCast<AudioPlugin>(instance.get());
        const bool hasInput = instance->GetDescriptor()->inputChannelLimit > 0;
        for (const Surround& format : kSurrounds) {
            SCOPED_TRACE(key + " " + format.layout);
            const LilvPlugin* plugin = ShippedHost().Find(zenlv2::Catalog::MakeUri(key, format.layout));
            if (!audio.ConfigureChannels(hasInput ? format.channels : 0, format.channels)) {
                EXPECT_EQ(plugin, nullptr);
                ++narrow;
                continue;
            }
            ASSERT_NE(plugin, nullptr);
            ++surround;
            EXPECT_NE(ShippedHost().Name(plugin).find(std::string("(") + format.layout + ")"), std::string::npos);
            std::vector<std::string> inputs, outputs;
            for (const Lv2Port& port : ShippedHost().Ports(plugin)) {
                if (!port.audio) continue;
                EXPECT_EQ(port.groupClass, format.groupClass) << port.symbol;
                (port.input ? inputs : outputs).push_back(port.designation);
            }
            EXPECT_EQ(outputs, format.designations);
            if (hasInput) {
                EXPECT_EQ(inputs, format.designations);
            }
        }
    }
    EXPECT_GE(surround, 2u);  // Limiter, Reverb, ...
    EXPECT_GE(narrow, 2u);    // De-Esser: mono and stereo only
}

TEST(Lv2Presets, EveryFactoryPresetIsAnLv2PresetOfEveryLayoutWithTheLibrarysValues) {
    std::size_t checked = 0;
    for (const zenlv2::Variant& variant : zenlv2::Catalog::Build(ShippedLibrary())) {
        SCOPED_TRACE(variant.uri);
        const auto instance = ShippedLibrary().Create(variant.key);
        AudioPlugin& audio = *zen::InterfaceCast<AudioPlugin>(instance.get());
        const LilvPlugin* plugin = ShippedHost().Find(variant.uri);
        ASSERT_NE(plugin, nullptr);
        std::map<std::string, std::uint32_t> parameterOfSymbol;  // found by label, as a host author would
        for (const Lv2Port& port : ShippedHost().Ports(plugin))
            for (std::uint32_t p = 0; p < audio.GetParameterCount(); ++p) {
                zen::ParameterInfo info;
                audio.GetParameterInfo(p, info);
                if (port.input && !port.audio && port.name == info.label) parameterOfSymbol[port.symbol] = p;
            }
        ASSERT_EQ(parameterOfSymbol.size(), audio.GetParameterCount());

        const std::vector<zentest::Lv2Preset> presets = ShippedHost().Presets(plugin);
        std::set<std::string> labels;
        for (const zentest::Lv2Preset& preset : presets) labels.insert(preset.label);
        const std::vector<std::string> names = audio.GetPresetNames();
        EXPECT_EQ(labels, std::set<std::string>(names.begin(), names.end()));
        for (const zentest::Lv2Preset& preset : presets) {
            SCOPED_TRACE(preset.label);
            // A preset sets what it names over the defaults, as a host applying
            // every port value does.
            const auto fresh = ShippedLibrary().Create(variant.key);
            AudioPlugin& presetAudio = *zen::InterfaceCast<AudioPlugin>(fresh.get());
            ASSERT_TRUE(presetAudio.LoadPreset(preset.label));
            EXPECT_EQ(preset.values.size(), parameterOfSymbol.size());
            for (const auto& [symbol, value] : preset.values) {
                ASSERT_EQ(parameterOfSymbol.count(symbol), 1u) << symbol;
                EXPECT_EQ(value, presetAudio.GetParameter(parameterOfSymbol[symbol])) << symbol;
            }
            ++checked;
        }
    }
    EXPECT_GE(checked, 20u);
}
