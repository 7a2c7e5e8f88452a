// zenfx edit: a plug-in's editor in a window; with a file, the file plays
// through the plug-in in a loop at the audio rate on the clocked null device
// (processed, not heard), so meters and displays move as in a session.
#include <QWidget>
#include <iostream>
#include <memory>

#include "AudioFile.h"
#include "Commands.h"
#include "EditorHost.h"
#include "HostCore/Devices/ClockedNullDevice.h"
#include "LoopPlayer.h"
#include "PluginFeed.h"
#include "RunFiles.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {

constexpr std::uint32_t kBlock = 256;
// Files longer than this play their first minutes: the loop is held in memory.
constexpr double kLongestLoopSeconds = 600.0;

}  // namespace

int RunEdit(PluginLibrary& library, const EditOptions& options) {
    RunFiles files;
    if (!options.input.empty()) files.AddInput(options.input);

    EditorHost host(false, options.scale);
    const PluginEntry plugin = library.FindPlugin(options.plugin);
    std::unique_ptr<zen::PluginInstance> instance = library.Create(plugin);
    if (!options.preset.empty()) LoadPresetByName(*instance, options.preset);

    std::vector<float> loop;
    std::unique_ptr<PluginFeed> feed;
    std::unique_ptr<LoopPlayer> player;
    std::unique_ptr<zen::host::ClockedNullDevice> device;
    if (!options.input.empty()) {
        if (plugin.kind != zen::kAudioPluginKind)
            throw ZenfxError("'" + plugin.entry.name + "' is a control plug-in: it takes no audio", kExitUsage);
        AudioFileReader reader(options.input);
        const int rate = reader.SampleRate();
        const auto channels = static_cast<std::uint32_t>(reader.Channels());
        loop = ReadFrames(reader, std::min<std::int64_t>(reader.Frames(),
                                                          static_cast<std::int64_t>(kLongestLoopSeconds * rate)));
        if (loop.empty()) throw ZenfxError("'" + options.input + "' holds no audio");
        feed = std::make_unique<PluginFeed>(*instance, channels, rate, kBlock);
        player = std::make_unique<LoopPlayer>(*feed, loop, channels, feed->Outputs());
        device = std::make_unique<zen::host::ClockedNullDevice>(
            zen::host::DeviceFormat{rate, kBlock, 0, feed->Outputs()});
    }

    std::unique_ptr<QWidget> editor = EditorHost::CreateEditor(*instance);
    // Opened whole: show() alone keeps a window within two thirds of a screen.
    editor->resize(editor->sizeHint());
    editor->show();
    if (device) {
        device->Start(*player);
        std::cout << "zenfx: playing " << "'" << options.input << "'" << " through '" << plugin.entry.name
                  << "' in a loop; close the window to stop" << std::endl;
    }
    const int status = host.Run();
    // The audio thread ends before the editor and the instance it reads.
    if (device) device->Stop();
    editor.reset();
    return status;
}

}  // namespace zenfx
