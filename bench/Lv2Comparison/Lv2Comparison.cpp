// Realtime factors of LV2 plug-ins side by side in one lilv host: ours from
// zen.lv2 and open yardsticks installed from Debian, each fed fresh stereo
// full-scale noise at 48 kHz in 512-frame blocks. CPU time of this thread,
// rounds taken in turn so that a busy machine weighs on every plug-in alike;
// the best and the median round are printed, net of the host's own cost (the
// same loop without the plug-in, timed in the same round). Not part of make
// test or bench.
//
//   LV2_PATH=build/lib/lv2:/usr/lib/lv2 build/bin/ZenLv2Comparison
//       urn:zenaudioplugins:Limiter:1517177970:stereo
//       http://lsp-plug.in/plugins/lv2/limiter_stereo ovs=0
//
// Arguments: plug-in URIs, each followed by any symbol=value settings of its
// control ports (the rest keep their defaults); --seconds N of audio per round
// (default 20), --rounds N (default 7).
#include <lilv/lilv.h>
#include <lv2/atom/atom.h>
#include <lv2/buf-size/buf-size.h>
#include <lv2/options/options.h>
#include <lv2/urid/urid.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <memory>
#include <random>
#include <string>
#include <utility>
#include <vector>

namespace {

constexpr double kRate = 48000.0;
constexpr std::uint32_t kBlock = 512;
constexpr std::size_t kAtomCapacity = 8192;

struct UridMap {
    std::vector<std::string> uris;
    static LV2_URID Map(LV2_URID_Map_Handle handle, const char* uri) {
        auto& uris = static_cast<UridMap*>(handle)->uris;
        const auto found = std::find(uris.begin(), uris.end(), uri);
        if (found != uris.end()) return static_cast<LV2_URID>(found - uris.begin() + 1);
        uris.emplace_back(uri);
        return static_cast<LV2_URID>(uris.size());
    }
    static const char* Unmap(LV2_URID_Unmap_Handle handle, LV2_URID urid) {
        const auto& uris = static_cast<UridMap*>(handle)->uris;
        return urid >= 1 && urid <= uris.size() ? uris[urid - 1].c_str() : nullptr;
    }
};

double ThreadSeconds() {
    timespec t{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &t);
    return static_cast<double>(t.tv_sec) + 1e-9 * static_cast<double>(t.tv_nsec);
}

struct Subject {
    std::string uri;
    std::vector<std::pair<std::string, float>> settings;
    LilvInstance* instance = nullptr;
    std::vector<float> controls;
    std::vector<std::vector<float>> audio;             // per port; empty unless audio or CV
    std::vector<std::vector<float>> sources;           // per audio input: noise to walk through
    std::vector<std::unique_ptr<std::uint64_t[]>> atoms;  // per atom port
    std::vector<std::uint32_t> atomInputs, atomOutputs;
    std::size_t position = 0;
    std::vector<double> factors;
};

class Host {
public:
    Host() : m_world(lilv_world_new()) {
        lilv_world_load_all(m_world);
        m_mapFeature = {LV2_URID__map, &m_map};
        m_unmapFeature = {LV2_URID__unmap, &m_unmap};
        m_options[0] = {LV2_OPTIONS_INSTANCE, 0, Urid(LV2_BUF_SIZE__maxBlockLength), sizeof(std::int32_t),
                        Urid(LV2_ATOM__Int), &m_blockLength};
        m_options[1] = {LV2_OPTIONS_INSTANCE, 0, Urid(LV2_BUF_SIZE__minBlockLength), sizeof(std::int32_t),
                        Urid(LV2_ATOM__Int), &m_minBlockLength};
        m_options[2] = {LV2_OPTIONS_INSTANCE, 0, 0, 0, 0, nullptr};
        m_optionsFeature = {LV2_OPTIONS__options, m_options};
        m_boundedFeature = {LV2_BUF_SIZE__boundedBlockLength, nullptr};
    }
    ~Host() { lilv_world_free(m_world); }

    bool Instantiate(Subject& subject) {
        LilvNode* uri = lilv_new_uri(m_world, subject.uri.c_str());
        const LilvPlugin* plugin = lilv_plugins_get_by_uri(lilv_world_get_all_plugins(m_world), uri);
        lilv_node_free(uri);
        if (plugin == nullptr) {
            std::fprintf(stderr, "error: no LV2 plug-in %s (is its bundle in LV2_PATH?)\n", subject.uri.c_str());
            return false;
        }
        const LV2_Feature* features[] = {&m_mapFeature, &m_unmapFeature, &m_optionsFeature, &m_boundedFeature,
                                         nullptr};
        subject.instance = lilv_plugin_instantiate(plugin, kRate, features);
        if (subject.instance == nullptr) {
            std::fprintf(stderr, "error: %s cannot be instantiated\n", subject.uri.c_str());
            return false;
        }
        const std::uint32_t ports = lilv_plugin_get_num_ports(plugin);
        std::vector<float> minimum(ports), maximum(ports);
        subject.controls.resize(ports);
        lilv_plugin_get_port_ranges_float(plugin, minimum.data(), maximum.data(), subject.controls.data());
        subject.audio.resize(ports);
        subject.sources.resize(ports);
        subject.atoms.resize(ports);
        LilvNode* audioClass = lilv_new_uri(m_world, LILV_URI_AUDIO_PORT);
        LilvNode* cvClass = lilv_new_uri(m_world, LILV_URI_CV_PORT);
        LilvNode* atomClass = lilv_new_uri(m_world, LV2_ATOM__AtomPort);
        LilvNode* inputClass = lilv_new_uri(m_world, LILV_URI_INPUT_PORT);
        std::mt19937 random(7);
        std::uniform_real_distribution<float> noise(-1.0f, 1.0f);
        for (std::uint32_t p = 0; p < ports; ++p) {
            const LilvPort* port = lilv_plugin_get_port_by_index(plugin, p);
            const bool input = lilv_port_is_a(plugin, port, inputClass);
            if (lilv_port_is_a(plugin, port, audioClass) || lilv_port_is_a(plugin, port, cvClass)) {
                subject.audio[p].assign(kBlock, 0.0f);
                if (input && lilv_port_is_a(plugin, port, audioClass)) {
                    subject.sources[p].resize(static_cast<std::size_t>(kRate));
                    for (float& x : subject.sources[p]) x = noise(random);
                }
                lilv_instance_connect_port(subject.instance, p, subject.audio[p].data());
            } else if (lilv_port_is_a(plugin, port, atomClass)) {
                subject.atoms[p].reset(new std::uint64_t[kAtomCapacity / 8]());
                (input ? subject.atomInputs : subject.atomOutputs).push_back(p);
                lilv_instance_connect_port(subject.instance, p, subject.atoms[p].get());
            } else {
                const char* symbol = lilv_node_as_string(lilv_port_get_symbol(plugin, port));
                for (const auto& [name, value] : subject.settings)
                    if (name == symbol) subject.controls[p] = value;
                lilv_instance_connect_port(subject.instance, p, &subject.controls[p]);
            }
        }
        for (LilvNode* node : {audioClass, cvClass, atomClass, inputClass}) lilv_node_free(node);
        lilv_instance_activate(subject.instance);
        return true;
    }

    // `process` false: the host's share alone (copies and atom headers).
    void Run(Subject& subject, std::size_t blocks, bool process = true) {
        const std::size_t sourceFrames = static_cast<std::size_t>(kRate);
        for (std::size_t b = 0; b < blocks; ++b) {
            if (subject.position + kBlock > sourceFrames) subject.position = 0;
            for (std::size_t p = 0; p < subject.sources.size(); ++p)
                if (!subject.sources[p].empty())
                    std::copy_n(subject.sources[p].begin() + static_cast<std::ptrdiff_t>(subject.position), kBlock,
                                subject.audio[p].begin());
            for (std::uint32_t p : subject.atomInputs) {
                auto* sequence = reinterpret_cast<LV2_Atom_Sequence*>(subject.atoms[p].get());
                sequence->atom = {sizeof(LV2_Atom_Sequence_Body), Urid(LV2_ATOM__Sequence)};
                sequence->body = {0, 0};
            }
            for (std::uint32_t p : subject.atomOutputs) {
                auto* atom = reinterpret_cast<LV2_Atom*>(subject.atoms[p].get());
                *atom = {static_cast<std::uint32_t>(kAtomCapacity - sizeof(LV2_Atom)), Urid(LV2_ATOM__Chunk)};
            }
            subject.position += kBlock;
            if (process) lilv_instance_run(subject.instance, kBlock);
        }
    }

private:
    LV2_URID Urid(const char* uri) { return UridMap::Map(&m_uris, uri); }

    LilvWorld* m_world;
    UridMap m_uris;
    LV2_URID_Map m_map{&m_uris, UridMap::Map};
    LV2_URID_Unmap m_unmap{&m_uris, UridMap::Unmap};
    std::int32_t m_blockLength = kBlock;
    std::int32_t m_minBlockLength = 1;
    LV2_Options_Option m_options[3]{};
    LV2_Feature m_mapFeature{}, m_unmapFeature{}, m_optionsFeature{}, m_boundedFeature{};
};

}  // namespace

int main(int argc, char** argv) {
    double seconds = 20.0;
    int rounds = 7;
    std::vector<Subject> subjects;
    for (int i = 1; i < argc; ++i) {
        const std::string argument = argv[i];
        if (argument == "--seconds" && i + 1 < argc) {
            seconds = std::atof(argv[++i]);
        } else if (argument == "--rounds" && i + 1 < argc) {
            rounds = std::max(1, std::atoi(argv[++i]));
        } else if (const auto equals = argument.find('='); equals != std::string::npos && !subjects.empty()) {
            subjects.back().settings.emplace_back(argument.substr(0, equals),
                                                  std::strtof(argument.c_str() + equals + 1, nullptr));
        } else {
            subjects.emplace_back();
            subjects.back().uri = argument;
        }
    }
    if (subjects.empty()) {
        std::fprintf(stderr, "usage: ZenLv2Comparison [--seconds N] [--rounds N] URI [symbol=value ...] ...\n");
        return 2;
    }
    Host host;
    // A plug-in this host cannot run (a feature it lacks) is left out, said on stderr.
    subjects.erase(std::remove_if(subjects.begin(), subjects.end(),
                                  [&](Subject& subject) { return !host.Instantiate(subject); }),
                   subjects.end());
    if (subjects.empty()) return 1;
    const auto blocks = static_cast<std::size_t>(seconds * kRate / kBlock);
    for (Subject& subject : subjects) host.Run(subject, blocks / 10 + 1);  // warm caches and settle
    for (int r = 0; r < rounds; ++r) {
        for (Subject& subject : subjects) {
            const double start = ThreadSeconds();
            host.Run(subject, blocks, false);
            const double middle = ThreadSeconds();
            host.Run(subject, blocks);
            const double cpu = (ThreadSeconds() - middle) - (middle - start);
            subject.factors.push_back(static_cast<double>(blocks * kBlock) / kRate / std::max(cpu, 1e-9));
        }
    }
    std::printf("%-60s %10s %10s\n", "plug-in (48 kHz, 512 frames, stereo noise; net of host)", "best", "median");
    for (Subject& subject : subjects) {
        std::sort(subject.factors.begin(), subject.factors.end());
        std::printf("%-60s %9.0fx %9.0fx\n", subject.uri.c_str(), subject.factors.back(),
                    subject.factors[subject.factors.size() / 2]);
        lilv_instance_deactivate(subject.instance);
        lilv_instance_free(subject.instance);
    }
    return 0;
}
