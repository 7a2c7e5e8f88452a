// zenfx screenshot: a plug-in's editor rendered offscreen to a PNG after the
// plug-in processed audio, so its meters and displays show that audio.
#include <QWidget>
#include <iomanip>
#include <iostream>
#include <memory>
#include <sstream>

#include "AudioFile.h"
#include "Commands.h"
#include "DemoMaterial.h"
#include "EditorHost.h"
#include "PluginFeed.h"
#include "RunFiles.h"
#include "ZenfxError.h"

namespace zenfx {

namespace {

constexpr std::uint32_t kBlock = 512;
// The editor refreshes as often per second of audio as its clock does per
// second of a session, so histories and rings fill as they would live.
constexpr int kRefreshRate = 30;
// After the input, so displays that smooth or fall back settle on the last reading.
constexpr int kFinalRefreshes = 4;

std::string Seconds(double seconds) {
    std::ostringstream out;
    out << std::fixed << std::setprecision(2) << seconds << " s";
    return out.str();
}

}  // namespace

int RunScreenshot(PluginLibrary& library, const ScreenshotOptions& options) {
    if (options.at && *options.at < 0.0) throw ZenfxError("--at must not be negative", kExitUsage);
    RunFiles files;
    if (!options.input.empty()) files.AddInput(options.input);
    files.AddOutput("-o", options.output);

    EditorHost host(true, options.scale);
    const PluginEntry plugin = library.FindPlugin(options.plugin);
    std::unique_ptr<zen::PluginInstance> instance = library.Create(plugin);
    if (!options.preset.empty()) LoadPresetByName(*instance, options.preset);

    std::string processed;
    std::unique_ptr<QWidget> editor;
    if (plugin.kind == zen::kAudioPluginKind) {
        std::unique_ptr<AudioSource> source;
        if (options.input.empty()) source = std::make_unique<DemoMaterial>();
        else source = std::make_unique<AudioFileReader>(options.input);
        const int rate = source->SampleRate();
        const double length = static_cast<double>(source->Frames()) / rate;
        const double at = options.at.value_or(std::min(kDefaultScreenshotSeconds, length));
        if (at > length)
            throw ZenfxError("--at " + Seconds(at) + " is past the end of " + source->Description() + " (" +
                                 Seconds(length) + ")",
                             kExitUsage);
        const std::vector<float> samples = ReadFrames(*source, static_cast<std::int64_t>(at * rate + 0.5));
        const auto channels = static_cast<std::uint32_t>(source->Channels());
        PluginFeed feed(*instance, channels, rate, kBlock);
        editor = EditorHost::CreateEditor(*instance);
        EditorHost::HoldClock(*editor);
        const std::size_t frames = samples.size() / channels;
        const std::size_t period = static_cast<std::size_t>(rate / kRefreshRate);
        std::size_t nextRefresh = period;
        for (std::size_t done = 0; done < frames;) {
            const auto count = static_cast<std::uint32_t>(std::min<std::size_t>(
                {std::size_t{kBlock}, frames - done, nextRefresh - done}));
            if (!feed.Process(samples.data() + done * channels, count))
                throw ZenfxError("'" + plugin.entry.name + "' failed to process");
            done += count;
            if (done == nextRefresh) {
                EditorHost::Refresh(*editor);
                nextRefresh += period;
            }
        }
        processed = " after " + Seconds(at) + " of " + source->Description();
    } else {
        if (!options.input.empty())
            throw ZenfxError("'" + plugin.entry.name + "' is a control plug-in: it takes no audio", kExitUsage);
        editor = EditorHost::CreateEditor(*instance);
        EditorHost::HoldClock(*editor);
    }
    for (int i = 0; i < kFinalRefreshes; ++i) EditorHost::Refresh(*editor);
    EditorHost::Settle(*editor);
    const QSize size = EditorHost::WritePng(*editor, options.output);
    std::cout << "zenfx: wrote " << options.output << " (" << size.width() << "x" << size.height()
              << " px): the editor of '" << plugin.entry.name << "'" << processed << "\n";
    return 0;
}

}  // namespace zenfx
