// The sampler's bank: user folders loaded beside the built-in pads, files
// that cannot be read named and skipped, and the folder kept in the state.
#include <gtest/gtest.h>
#include <sndfile.h>
#include <unistd.h>

#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <cstdio>
#include <filesystem>
#include <fstream>

#include "Plugins/ZenFoleySampler/FoleyBank.h"
#include "Support/PluginHarness.h"

namespace {

class Folder {
public:
    Folder() {
        char path[] = "/tmp/foley-bank-XXXXXX";
        m_path = mkdtemp(path);
    }
    ~Folder() { std::filesystem::remove_all(m_path); }
    std::string operator/(const std::string& name) const { return m_path + "/" + name; }
    const std::string& Path() const { return m_path; }

private:
    std::string m_path;
};

void WriteSound(const std::string& path, const std::vector<float>& interleaved, int channels, int rate, int format) {
    SF_INFO info{};
    info.samplerate = rate;
    info.channels = channels;
    info.format = format;
    SNDFILE* file = sf_open(path.c_str(), SFM_WRITE, &info);
    ASSERT_NE(file, nullptr) << sf_strerror(nullptr);
    sf_writef_float(file, interleaved.data(), static_cast<sf_count_t>(interleaved.size() / channels));
    sf_close(file);
}

std::string WithFolder(const std::string& state, const std::string& folder) {
    QJsonObject root = QJsonDocument::fromJson(QByteArray::fromStdString(state)).object();
    root.insert("folder", QString::fromStdString(folder));
    return QJsonDocument(root).toJson().toStdString();
}

QJsonObject StateOf(zentest::PluginHarness& plugin) {
    return QJsonDocument::fromJson(QByteArray::fromStdString(plugin.Audio().SaveState())).object();
}

}  // namespace

TEST(FoleyBank, LoadsWavAndFlacAfterTheBuiltInsAndNamesWhatItSkips) {
    Folder folder;
    WriteSound(folder / "b-stereo.flac", {0.5f, -0.5f, 0.25f, -0.25f}, 2, 44100, SF_FORMAT_FLAC | SF_FORMAT_PCM_16);
    WriteSound(folder / "a-mono.wav", {0.1f, 0.2f, 0.3f}, 1, 48000, SF_FORMAT_WAV | SF_FORMAT_FLOAT);
    WriteSound(folder / "c-quad.wav", std::vector<float>(16, 0.1f), 4, 48000, SF_FORMAT_WAV | SF_FORMAT_FLOAT);
    std::ofstream(folder / "d-broken.wav") << "RIFF this is no sound";
    std::ofstream(folder / "notes.txt") << "not a sound, not a complaint";
    ASSERT_EQ(symlink((folder / "gone.flac").c_str(), (folder / "e-missing.flac").c_str()), 0);

    std::vector<std::string> skipped;
    const auto bank = FoleyBank::WithFolder(folder.Path(), skipped);
    ASSERT_EQ(bank->PadCount(), bank->BuiltInCount() + 2);
    const FoleyBank::Pad* mono = bank->GetPad(bank->BuiltInCount() + 1);
    EXPECT_EQ(mono->name, "a-mono");
    ASSERT_EQ(mono->takes[0].Frames(), 3u);
    EXPECT_EQ(mono->takes[0].Data(0)[FoleySound::kLeadPad + 2], 0.3f);
    const FoleySound& stereo = bank->GetPad(bank->BuiltInCount() + 2)->takes[0];
    EXPECT_EQ(stereo.Channels(), 2u);
    EXPECT_EQ(stereo.SampleRate(), 44100.0);
    EXPECT_EQ(bank->GetPad(bank->PadCount() + 1), nullptr);
    EXPECT_EQ(bank->GetPad(0), nullptr);

    ASSERT_EQ(skipped.size(), 3u);
    EXPECT_EQ(skipped[0].rfind("c-quad.wav: 4 channels", 0), 0u) << skipped[0];
    EXPECT_EQ(skipped[1].rfind("d-broken.wav: ", 0), 0u) << skipped[1];
    EXPECT_EQ(skipped[2].rfind("e-missing.flac: ", 0), 0u) << skipped[2];

    skipped.clear();
    const auto none = FoleyBank::WithFolder(folder / "nowhere", skipped);
    EXPECT_EQ(none->PadCount(), none->BuiltInCount());
    ASSERT_EQ(skipped.size(), 1u);
    EXPECT_EQ(skipped[0], folder / "nowhere" + ": no such folder");
}

TEST(FoleyBank, FolderTravelsInTheStateAndPlaysUserFilesUnchanged) {
    Folder folder;
    const std::vector<float> clip = {0.1f, -0.2f, 0.3f, -0.4f, 0.5f};
    WriteSound(folder / "clip.wav", clip, 1, 48000, SF_FORMAT_WAV | SF_FORMAT_FLOAT);
    std::ofstream(folder / "bad.flac") << "fLaC garbage";

    zentest::PluginHarness plugin = zentest::Prepared("Foley Sampler", {{"Variation", 0.0f}}, 2);
    ASSERT_TRUE(plugin.Audio().LoadState(WithFolder(plugin.Audio().SaveState(), folder.Path())));
    QJsonObject state = StateOf(plugin);
    EXPECT_EQ(state.value("folder").toString().toStdString(), folder.Path());
    ASSERT_EQ(state.value("skipped").toArray().size(), 1);
    EXPECT_TRUE(state.value("skipped").toArray()[0].toString().startsWith("bad.flac: "));

    plugin.Set("Pad", 12.0f);  // the first pad after the eleven built-in ones
    plugin.Set("Trigger", 1.0f);
    zentest::Channels io(2, std::vector<float>(16, 0.0f));
    plugin.Process(io);
    EXPECT_EQ(plugin.Meter("Pads"), 12.0f);
    for (std::size_t i = 0; i < clip.size(); ++i) {
        EXPECT_EQ(io[0][i], clip[i]) << i;
        EXPECT_EQ(io[1][i], clip[i]) << i;
    }
    EXPECT_EQ(io[0][clip.size()], 0.0f);

    // A preset (a state without a folder) keeps the folder; an empty one drops it.
    const std::vector<std::string> presets = plugin.Audio().GetPresetNames();
    ASSERT_FALSE(presets.empty());
    ASSERT_TRUE(plugin.Audio().LoadPreset(presets[0]));
    EXPECT_EQ(StateOf(plugin).value("folder").toString().toStdString(), folder.Path());
    ASSERT_TRUE(plugin.Audio().LoadState(WithFolder(plugin.Audio().SaveState(), "")));
    plugin.Process(io);
    EXPECT_EQ(plugin.Meter("Pads"), 11.0f);
    EXPECT_FALSE(StateOf(plugin).contains("skipped"));
}
