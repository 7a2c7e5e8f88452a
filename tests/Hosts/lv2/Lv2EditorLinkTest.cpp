// The LV2 UI's link: what the editor sets reaches the right port clamped, and
// what the host sends back through ports reads back as parameters, meters,
// bypass and latency.
#include <gtest/gtest.h>

#include <map>
#include <string>
#include <vector>

#include "Library.h"
#include "Lv2EditorLink.h"
#include "PortMap.h"

namespace {

struct Written {
    std::vector<std::pair<std::uint32_t, float>> values;  // port, value in order
};

void Record(LV2UI_Controller controller, uint32_t port, uint32_t size, uint32_t protocol, const void* buffer) {
    ASSERT_EQ(protocol, 0u);
    ASSERT_EQ(size, sizeof(float));
    static_cast<Written*>(controller)->values.emplace_back(port, *static_cast<const float*>(buffer));
}

std::uint32_t PortOf(const zenlv2::PortMap& ports, const std::string& symbol) {
    for (std::uint32_t i = 0; i < ports.Ports().size(); ++i)
        if (ports.Ports()[i].symbol == symbol) return i;
    ADD_FAILURE() << "no port " << symbol;
    return 0;
}

}  // namespace

TEST(Lv2EditorLink, CarriesParametersBypassAndPresetsToPortsAndPortValuesBack) {
    zenlv2::Library library({ZEN_TEST_LIBRARY_PATH});
    ASSERT_TRUE(library.IsLoaded()) << library.Error();
    const auto key = library.Interface().GetPluginList(zen::kAudioPluginKind);
    std::string softClipper;
    for (const auto& [k, entry] : key)
        if (entry.name == "Soft Clipper") softClipper = k;
    auto instance = library.Create(softClipper);
    AudioPlugin& audio = *zen::InterfaceCast<AudioPlugin>(instance.get());
    ASSERT_TRUE(audio.ConfigureChannels(2, 2));
    const zenlv2::PortMap ports(audio, 2, 2);
    Written written;
    zenlv2::Lv2EditorLink link(audio, ports, Record, &written, 44100.0f);

    EXPECT_EQ(link.GetParameterCount(), ports.ParameterCount());
    EXPECT_EQ(link.GetInputChannelCount(), 2u);
    EXPECT_FLOAT_EQ(link.GetSampleRate(), 44100.0f);

    // Every parameter, beyond its range: its own port, the clamped value.
    for (std::uint32_t p = 0; p < link.GetParameterCount(); ++p) {
        zen::ParameterInfo info;
        ASSERT_TRUE(link.GetParameterInfo(p, info));
        SCOPED_TRACE(info.identifier);
        written.values.clear();
        ASSERT_TRUE(link.SetParameter(p, info.maximum + 1000.0f));
        ASSERT_EQ(written.values.size(), 1u);
        EXPECT_EQ(written.values[0].first, PortOf(ports, zenlv2::PortMap::MakeSymbol(info.identifier)));
        EXPECT_FLOAT_EQ(written.values[0].second, info.maximum);
        EXPECT_FLOAT_EQ(link.GetParameter(p), info.maximum);
        // The host's value (automation) comes back through the same port.
        link.PortEvent(written.values[0].first, info.minimum);
        EXPECT_FLOAT_EQ(link.GetParameter(p), info.minimum);
    }

    // Meters read the last value of their port; the others stay at rest.
    const int peak2 = [&] {
        for (std::uint32_t m = 0; m < link.GetMeterCount(); ++m) {
            zen::MeterInfo info;
            link.GetMeterInfo(m, info);
            if (zenlv2::PortMap::MakeSymbol(info.identifier) == "input_peak_2") return static_cast<int>(m);
        }
        return -1;
    }();
    ASSERT_GE(peak2, 0);
    const float rest = link.GetMeter(0);
    link.PortEvent(PortOf(ports, "input_peak_2"), -12.5f);
    EXPECT_FLOAT_EQ(link.GetMeter(static_cast<std::uint32_t>(peak2)), -12.5f);
    EXPECT_FLOAT_EQ(link.GetMeter(0), rest);
    float values[4];
    EXPECT_FALSE(link.ReadMeterArray(0, values, 4));

    link.PortEvent(PortOf(ports, "latency"), 64.0f);
    EXPECT_EQ(link.GetLatency(), 64u);

    written.values.clear();
    link.SetBypass(true);
    EXPECT_TRUE(link.IsBypassed());
    ASSERT_EQ(written.values.size(), 1u);
    EXPECT_EQ(written.values[0], std::make_pair(PortOf(ports, "enabled"), 0.0f));
    link.PortEvent(PortOf(ports, "enabled"), 1.0f);
    EXPECT_FALSE(link.IsBypassed());

    // A preset reaches the plug-in in the host only as port values: all of
    // them, as the library's preset sets them.
    const std::vector<std::string> presets = link.GetPresetNames();
    ASSERT_FALSE(presets.empty());
    auto reference = library.Create(softClipper);
    AudioPlugin& expected = *zen::InterfaceCast<AudioPlugin>(reference.get());
    ASSERT_TRUE(expected.LoadPreset(presets.back()));
    written.values.clear();
    ASSERT_TRUE(link.LoadPreset(presets.back()));
    std::map<std::uint32_t, float> sent(written.values.begin(), written.values.end());
    ASSERT_EQ(sent.size(), link.GetParameterCount());
    for (std::uint32_t p = 0; p < link.GetParameterCount(); ++p) {
        zen::ParameterInfo info;
        link.GetParameterInfo(p, info);
        EXPECT_FLOAT_EQ(sent[PortOf(ports, zenlv2::PortMap::MakeSymbol(info.identifier))], expected.GetParameter(p))
            << info.identifier;
    }
}
