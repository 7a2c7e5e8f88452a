// zenfx control: the console's settings documents, edited through their
// control plug-ins (kind 2) by parameters and state only, and stored in the
// settings folder. Test tones and performance runs are run from their
// documents by the host core.
#include <cctype>
#include <cstdio>
#include <iostream>
#include <memory>

#include <nlohmann/json.hpp>

#include "Commands.h"
#include "HostCore/Settings/Documents/ConsoleDocuments.h"
#include "HostCore/Settings/Documents/OscillatorDocument.h"
#include "HostCore/Settings/Documents/PerformanceDocument.h"
#include "HostCore/Settings/SettingsStore.h"
#include "HostCore/Tools/PerformanceRun.h"
#include "HostCore/Tools/TestToneGenerator.h"
#include "NameSuggestions.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {

using zen::host::SettingsDocument;

// One control plug-in and the stored document behind it.
class ControlSession {
public:
    ControlSession(PluginLibrary& library, const std::string& name, const std::string& folder) : m_store(folder) {
        std::vector<std::string> names;
        for (const auto& [key, entry] : library.Interface().GetPluginList(zen::kControlPluginKind)) {
            if (EqualsIgnoreCase(key, name)) m_name = key;
            names.push_back(key);
        }
        if (m_name.empty())
            throw ZenfxError("unknown control plug-in '" + name + "'" + DidYouMean(name, names) +
                             " (zenfx control list shows them)");
        m_instance = library.Create({zen::kControlPluginKind, m_name, {}});
        m_control = zen::InterfaceCast<ControlPlugin>(m_instance.get());
        if (m_control == nullptr) throw ZenfxError("'" + m_name + "' is not a control plug-in");
        m_schema = zen::host::FindConsoleDocument(zen::host::DocumentRoot(m_control->SaveState()));
        if (m_schema == nullptr) throw ZenfxError("'" + m_name + "' keeps no settings document zenfx knows");
        std::string text;
        m_stored = m_store.Read(*m_schema, text);
        if (!m_stored) return;
        SettingsDocument::Parse(*m_schema, text, Path());  // the one-line error with the place
        if (!m_control->LoadState(text)) throw ZenfxError("'" + m_name + "' refused " + Path());
    }

    const std::string& Name() const { return m_name; }
    std::string Path() const { return m_store.PathOf(*m_schema); }
    bool Stored() const { return m_stored; }
    ControlPlugin& Control() { return *m_control; }
    SettingsDocument Document() const { return SettingsDocument::Parse(*m_schema, m_control->SaveState(), m_name); }

    // The plug-in takes the document whole, and its state is stored.
    void Store(const SettingsDocument& document) {
        if (!m_control->LoadState(document.ToXml())) throw ZenfxError("'" + m_name + "' refused the settings");
        m_store.Write(*m_schema, m_control->SaveState());
        m_stored = true;
    }

private:
    zen::host::SettingsStore m_store;
    std::string m_name;
    std::unique_ptr<zen::PluginInstance> m_instance;
    ControlPlugin* m_control = nullptr;
    const zen::host::DocumentSchema* m_schema = nullptr;
    bool m_stored = false;
};

nlohmann::json SettingJson(const SettingsDocument& d, std::size_t s, std::size_t r, std::size_t f) {
    const zen::host::FieldSchema& field = d.Schema().sections[s].fields[f];
    switch (field.type) {
        case zen::host::FieldType::Text: return d.Text(s, r, f);
        case zen::host::FieldType::Choice: return d.Format(s, r, f);
        case zen::host::FieldType::Integer: return static_cast<long long>(d.Number(s, r, f));
        case zen::host::FieldType::Number: break;
    }
    return d.Number(s, r, f);
}

// key -> value of every setting, in document order.
template <class Visit>
void ForEachSetting(const SettingsDocument& d, Visit visit) {
    for (std::size_t s = 0; s < d.Schema().sections.size(); ++s)
        for (std::size_t r = 0; r < d.RecordCount(s); ++r)
            for (std::size_t f = 0; f < d.Schema().sections[s].fields.size(); ++f) visit(s, r, f);
}

nlohmann::json Describe(ControlSession& session, const SettingsDocument& d) {
    nlohmann::json settings = nlohmann::json::object();
    ForEachSetting(
        d, [&](std::size_t s, std::size_t r, std::size_t f) { settings[d.Key(s, r, f)] = SettingJson(d, s, r, f); });
    return {{"name", session.Name()},
            {"document", d.Schema().root},
            {"file", session.Path()},
            {"stored", session.Stored()},
            {"parameters", session.Control().GetParameterCount()},
            {"settings", settings}};
}

void PrintSettings(const SettingsDocument& d) {
    std::size_t width = 0;
    ForEachSetting(
        d, [&](std::size_t s, std::size_t r, std::size_t f) { width = std::max(width, d.Key(s, r, f).size()); });
    ForEachSetting(d, [&](std::size_t s, std::size_t r, std::size_t f) {
        std::printf("  %-*s  %s\n", static_cast<int>(width), d.Key(s, r, f).c_str(), d.Format(s, r, f).c_str());
    });
    for (std::size_t s = 0; s < d.Schema().sections.size(); ++s) {
        const zen::host::SectionSchema& section = d.Schema().sections[s];
        std::string key = section.element;
        for (char& c : key) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
        if (section.IsList())
            std::printf("  (%zu %s entries; %s%zu.NAME=VALUE adds one, %s1=remove removes one)\n", d.RecordCount(s),
                        section.element.c_str(), key.c_str(), d.RecordCount(s) + 1, key.c_str());
    }
    std::fflush(stdout);
}

int RunTones(ControlSession& session, const ControlOptions& options) {
    if (options.output.empty()) throw ZenfxError("give the file to render the test tone into with -o", kExitUsage);
    const auto tone = zen::host::OscillatorDocument::Read(session.Document());
    zen::host::TestToneGenerator::Render(tone, options.output);
    static const char* kSignals[] = {"sine", "pink noise", "white noise", "sweep"};
    std::cout << "zenfx: wrote " << tone.duration << " s of " << kSignals[tone.signal] << " at " << tone.levelDb
              << " dBFS (" << tone.channels << (tone.channels == 1 ? " channel, " : " channels, ") << tone.sampleRate
              << " Hz) to " << options.output << "\n";
    return 0;
}

int RunPerformance(PluginLibrary& library, ControlSession& session, const ControlOptions& options) {
    const auto run = zen::host::PerformanceDocument::Read(session.Document());
    if (!options.json)
        std::printf("%d Hz, blocks of %d, %d channels, %.1f s of audio per plug-in\n  %-24s %-8s %12s %10s\n",
                    run.sampleRate, run.blockSize, run.channels, run.duration, "PLUG-IN", "CHANNELS", "REALTIME",
                    "CPU LOAD");
    const auto results = zen::host::PerformanceRun::Run(library.Interface(), run, [&](const auto& r) {
        if (options.json) return;
        if (!r.error.empty())
            std::printf("  %-24s %s\n", r.name.c_str(), r.error.c_str());
        else
            std::printf("  %-24s %-8u %11.1fx %9.2f%%\n", r.name.c_str(), r.channels, r.realtimeFactor, r.cpuLoad);
        std::fflush(stdout);
    });
    if (!options.json) return 0;
    nlohmann::json rows = nlohmann::json::array();
    for (const auto& r : results) {
        nlohmann::json row = {{"name", r.name},
                              {"key", r.key},
                              {"channels", r.channels},
                              {"realtime", r.realtimeFactor},
                              {"cpuLoad", r.cpuLoad},
                              {"audioSeconds", r.audioSeconds},
                              {"cpuSeconds", r.cpuSeconds}};
        if (!r.error.empty()) row["error"] = r.error;
        rows.push_back(row);
    }
    std::cout << nlohmann::json{{"sampleRate", run.sampleRate},
                                {"blockSize", run.blockSize},
                                {"channels", run.channels},
                                {"duration", run.duration},
                                {"plugins", rows}}
                     .dump(2)
              << "\n";
    return 0;
}

}  // namespace

int RunControl(PluginLibrary& library, const ControlOptions& options) {
    if (options.action == "list") {
        nlohmann::json rows = nlohmann::json::array();
        for (const auto& [name, entry] : library.Interface().GetPluginList(zen::kControlPluginKind)) {
            try {
                ControlSession session(library, name, options.configFolder);
                const nlohmann::json row = Describe(session, session.Document());
                rows.push_back({{"name", row["name"]},
                                {"document", row["document"]},
                                {"file", row["file"]},
                                {"stored", row["stored"]},
                                {"parameters", row["parameters"]}});
            } catch (const std::exception& e) {  // one broken document does not hide the others
                rows.push_back({{"name", name}, {"error", e.what()}});
            }
        }
        if (options.json) {
            std::cout << rows.dump(2) << "\n";
            return 0;
        }
        for (const auto& row : rows) {
            if (row.contains("error")) {
                std::printf("  %-26s %s\n", row["name"].get<std::string>().c_str(),
                            row["error"].get<std::string>().c_str());
                continue;
            }
            std::printf("  %-26s %-22s %4u parameters  %s%s\n", row["name"].get<std::string>().c_str(),
                        row["document"].get<std::string>().c_str(), row["parameters"].get<unsigned>(),
                        row["file"].get<std::string>().c_str(), row["stored"].get<bool>() ? "" : " (not yet written)");
        }
        return 0;
    }

    ControlSession session(library, options.plugin, options.configFolder);
    if (options.action == "set") {
        if (options.assignments.empty()) throw ZenfxError("give at least one KEY=VALUE to set", kExitUsage);
        SettingsDocument document = session.Document();
        for (const std::string& assignment : options.assignments) {
            const std::size_t equals = assignment.find('=');
            if (equals == std::string::npos || equals == 0)
                throw ZenfxError("'" + assignment + "' is not KEY=VALUE", kExitUsage);
            document.Set(assignment.substr(0, equals), assignment.substr(equals + 1));
        }
        document.Check();
        session.Store(document);
    } else if (options.action == "run") {
        if (session.Name() == "Test Tones Settings") return RunTones(session, options);
        if (session.Name() == "Performance Testing") return RunPerformance(library, session, options);
        throw ZenfxError("'" + session.Name() + "' has nothing to run (Test Tones Settings and Performance Testing do)",
                         kExitUsage);
    }
    const SettingsDocument document = session.Document();
    if (options.json) {
        std::cout << Describe(session, document).dump(2) << "\n";
        return 0;
    }
    std::cout << session.Name() << " (" << document.Schema().root << ", " << session.Path()
              << (session.Stored() ? "" : ", not yet written: the defaults") << ")\n";
    PrintSettings(document);
    return 0;
}

}  // namespace zenfx
