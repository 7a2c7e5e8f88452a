// The levelling of "Dialogue Leveller" compared with ffmpeg's loudnorm filter
// in its dynamic mode, on the same dialogue the tests level: espeak-ng
// phrases at -38 to -14 LUFS with a music bed under some of them. Both aim
// at -18 LUFS (the Narrator mode). Printed per leveller: the short-term
// loudness sigma of the phrases, their integrated loudness and its error
// from the target, as in the tests.
//
// Arguments: the zenfx program and a scratch folder. Not a test:
// bench/levelling-comparison.sh builds and runs it.
#include <sndfile.h>

#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include "Support/DialogueFile.h"
#include "Support/LevellingFigures.h"

namespace {

constexpr double kTarget = -18.0;

bool Write(const std::string& path, const std::vector<float>& x) {
    SF_INFO info{};
    info.samplerate = static_cast<int>(zentest::kDialogueRate);
    info.channels = 1;
    info.format = SF_FORMAT_WAV | SF_FORMAT_FLOAT;
    SNDFILE* file = sf_open(path.c_str(), SFM_WRITE, &info);
    if (file == nullptr) return false;
    sf_writef_float(file, x.data(), static_cast<sf_count_t>(x.size()));
    sf_close(file);
    return true;
}

// The first channel at the dialogue's rate, as long as `frames`.
std::vector<float> Read(const std::string& path, std::size_t frames) {
    SF_INFO info{};
    SNDFILE* file = sf_open(path.c_str(), SFM_READ, &info);
    if (file == nullptr || info.samplerate != static_cast<int>(zentest::kDialogueRate)) {
        if (file) sf_close(file);
        return {};
    }
    std::vector<float> all(static_cast<std::size_t>(info.frames * info.channels));
    sf_readf_float(file, all.data(), info.frames);
    sf_close(file);
    std::vector<float> x(frames, 0.0f);
    for (std::size_t n = 0; n < frames && n < static_cast<std::size_t>(info.frames); ++n)
        x[n] = all[n * static_cast<std::size_t>(info.channels)];
    return x;
}

void Row(const char* name, const zentest::LevellingFigures& f) {
    std::printf("| %-38s | %8.2f | %10.2f | %+8.2f |\n", name, f.sigma, f.integrated, f.integrated - kTarget);
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 3) {
        std::fprintf(stderr, "usage: ZenLevellingComparison ZENFX SCRATCH_FOLDER\n");
        return 2;
    }
    const std::string zenfx = argv[1], folder = argv[2];
    const zentest::DialogueFile dialogue = zentest::MakeLevelledDialogueTestFile();
    if (dialogue.samples.empty()) {
        std::fprintf(stderr, "error: espeak-ng cannot be run\n");
        return 1;
    }
    const std::string input = folder + "/dialogue.wav", ours = folder + "/zen.wav", theirs = folder + "/loudnorm.wav";
    if (!Write(input, dialogue.samples)) {
        std::fprintf(stderr, "error: cannot write %s\n", input.c_str());
        return 1;
    }
    const std::string zenfxCommand = "'" + zenfx + "' process '" + input + "' -o '" + ours +
                                     "' --plugin 'Dialogue Leveller' --set 'Levelling Mode=Narrator' >/dev/null";
    const std::string ffmpegCommand = "ffmpeg -loglevel error -y -i '" + input +
                                      "' -af loudnorm=I=-18:LRA=7:TP=-1:linear=false -ar 48000 -c:a pcm_f32le '" +
                                      theirs + "'";
    for (const std::string& command : {zenfxCommand, ffmpegCommand})
        if (std::system(command.c_str()) != 0) {
            std::fprintf(stderr, "error: failed: %s\n", command.c_str());
            return 1;
        }
    const std::size_t frames = dialogue.samples.size();
    const std::vector<float> zen = Read(ours, frames), loudnorm = Read(theirs, frames);
    if (zen.empty() || loudnorm.empty()) {
        std::fprintf(stderr, "error: an output cannot be read at %g Hz\n", zentest::kDialogueRate);
        return 1;
    }
    std::printf("Dialogue at -38 to -14 LUFS (%zu phrases, %.1f s), target %.0f LUFS\n\n", dialogue.phrases.size(),
                static_cast<double>(frames) / zentest::kDialogueRate, kTarget);
    std::printf("| %-38s | sigma LU | integrated | error LU |\n|%s|----------|------------|----------|\n", "leveller",
                std::string(40, '-').c_str());
    Row("input", zentest::MeasureLevelling(dialogue, dialogue.samples, {}));
    Row("Dialogue Leveller (Narrator, two pass)", zentest::MeasureLevelling(dialogue, zen, {}));
    Row("ffmpeg loudnorm (dynamic, I=-18)", zentest::MeasureLevelling(dialogue, loudnorm, {}));
    return 0;
}
