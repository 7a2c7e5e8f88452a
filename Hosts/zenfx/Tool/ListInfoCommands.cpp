// zenfx list, zenfx info and zenfx demo.
#include <algorithm>
#include <cstdio>
#include <iomanip>
#include <iostream>
#include <sstream>

#include <nlohmann/json.hpp>

#include "AudioFile.h"
#include "Commands.h"
#include "DemoMaterial.h"
#include "MeterJson.h"
#include "ParameterValue.h"
#include "RunFiles.h"
#include "TextColumns.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {

std::string FormatVersion(double version) {
    std::ostringstream out;
    out << std::fixed << std::setprecision(1) << version;
    return out.str();
}

const char* KindName(int kind) { return kind == zen::kAudioPluginKind ? "audio" : "control"; }

nlohmann::json DescribePlugin(const PluginEntry& plugin, zen::PluginInstance& instance) {
    nlohmann::json row = {{"kind", KindName(plugin.kind)}, {"key", plugin.key}, {"name", plugin.entry.name},
                          {"channelCount", plugin.entry.channelCount}, {"listFlags", plugin.entry.listFlags}};
    if (const zen::PluginDescriptor* d = instance.GetDescriptor()) {
        row["code"] = zen::PluginCodeToString(d->code);
        row["codeDecimal"] = d->code;
        row["version"] = d->version;
        row["inputs"] = d->inputChannelLimit;
        row["outputs"] = d->outputChannelLimit;
        row["class"] = d->className;
        row["flags"] = d->flags;
    } else {
        row["version"] = 1.0;
    }
    return row;
}

}  // namespace

int RunList(PluginLibrary& library, bool json) {
    nlohmann::json rows = nlohmann::json::array();
    for (const PluginEntry& plugin : library.List()) rows.push_back(DescribePlugin(plugin, *library.Create(plugin)));
    if (json) {
        std::cout << rows.dump(2) << "\n";
        return 0;
    }
    for (int kind : {zen::kAudioPluginKind, zen::kControlPluginKind}) {
        std::size_t count = 0;
        for (const auto& row : rows) count += row["kind"] == KindName(kind) ? 1 : 0;
        std::cout << (kind == zen::kAudioPluginKind ? "Audio" : "Control") << " plug-ins (kind " << kind << "): "
                  << count << "\n";
        if (kind == zen::kAudioPluginKind && count > 0)
            std::printf("  %-34s %-24s %-5s %-11s %-7s %-4s %-4s %-26s %s\n", "KEY", "NAME", "CODE", "DECIMAL",
                        "VERSION", "IN", "OUT", "CLASS", "LIST FLAGS");
        for (const auto& row : rows) {
            if (row["kind"] != KindName(kind)) continue;
            if (kind == zen::kAudioPluginKind) {
                std::printf("  %-34s %-24s %-5s %-11d %-7s %-4u %-4u %-26s %u\n",
                            row["key"].get<std::string>().c_str(), row["name"].get<std::string>().c_str(),
                            row["code"].get<std::string>().c_str(), row["codeDecimal"].get<int>(),
                            FormatVersion(row["version"].get<double>()).c_str(), row["inputs"].get<unsigned>(),
                            row["outputs"].get<unsigned>(), row["class"].get<std::string>().c_str(),
                            row["listFlags"].get<unsigned>());
            } else {
                std::printf("  %-34s version %s\n", row["key"].get<std::string>().c_str(),
                            FormatVersion(row["version"].get<double>()).c_str());
            }
        }
    }
    std::fflush(stdout);
    return 0;
}

int RunInfo(PluginLibrary& library, const InfoOptions& options) {
    const PluginEntry plugin = library.FindAudioPlugin(options.plugin);
    auto instance = library.Create(plugin);
    AudioPlugin& audio = AudioOf(*instance);
    const zen::PluginDescriptor& d = *instance->GetDescriptor();
    const std::uint32_t channels = std::min(2u, d.outputChannelLimit);
    audio.ConfigureChannels(d.inputChannelLimit == 0 ? 0 : channels, channels);
    if (!audio.Prepare(static_cast<float>(options.sampleRate), 512))
        throw ZenfxError("'" + plugin.entry.name + "' cannot run at " + std::to_string(options.sampleRate) + " Hz");

    nlohmann::json row = DescribePlugin(plugin, *instance);
    row["sampleRate"] = options.sampleRate;
    row["latency"] = audio.GetLatency();
    row["tail"] = audio.GetTailLength();
    row["blockBased"] = audio.IsBlockBased();
    row["locksAudioPath"] = audio.LocksAudioPath();
    row["configuredChannels"] = channels;
    nlohmann::json parameters = nlohmann::json::array();
    for (std::uint32_t i = 0; i < audio.GetParameterCount(); ++i) {
        zen::ParameterInfo p;
        audio.GetParameterInfo(i, p);
        static const char* kKinds[] = {"continuous", "switch", "list"};
        static const char* kTapers[] = {"linear", "logarithmic", "list"};
        parameters.push_back({{"index", i},
                              {"identifier", p.identifier},
                              {"label", p.label},
                              {"kind", kKinds[static_cast<int>(p.kind)]},
                              {"taper", kTapers[static_cast<int>(p.taper)]},
                              {"minimum", p.minimum},
                              {"maximum", p.maximum},
                              {"default", p.defaultValue},
                              {"step", p.step},
                              {"unit", p.unit},
                              {"choices", p.choices}});
    }
    row["parameters"] = parameters;
    nlohmann::json meters = nlohmann::json::array();
    for (std::uint32_t i = 0; i < audio.GetMeterCount(); ++i) {
        zen::MeterInfo m;
        audio.GetMeterInfo(i, m);
        nlohmann::json meter = DescribeMeter(m);
        meter["index"] = i;
        meters.push_back(meter);
    }
    row["meters"] = meters;
    row["presets"] = audio.GetPresetNames();

    if (options.json) {
        std::cout << row.dump(2) << "\n";
        return 0;
    }
    std::cout << plugin.entry.name << "\n"
              << "  key        " << plugin.key << "\n"
              << "  code       " << row["code"].get<std::string>() << " (" << d.code << ")\n"
              << "  version    " << FormatVersion(d.version) << "\n"
              << "  class      " << d.className << "\n"
              << "  channels   up to " << d.inputChannelLimit << " in, " << d.outputChannelLimit << " out\n"
              << "  list flags " << d.listFlags << "\n"
              << "  latency    " << audio.GetLatency() << " samples at " << options.sampleRate << " Hz\n"
              << "  tail       " << audio.GetTailLength() << " samples\n"
              << "  processing " << (audio.IsBlockBased() ? "block-based" : "sample by sample")
              << (audio.LocksAudioPath() ? ", takes a lock on the audio path" : "") << "\n"
              << "\nParameters:\n";
    // Columns as wide as their longest entry, in characters.
    std::size_t labelWidth = 18, identifierWidth = 36, rangeWidth = 34;
    std::vector<zen::ParameterInfo> infos(audio.GetParameterCount());
    for (std::uint32_t i = 0; i < infos.size(); ++i) {
        audio.GetParameterInfo(i, infos[i]);
        labelWidth = std::max(labelWidth, DisplayWidth(infos[i].label));
        identifierWidth = std::max(identifierWidth, DisplayWidth(infos[i].identifier));
        rangeWidth = std::max(rangeWidth, DisplayWidth(DescribeRange(infos[i])));
    }
    const zen::ParameterInfo* example = nullptr;  // a parameter with a unit, a percentage first
    for (const zen::ParameterInfo& p : infos) {
        if (p.kind == zen::ParameterKind::Continuous && !p.unit.empty() &&
            (example == nullptr || (p.unit == "%" && example->unit != "%")))
            example = &p;
        std::cout << "  " << std::setw(2) << &p - infos.data() << "  " << PadRight(p.label, labelWidth) << " "
                  << PadRight(p.identifier, identifierWidth) << " " << PadRight(DescribeRange(p), rangeWidth)
                  << " default " << FormatParameterValue(p, p.defaultValue)
                  << (p.taper == zen::ParameterTaper::Logarithmic ? ", logarithmic" : "") << "\n";
    }
    if (example != nullptr) {
        std::ostringstream value;
        value << static_cast<double>(example->defaultValue);
        std::cout << "  --set takes values in the unit shown: " << example->label << "=" << value.str() << " and "
                  << example->label << "=" << value.str() << example->unit << " are both "
                  << FormatParameterValue(*example, example->defaultValue) << "\n";
    }
    std::fflush(stdout);
    std::cout << "\nMeters (" << channels << " channel" << (channels == 1 ? "" : "s") << "):\n";
    for (const auto& m : meters) {
        const std::string unit = m["unit"].get<std::string>();
        std::string kind;
        if (m["kind"] == "array") kind = ", array of " + std::to_string(m["size"].get<unsigned>());
        if (m["kind"] == "ring")
            kind = ", ring of " + std::to_string(m["capacity"].get<unsigned>()) + " x " +
                   std::to_string(m["size"].get<unsigned>());
        const std::string both = unit.empty() ? (kind.empty() ? "" : kind.substr(2)) : unit + kind;
        const std::string details = both.empty() ? "" : " (" + both + ")";
        std::cout << "  " << std::setw(2) << m["index"].get<unsigned>() << "  " << m["name"].get<std::string>()
                  << details << "\n";
    }
    if (meters.empty()) std::cout << "  none\n";
    std::cout << "\nPresets:\n";
    for (const std::string& preset : audio.GetPresetNames()) std::cout << "  " << preset << "\n";
    if (audio.GetPresetNames().empty()) std::cout << "  none\n";
    return 0;
}

int RunDemo(const std::string& output, const std::string& format) {
    RunFiles().AddOutput("-o", output);
    DemoMaterial demo;
    AudioFileWriter writer(output, demo.SampleRate(), demo.Channels(),
                           ChooseOutputFormat(output, demo.Format(), format));
    writer.Write(demo.Interleaved().data(), demo.Frames());
    writer.Commit();
    std::cout << "zenfx: wrote the demo material (" << demo.Frames() << " frames, " << demo.Channels()
              << " channels, " << demo.SampleRate() << " Hz) to " << output << "\n";
    return 0;
}

}  // namespace zenfx
