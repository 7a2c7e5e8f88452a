// What zenfx promises about files: a failed, stopped or killed run never
// leaves a partial file or touches an existing one (signals, a full disk, a
// file size limit), outputs never overwrite an input or each other, every
// destination is checked before the run, and names up to the system's limit
// work.
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/mount.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cmath>
#include <cstring>
#include <fstream>
#include <thread>

#include "ZenfxRunner.h"

using zentest::ReadAudio;
using zentest::RunProgram;
using zentest::RunZenfx;
using zentest::TempFolder;
using zentest::WriteAudio;

namespace {

constexpr int kRate = 48000;

std::vector<float> Tone(std::size_t frames) {
    std::vector<float> x(frames);
    for (std::size_t n = 0; n < frames; ++n) x[n] = 0.5f * std::sin(0.02f * static_cast<float>(n));
    return x;
}

bool HasTemporary(const TempFolder& folder) {
    for (const std::string& name : folder.Files())
        if (name.find(".tmp-") != std::string::npos) return true;
    return false;
}

// Long enough that a signal sent once its temporary file exists finds it
// still processing: the demo material through two pitch shifters.
std::vector<std::string> SlowRun(const std::string& output) {
    return {"process", "-o", output, "--plugin", "Pitch", "--plugin", "Pitch"};
}

// Polls until `ready` (a temporary appeared, a file was written).
template <class Ready>
::testing::AssertionResult WaitUntil(Ready ready) {
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(60);
    while (std::chrono::steady_clock::now() < deadline) {
        if (ready()) return ::testing::AssertionSuccess();
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    return ::testing::AssertionFailure() << "zenfx never started writing";
}

::testing::AssertionResult WaitForTemporary(const TempFolder& folder) {
    return WaitUntil([&] { return HasTemporary(folder); });
}

// zenfx under a file size limit of `blocks` x 512 bytes (no root needed).
zentest::ZenfxResult RunLimited(int blocks, const std::vector<std::string>& arguments) {
    std::vector<std::string> shell = {"-c", "ulimit -f " + std::to_string(blocks) + "; exec \"$0\" \"$@\"",
                                      ZENFX_PATH};
    shell.insert(shell.end(), arguments.begin(), arguments.end());
    return RunProgram("/bin/sh", shell);
}

// A small tmpfs, for a disk that really fills; skipped where the machine
// cannot mount one (not root, no mount privilege).
class SmallDisk {
public:
    explicit SmallDisk(const std::string& size) {
        const std::string options = "size=" + size;
        if (mount("tmpfs", m_folder.Path().c_str(), "tmpfs", 0, options.c_str()) == 0) m_mounted = true;
        else m_reason = std::string("cannot mount a tmpfs to fill (") + std::strerror(errno) + "; needs root)";
    }
    ~SmallDisk() {
        if (m_mounted && umount(m_folder.Path().c_str()) != 0) umount2(m_folder.Path().c_str(), MNT_DETACH);
    }
    bool Mounted() const { return m_mounted; }
    const std::string& Reason() const { return m_reason; }
    const TempFolder& Folder() const { return m_folder; }
    std::string operator/(const std::string& name) const { return m_folder / name; }

    // Fills what is left with one file.
    void Fill() {
        std::ofstream filler(m_folder / "filler", std::ios::binary);
        const std::vector<char> block(4096, 'x');
        while (filler.write(block.data(), static_cast<std::streamsize>(block.size()))) {
        }
    }

private:
    TempFolder m_folder;
    bool m_mounted = false;
    std::string m_reason;
};

}  // namespace

TEST(ZenfxFiles, StoppedRunsRemoveTheirPartialFileAndEndByTheSignal) {
    for (const auto& [signal, name] : {std::pair{SIGHUP, "SIGHUP"}, {SIGINT, "SIGINT"}, {SIGTERM, "SIGTERM"}}) {
        SCOPED_TRACE(name);
        TempFolder folder;
        const std::vector<float> before = Tone(100);
        WriteAudio(folder / "out.wav", {before}, kRate);
        zentest::ZenfxProcess run(SlowRun(folder / "out.wav"));
        ASSERT_TRUE(WaitForTemporary(folder));
        kill(run.Pid(), signal);
        const int status = run.Wait();
        // A shell reports 128 + the signal's number: 129, 130, 143.
        EXPECT_TRUE(WIFSIGNALED(status) && WTERMSIG(status) == signal) << run.Err();
        EXPECT_NE(run.Err().find(std::string("stopped by ") + name), std::string::npos) << run.Err();
        EXPECT_EQ(folder.Files(), std::vector<std::string>{"out.wav"});
        EXPECT_EQ(ReadAudio(folder / "out.wav").samples, before);
    }
}

TEST(ZenfxFiles, AHangupThatWasIgnoredAtStartStaysIgnored) {
    TempFolder folder;
    zentest::ZenfxProcess run({"process", "-o", folder / "out.wav", "--plugin", "Reverb"}, true);
    ASSERT_TRUE(WaitUntil([&] { return !folder.Files().empty(); }));
    kill(run.Pid(), SIGHUP);
    const int status = run.Wait();
    ASSERT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0) << run.Err();
    EXPECT_EQ(ReadAudio(folder / "out.wav").info.frames, 6 * kRate);
}

TEST(ZenfxFiles, AKilledRunsTemporaryIsRemovedByTheNextRunOnTheSameDestination) {
    TempFolder folder;
    pid_t killed = 0;
    {
        zentest::ZenfxProcess run(SlowRun(folder / "out.wav"));
        ASSERT_TRUE(WaitForTemporary(folder));
        kill(run.Pid(), SIGKILL);
        run.Wait();
        killed = run.Pid();
    }
    ASSERT_TRUE(HasTemporary(folder)) << "nothing can catch SIGKILL";
    // Temporaries of a process still alive, or of another destination, stay.
    const std::string live = ".out.wav.tmp-" + std::to_string(getpid()) + "-abcdef";
    const std::string other = ".other.wav.tmp-" + std::to_string(killed) + "-abcdef";
    std::ofstream(folder / live) << "busy";
    std::ofstream(folder / other) << "someone else's";
    const auto result = RunZenfx({"process", "-o", folder / "out.wav", "--plugin", "Soft Clipper"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    EXPECT_EQ(folder.Files(), (std::vector<std::string>{other, live, "out.wav"}));  // sorted
    EXPECT_EQ(ReadAudio(folder / "out.wav").info.frames, 6 * kRate);
}

TEST(ZenfxFiles, AFullDiskFailsTheRunAndLeavesTheExistingFiles) {
    SmallDisk disk("256k");
    if (!disk.Mounted()) GTEST_SKIP() << disk.Reason();
    const std::vector<float> before = Tone(100);
    WriteAudio(disk / "out.wav", {before}, kRate);
    // The audio: 2.3 MB of demo material into 256 kB.
    auto audio = RunZenfx({"process", "-o", disk / "out.wav", "--plugin", "Soft Clipper"});
    EXPECT_EQ(audio.exitCode, 1);
    EXPECT_NE(audio.err.find("No space left on device"), std::string::npos) << audio.err;
    EXPECT_EQ(disk.Folder().Files(), std::vector<std::string>{"out.wav"});
    EXPECT_EQ(ReadAudio(disk / "out.wav").samples, before);

    // The meters, on a disk already full, after the audio went elsewhere: the
    // audio is not put in place either.
    TempFolder elsewhere;
    WriteAudio(elsewhere / "in.wav", {Tone(2000)}, kRate);
    WriteAudio(elsewhere / "out.wav", {before}, kRate);
    disk.Fill();
    auto meters = RunZenfx({"process", elsewhere / "in.wav", "-o", elsewhere / "out.wav", "--meters-json",
                            disk / "meters.json", "--plugin", "Limiter"});
    EXPECT_EQ(meters.exitCode, 1);
    EXPECT_NE(meters.err.find("cannot write '" + disk / "meters.json" + "': No space left on device"),
              std::string::npos)
        << meters.err;
    EXPECT_FALSE(HasTemporary(disk.Folder()));
    EXPECT_FALSE(HasTemporary(elsewhere));
    EXPECT_EQ(ReadAudio(elsewhere / "out.wav").samples, before);
}

TEST(ZenfxFiles, AWriteFailureOfAnyOutputFailsTheRunAndLeavesTheExistingFiles) {
    TempFolder folder;
    const std::vector<float> before = Tone(10);
    WriteAudio(folder / "short.wav", {before}, kRate, SF_FORMAT_WAV | SF_FORMAT_PCM_16);
    WriteAudio(folder / "long.wav", {Tone(4000)}, kRate);
    WriteAudio(folder / "out.wav", {before}, kRate);
    // The audio beyond a 1 kB limit.
    auto audio = RunLimited(2, {"process", folder / "long.wav", "-o", folder / "out.wav", "--plugin", "Limiter"});
    EXPECT_EQ(audio.exitCode, 1);
    EXPECT_NE(audio.err.find("cannot write '" + folder / "out.wav" + "': File too large"), std::string::npos)
        << audio.err;
    // The audio fits, its meters do not.
    auto meters = RunLimited(1, {"process", folder / "short.wav", "-o", folder / "out.wav", "--meters-json",
                                 folder / "meters.json", "--plugin", "Limiter"});
    EXPECT_EQ(meters.exitCode, 1);
    EXPECT_NE(meters.err.find("cannot write '" + folder / "meters.json" + "': File too large"), std::string::npos)
        << meters.err;
    EXPECT_FALSE(HasTemporary(folder));
    EXPECT_EQ(folder.Files().size(), 3u);
    EXPECT_EQ(ReadAudio(folder / "out.wav").samples, before);
}

// No output may name an input or another output, by any path; the input and
// the files already there stay as they were.
TEST(ZenfxFiles, OutputsNeverNameAnInputOrEachOther) {
    TempFolder folder;
    const std::vector<float> x = Tone(300);
    const std::string in = folder / "in.wav";
    WriteAudio(in, {x}, kRate);
    WriteAudio(folder / "o.wav", {x}, kRate);
    ASSERT_EQ(symlink(in.c_str(), (folder / "link.wav").c_str()), 0);
    ASSERT_EQ(link(in.c_str(), (folder / "hard.wav").c_str()), 0);
    ASSERT_EQ(mkdir((folder / "sub").c_str(), 0755), 0);
    const auto run = [&](const std::string& output, const std::string& meters) {
        std::vector<std::string> args = {"process", in, "-o", output, "--plugin", "Limiter"};
        if (!meters.empty()) args.insert(args.end(), {"--meters-json", meters});
        return RunZenfx(args);
    };
    const std::string parent = folder.Path().substr(folder.Path().find_last_of('/') + 1);
    const struct {
        std::string output, meters, expected;
    } cases[] = {
        {folder / "o.wav", in, "--meters-json '" + in + "' is the input file"},
        {folder / "o.wav", folder / "./o.wav", "is the same file as -o '" + folder / "o.wav" + "'"},
        {folder / "link.wav", "", "-o '" + folder / "link.wav" + "' is the input file"},
        {folder / "o.wav", folder / "hard.wav", "is the input file"},
        {folder / ("../" + parent + "/in.wav"), "", "is the input file"},
        {folder / "new.wav", folder / "sub/../new.wav", "is the same file as -o"},
    };
    for (const auto& c : cases) {
        const auto result = run(c.output, c.meters);
        EXPECT_EQ(result.exitCode, 2) << c.expected;
        EXPECT_NE(result.err.find(c.expected), std::string::npos) << result.err;
    }
    EXPECT_EQ(folder.Files().size(), 5u);
    EXPECT_EQ(ReadAudio(in).samples, x);
    EXPECT_EQ(ReadAudio(folder / "o.wav").samples, x);
}

// Every destination before the run: a meters file that cannot be written
// fails the run before any audio is processed or written.
TEST(ZenfxFiles, EveryDestinationIsCheckedBeforeTheRun) {
    TempFolder folder;
    WriteAudio(folder / "in.wav", {Tone(300)}, kRate);
    ASSERT_EQ(mkdir((folder / "locked").c_str(), 0500), 0);
    struct Case {
        std::string meters, expected;
    } cases[] = {
        {folder / "missing/m.json", "the folder '" + folder / "missing" + "' does not exist"},
        {"/dev/full", "'/dev/full' is not a regular file"},
        {folder / "in.wav/", "is a folder"},
    };
    std::vector<Case> all(std::begin(cases), std::end(cases));
    // Root writes anywhere; a locked folder stops everyone else.
    if (geteuid() != 0) all.push_back({folder / "locked/m.json", "Permission denied"});
    for (const Case& c : all) {
        const auto result = RunZenfx({"process", folder / "in.wav", "-o", folder / "out.wav", "--meters-json",
                                      c.meters, "--plugin", "Limiter"});
        EXPECT_NE(result.exitCode, 0) << c.meters;
        EXPECT_NE(result.err.find(c.expected), std::string::npos) << result.err;
        EXPECT_EQ(result.out.find("processed"), std::string::npos) << result.out;
    }
    EXPECT_EQ(folder.Files(), (std::vector<std::string>{"in.wav", "locked"}));
}

TEST(ZenfxFiles, NamesUpToTheSystemsLimitAreWrittenWhole) {
    TempFolder folder;
    WriteAudio(folder / "in.wav", {Tone(1000)}, kRate);
    std::string accented;
    for (int i = 0; i < 125; ++i) accented += "\xC3\xA9";  // é, two bytes
    // 255, 254 and 243 bytes; the meters' names 255.
    for (const std::string& name : {std::string(251, 'a') + ".wav", accented + ".wav", std::string(238, 'b') + ".flac"}) {
        const auto result = RunZenfx({"process", folder / "in.wav", "-o", folder / name, "--plugin", "Soft Clipper",
                                      "--meters-json", folder / (name.substr(0, 250) + ".json")});
        ASSERT_EQ(result.exitCode, 0) << name.size() << " bytes: " << result.err;
        EXPECT_EQ(ReadAudio(folder / name).info.frames, 1000);
    }
    EXPECT_FALSE(HasTemporary(folder));
    EXPECT_EQ(folder.Files().size(), 7u);
}
