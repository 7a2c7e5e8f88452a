// The test library's LV2 bundle loaded through lilv, as a Linux host loads
// it: every plug-in at 44.1 and 96 kHz, blocks of changing length with
// parameter changes, checked sample for sample against the same plug-in run
// directly through the library.
#include <gtest/gtest.h>
#include <lv2/core/lv2.h>
#include <lv2/port-groups/port-groups.h>
#include <lv2/port-props/port-props.h>
#include <lv2/state/state.h>

#include <algorithm>
#include <cmath>
#include <map>
#include <random>

#include "Catalog.h"
#include "HostCore/HostError.h"
#include "HostCore/Studio/StudioModel.h"
#include "Library.h"
#include "LilvHost.h"
#include "PortMap.h"

using zentest::LilvHost;
using zentest::LilvRun;
using zentest::Lv2Port;

namespace {

constexpr double kRates[] = {44100.0, 96000.0};
// Lengths around the prepared maximum (LilvHost::kMaxBlock), one sample, and
// odd sizes; a setting changes before every block marked true.
constexpr std::pair<std::uint32_t, bool> kBlocks[] = {{1, false},    {17, true},  {512, false}, {4096, true},
                                                       {4097, false}, {3, true},   {8193, true},  {700, false}};

zenlv2::Library& TestLibrary() {
    static zenlv2::Library library({ZEN_TEST_LIBRARY_PATH});
    return library;
}

LilvHost& Host() {
    static LilvHost host(ZEN_LV2_TEST_BUNDLE);
    return host;
}

// The plug-in a URI names, run directly through the library as the first
// slot of a studio channel in the URI's layout; a plug-in with background
// work may load more slots after it when prepared, as in the adapter.
struct Direct {
    std::unique_ptr<zen::host::StudioModel> studio;
    zen::PluginInstance* instance = nullptr;
    AudioPlugin* audio = nullptr;

    void Prepare(double rate) {
        studio->RunBackgroundTasks(0, false);
        studio->Prepare(rate, LilvHost::kMaxBlock);
    }
    bool Process(float* const* buffers, std::uint32_t frames) { return studio->Process(0, buffers, frames); }
    std::uint64_t Latency() const { return studio->Latency(0); }
};

Direct CreateDirect(const std::string& uri) {
    for (const zenlv2::Variant& variant : zenlv2::Catalog::Build(TestLibrary())) {
        if (variant.uri != uri) continue;
        Direct direct;
        direct.studio = std::make_unique<zen::host::StudioModel>(TestLibrary().Interface());
        direct.studio->AddChannel(variant.name, variant.outputs, variant.inputs == 0 ? variant.outputs : variant.inputs);
        try {
            direct.studio->InsertPlugin(0, variant.key);
        } catch (const zen::host::HostError&) {
            continue;
        }
        direct.instance = direct.studio->GetChannel(0).chain[0].instance.get();
        direct.audio = &direct.studio->PluginAt(0, 0);
        return direct;
    }
    return {};
}

// Control inputs by parameter index, found by label as a host author would.
std::map<std::uint32_t, std::uint32_t> ParameterPorts(const LilvRun& run, Direct& direct) {
    std::map<std::uint32_t, std::uint32_t> ports;  // port -> parameter index
    auto* host = zen::InterfaceCast<ZenControlValueHost>(direct.instance);
    for (const Lv2Port& port : run.Ports()) {
        if (port.audio || !port.input || port.designation == LV2_CORE__enabled) continue;
        const std::int32_t index = host != nullptr ? host->FindParameter(port.name.c_str()) : -1;
        EXPECT_GE(index, 0) << "port " << port.symbol << " names no parameter";
        if (index >= 0) ports[port.index] = static_cast<std::uint32_t>(index);
    }
    return ports;
}

// Meter outputs by meter index, found by symbol (from the identifier) and name.
std::map<std::uint32_t, std::uint32_t> MeterPorts(const LilvRun& run, AudioPlugin& audio) {
    std::map<std::uint32_t, std::uint32_t> ports;
    for (const Lv2Port& port : run.Ports()) {
        if (port.audio || port.input || port.designation == LV2_CORE__latency) continue;
        for (std::uint32_t m = 0; m < audio.GetMeterCount(); ++m) {
            zen::MeterInfo info;
            if (audio.GetMeterInfo(m, info) && zenlv2::PortMap::MakeSymbol(info.identifier) == port.symbol &&
                info.name == port.name)
                ports[port.index] = m;
        }
        EXPECT_EQ(ports.count(port.index), 1u) << "port " << port.symbol << " names no meter";
    }
    return ports;
}

// Level and value meters: the ones a control port can carry.
std::size_t ScalarMeterCount(AudioPlugin& audio) {
    std::size_t count = 0;
    for (std::uint32_t m = 0; m < audio.GetMeterCount(); ++m) {
        zen::MeterInfo info;
        audio.GetMeterInfo(m, info);
        count += info.kind == zen::MeterKind::Level || info.kind == zen::MeterKind::Value ? 1 : 0;
    }
    return count;
}

std::string TestDelayUri(const char* layout) {
    return zenlv2::Catalog::MakeUri("Test Delay:" + std::to_string(zen::MakePluginCode('Z', 't', 'D', 'l')), layout);
}

}  // namespace

TEST(Lv2Bundle, OffersEveryRegisteredPluginInTheMonoAndStereoLayoutsItTakes) {
    ASSERT_TRUE(TestLibrary().IsLoaded()) << TestLibrary().Error();
    const std::vector<std::string> uris = Host().PluginUris();
    std::size_t offered = 0;
    for (const auto& [key, entry] : TestLibrary().Interface().GetPluginList(zen::kAudioPluginKind)) {
        SCOPED_TRACE(key);
        const auto instance = TestLibrary().Create(key);
        AudioPlugin& audio = *zen::InterfaceCast<AudioPlugin>(instance.get());
        const bool hasInput = instance->GetDescriptor()->inputChannelLimit > 0;
        std::size_t layouts = 0;
        for (std::uint32_t channels = 1; channels <= 2; ++channels) {
            if (!audio.ConfigureChannels(hasInput ? channels : 0, channels)) continue;
            const std::string uri = zenlv2::Catalog::MakeUri(key, channels == 1 ? "mono" : "stereo");
            const LilvPlugin* plugin = Host().Find(uri);
            ASSERT_NE(plugin, nullptr) << uri;
            EXPECT_EQ(Host().Name(plugin).rfind(entry.name, 0), 0u) << Host().Name(plugin);
            ++layouts;
        }
        EXPECT_GE(layouts, 1u);
        const std::string prefix = zenlv2::Catalog::MakeUri(key, "");
        offered += static_cast<std::size_t>(std::count_if(
            uris.begin(), uris.end(), [&](const std::string& uri) { return uri.rfind(prefix, 0) == 0; }));
    }
    EXPECT_GE(offered, 4u);             // Soft Clipper and Test Delay at least
    EXPECT_EQ(uris.size(), offered);    // and nothing that is not registered
}

TEST(Lv2Bundle, PortsCarryTheParameterTableMetersAndLatency) {
    for (const std::string& uri : Host().PluginUris()) {
        SCOPED_TRACE(uri);
        const LilvPlugin* plugin = Host().Find(uri);
        LilvRun run(Host(), plugin, 48000.0);
        ASSERT_TRUE(run.Ok());
        Direct direct = CreateDirect(uri);
        ASSERT_NE(direct.audio, nullptr);

        std::size_t audioIn = 0, audioOut = 0, meters = 0, latency = 0, enabled = 0;
        for (const Lv2Port& port : run.Ports()) {
            if (port.audio) {
                (port.input ? audioIn : audioOut)++;
                EXPECT_FALSE(port.designation.empty()) << port.symbol;
                continue;
            }
            if (port.designation == LV2_CORE__latency) {
                ++latency;
                EXPECT_FALSE(port.input);
                EXPECT_TRUE(port.Has(LV2_CORE__reportsLatency));
            } else if (port.designation == LV2_CORE__enabled) {
                ++enabled;
                EXPECT_TRUE(port.Has(LV2_CORE__toggled));
                EXPECT_EQ(port.defaultValue, 1.0f);
            } else if (!port.input) {
                ++meters;
            }
        }
        EXPECT_EQ(audioIn, direct.audio->GetInputChannelCount());
        EXPECT_EQ(audioOut, direct.audio->GetOutputChannelCount());
        EXPECT_EQ(latency, 1u);
        EXPECT_EQ(enabled, 1u);
        EXPECT_EQ(meters, ScalarMeterCount(*direct.audio));

        EXPECT_EQ(MeterPorts(run, *direct.audio).size(), meters);
        const auto parameters = ParameterPorts(run, direct);
        EXPECT_EQ(parameters.size(), direct.audio->GetParameterCount());
        for (const auto& [portIndex, parameter] : parameters) {
            const Lv2Port& port = run.Ports()[portIndex];
            zen::ParameterInfo info;
            ASSERT_TRUE(direct.audio->GetParameterInfo(parameter, info));
            SCOPED_TRACE(info.identifier);
            ASSERT_TRUE(port.hasRange);
            EXPECT_EQ(port.minimum, info.minimum);
            EXPECT_EQ(port.maximum, info.maximum);
            EXPECT_EQ(port.defaultValue, info.defaultValue);
            EXPECT_EQ(port.Has(LV2_CORE__toggled), info.kind == zen::ParameterKind::Switch);
            EXPECT_EQ(port.Has(LV2_CORE__enumeration), info.kind == zen::ParameterKind::List);
            EXPECT_EQ(port.Has(LV2_PORT_PROPS__logarithmic),
                      info.taper == zen::ParameterTaper::Logarithmic && info.minimum > 0.0f);
            ASSERT_EQ(port.scalePoints.size(), info.choices.size());
            for (std::size_t i = 0; i < info.choices.size(); ++i) {
                EXPECT_EQ(port.scalePoints[i].first, zentest::ParameterValueAt(info, static_cast<float>(i) / (info.choices.size() - 1)));
                EXPECT_EQ(port.scalePoints[i].second, info.choices[i]);
            }
        }
    }
}

TEST(Lv2Bundle, ProcessesLikeTheLibraryAtBothRatesThroughChangingBlocksAndSettings) {
    for (const std::string& uri : Host().PluginUris()) {
        for (double rate : kRates) {
            SCOPED_TRACE(uri + " at " + std::to_string(rate));
            LilvRun run(Host(), Host().Find(uri), rate);
            ASSERT_TRUE(run.Ok());
            Direct direct = CreateDirect(uri);
            ASSERT_NE(direct.audio, nullptr);
            const auto parameters = ParameterPorts(run, direct);
            const auto meters = MeterPorts(run, *direct.audio);
            std::mt19937 random(static_cast<std::uint32_t>(rate) ^ static_cast<std::uint32_t>(uri.size()));
            std::uniform_real_distribution<float> fraction(0.0f, 1.0f);
            auto change = [&](bool edges) {
                for (const auto& [port, parameter] : parameters) {
                    zen::ParameterInfo info;
                    direct.audio->GetParameterInfo(parameter, info);
                    const float f = edges ? static_cast<float>(random() % 2) : fraction(random);
                    run.Control(port) = zentest::ParameterValueAt(info, f);
                    direct.audio->SetParameter(parameter, run.Control(port));
                }
            };
            // Settings before activation take effect from the first sample,
            // as they do before Prepare in the library.
            change(false);
            run.Activate();
            ASSERT_NO_THROW(direct.Prepare(rate));

            const auto inputs = run.AudioPorts(true);
            const auto outputs = run.AudioPorts(false);
            std::vector<std::vector<float>> buffers(outputs.size(), std::vector<float>(LilvRun::kMaxFrames));
            std::vector<float*> pointers;
            for (auto& buffer : buffers) pointers.push_back(buffer.data());
            std::uniform_real_distribution<float> sample(-0.9f, 0.9f);
            std::size_t block = 0;
            for (const auto& [frames, changes] : kBlocks) {
                if (changes) change(block % 2 == 1);
                for (std::size_t c = 0; c < outputs.size(); ++c) {
                    for (std::uint32_t i = 0; i < frames; ++i) {
                        const float x = c < inputs.size() ? sample(random) * (block % 3 == 2 ? 2.5f : 1.0f) : 0.0f;
                        buffers[c][i] = x;
                        if (c < inputs.size()) run.Audio(inputs[c])[i] = x;
                    }
                }
                run.Run(frames);
                ASSERT_TRUE(direct.Process(pointers.data(), frames));
                for (std::size_t c = 0; c < outputs.size(); ++c) {
                    const std::vector<float>& out = run.Audio(outputs[c]);
                    for (std::uint32_t i = 0; i < frames; ++i) {
                        ASSERT_TRUE(std::isfinite(out[i])) << "channel " << c << " sample " << i;
                        ASSERT_EQ(out[i], buffers[c][i]) << "block " << block << " channel " << c << " sample " << i;
                    }
                }
                EXPECT_EQ(run.Control("latency"), static_cast<float>(direct.Latency()));
                for (const auto& [port, meter] : meters)
                    EXPECT_EQ(run.Control(port), direct.audio->GetMeter(meter)) << run.Ports()[port].symbol;
                ++block;
            }
        }
    }
}

TEST(Lv2Bundle, LatencyPortFollowsTheSettingsOfTheLastActivation) {
    const std::string uri = TestDelayUri("mono");
    for (double rate : kRates) {
        LilvRun run(Host(), Host().Find(uri), rate);
        ASSERT_TRUE(run.Ok());
        run.Control("delay") = 100.0f;
        run.Activate();
        std::vector<float>& in = run.Audio(run.AudioPorts(true)[0]);
        std::vector<float>& out = run.Audio(run.AudioPorts(false)[0]);
        std::fill(in.begin(), in.end(), 0.0f);
        in[0] = 1.0f;
        run.Run(300);
        EXPECT_EQ(run.Control("latency"), 100.0f);
        EXPECT_EQ(std::max_element(out.begin(), out.begin() + 300) - out.begin(), 100);
        EXPECT_FLOAT_EQ(out[100], 1.0f);

        // The delay is fixed when the plug-in is prepared: a change while
        // running waits for the next activation, and the port says so.
        run.Control("delay") = 37.0f;
        run.Run(64);
        EXPECT_EQ(run.Control("latency"), 100.0f);
        run.Deactivate();
        run.Activate();
        in[0] = 1.0f;
        run.Run(64);
        EXPECT_EQ(run.Control("latency"), 37.0f);
        EXPECT_FLOAT_EQ(out[37], 1.0f);
    }
}

TEST(Lv2Bundle, EnabledPortBypassesAndKeepsTheLatency) {
    const std::string uri = TestDelayUri("stereo");
    LilvRun run(Host(), Host().Find(uri), 48000.0);
    ASSERT_TRUE(run.Ok());
    run.Control("delay") = 10.0f;
    run.Control("gain") = -12.0f;
    run.Control("mode") = 1.0f;  // inverted
    run.Control("enabled") = 0.0f;
    run.Activate();
    for (std::uint32_t port : run.AudioPorts(true)) {
        auto& in = run.Audio(port);
        for (std::size_t i = 0; i < 200; ++i) in[i] = 0.5f * std::sin(0.1f * static_cast<float>(i));
    }
    run.Run(200);
    const auto& in = run.Audio(run.AudioPorts(true)[1]);
    const auto& out = run.Audio(run.AudioPorts(false)[1]);
    EXPECT_EQ(run.Control("latency"), 10.0f);
    for (std::size_t i = 10; i < 200; ++i) ASSERT_FLOAT_EQ(out[i], in[i - 10]) << i;

    run.Control("enabled") = 1.0f;  // back in, after a short fade: inverted and 12 dB down
    run.Run(2000);
    EXPECT_NEAR(out[1999], -std::pow(10.0f, -12.0f / 20.0f) * in[1989], 1e-6f);
}

TEST(Lv2Bundle, HostsThatShareBuffersGetTheSameResult) {
    const std::string uri = zenlv2::Catalog::MakeUri("Soft Clipper:1517179747", "stereo");
    auto render = [&](int sharing) {
        LilvRun run(Host(), Host().Find(uri), 48000.0);
        run.Control("threshold") = 9.0f;
        run.Control("shape") = 0.3f;
        run.Activate();
        const auto in = run.AudioPorts(true);
        const auto out = run.AudioPorts(false);
        std::vector<float> a(1000), b(1000);
        for (std::size_t i = 0; i < 1000; ++i) {
            a[i] = std::sin(0.01f * static_cast<float>(i));
            b[i] = 0.3f * std::cos(0.023f * static_cast<float>(i));
        }
        run.ConnectAudio(in[0], a.data());
        run.ConnectAudio(in[1], b.data());
        // Separate buffers, in place, or crossed (left out over right in).
        float* const outputs[3][2] = {{run.Audio(out[0]).data(), run.Audio(out[1]).data()},
                                      {a.data(), b.data()},
                                      {b.data(), a.data()}};
        run.ConnectAudio(out[0], outputs[sharing][0]);
        run.ConnectAudio(out[1], outputs[sharing][1]);
        run.Run(1000);
        return std::vector<std::vector<float>>{{outputs[sharing][0], outputs[sharing][0] + 1000},
                                               {outputs[sharing][1], outputs[sharing][1] + 1000}};
    };
    const auto separate = render(0);
    EXPECT_EQ(render(1), separate);
    EXPECT_EQ(render(2), separate);
}

namespace {

struct StoredState {
    std::map<LV2_URID, std::pair<std::string, LV2_URID>> values;  // key -> (bytes, type)

    static LV2_State_Status Store(LV2_State_Handle handle, uint32_t key, const void* value, size_t size, uint32_t type,
                                  uint32_t) {
        static_cast<StoredState*>(handle)->values[key] = {std::string(static_cast<const char*>(value), size), type};
        return LV2_STATE_SUCCESS;
    }
    static const void* Retrieve(LV2_State_Handle handle, uint32_t key, size_t* size, uint32_t* type, uint32_t* flags) {
        auto& values = static_cast<StoredState*>(handle)->values;
        const auto found = values.find(key);
        if (found == values.end()) return nullptr;
        *size = found->second.first.size();
        *type = found->second.second;
        *flags = LV2_STATE_IS_POD;
        return found->second.first.data();
    }
};

}  // namespace

TEST(Lv2Bundle, StateTextIsSavedAndRestoredWithThePortsWinning) {
    const std::string uri = zenlv2::Catalog::MakeUri("Soft Clipper:1517179747", "mono");
    LilvRun saved(Host(), Host().Find(uri), 48000.0);
    saved.Control("threshold") = 6.0f;
    saved.Activate();
    saved.Run(16);
    auto* state = static_cast<const LV2_State_Interface*>(
        lilv_instance_get_extension_data(saved.Instance(), LV2_STATE__interface));
    ASSERT_NE(state, nullptr);
    StoredState store;
    ASSERT_EQ(state->save(lilv_instance_get_handle(saved.Instance()), StoredState::Store, &store, 0, nullptr),
              LV2_STATE_SUCCESS);
    ASSERT_EQ(store.values.size(), 1u);
    const std::string text = store.values.begin()->second.first;
    EXPECT_NE(text.find("\"ZenSoftClipper::THRESHOLD\": 6"), std::string::npos) << text;

    // The restored text says +6 dB; the ports, restored by the host as well,
    // say 0 dB and shape 0 and decide what runs: 0.9 passes below the knee.
    LilvRun restored(Host(), Host().Find(uri), 48000.0);
    restored.Control("shape") = 0.0f;
    restored.Activate();
    LV2_Handle handle = lilv_instance_get_handle(restored.Instance());
    EXPECT_EQ(state->restore(handle, StoredState::Retrieve, &store, 0, nullptr), LV2_STATE_SUCCESS);
    restored.Audio(restored.AudioPorts(true)[0]).assign(LilvRun::kMaxFrames, 0.9f);
    restored.Run(1000);
    EXPECT_FLOAT_EQ(restored.Audio(restored.AudioPorts(false)[0])[999], 0.9f);

    StoredState malformed = store;
    malformed.values.begin()->second.first = std::string("{ not a state") + '\0';
    EXPECT_EQ(state->restore(handle, StoredState::Retrieve, &malformed, 0, nullptr), LV2_STATE_ERR_UNKNOWN);
    StoredState empty;
    EXPECT_EQ(state->restore(handle, StoredState::Retrieve, &empty, 0, nullptr), LV2_STATE_SUCCESS);
}

// An "AI" instance runs the chain its template builds at activation: with
// AI_SFX, "Crunch" on brings the distortion in after it; off, the distortion
// and the reverb sit bypassed and the input comes out as it went in, delayed.
TEST(Lv2Bundle, AiInstanceRunsItsTemplateChainThroughTheDistortion) {
    std::string key;
    for (const auto& [k, entry] : TestLibrary().Interface().GetPluginList(zen::kAudioPluginKind))
        if (entry.name == "AI") key = k;
    ASSERT_FALSE(key.empty());
    const std::string uri = zenlv2::Catalog::MakeUri(key, "stereo");
    // Residual against the delayed input, in dB of the input.
    const auto residualDb = [&](float crunch) {
        LilvRun run(Host(), Host().Find(uri), 48000.0);
        EXPECT_TRUE(run.Ok());
        run.Control("template") = 2.0f;  // AI_SFX
        run.Control("crunch_on") = crunch;
        run.Activate();
        constexpr std::uint32_t kFrames = 4800;
        for (std::uint32_t port : run.AudioPorts(true))
            for (std::uint32_t i = 0; i < kFrames; ++i)
                run.Audio(port)[i] = 0.5f * std::sin(2.0f * static_cast<float>(M_PI) * 1000.0f * i / 48000.0f);
        run.Run(kFrames);
        const auto latency = static_cast<std::size_t>(run.Control("latency"));
        const auto& in = run.Audio(run.AudioPorts(true)[0]);
        const auto& out = run.Audio(run.AudioPorts(false)[0]);
        double error = 0.0, reference = 0.0;
        for (std::size_t i = latency + kFrames / 2; i < kFrames; ++i) {
            error += std::pow(out[i] - in[i - latency], 2.0);
            reference += std::pow(in[i - latency], 2.0);
        }
        return 10.0 * std::log10(error / reference + 1e-30);
    };
    EXPECT_LT(residualDb(0.0f), -60.0);
    EXPECT_GT(residualDb(1.0f), -20.0);
}
