// Files replaced whole: a kill at any moment leaves the old file or the new
// one, and the next writer of the destination removes what the killed one
// left; links, long names and what is no file; the signal-time clean-up.
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <random>
#include <sstream>
#include <thread>

#include "HostCore/HostError.h"
#include "HostCore/Settings/AtomicFile.h"
#include "HostCore/Settings/Documents/BChainDocument.h"
#include "HostCore/Settings/SettingsDocument.h"

namespace fs = std::filesystem;
using zen::host::AtomicFile;
using zen::host::HostError;

namespace {

struct Folder {
    fs::path path;
    Folder() {
        char pattern[] = "/tmp/zen-atomic-XXXXXX";
        path = mkdtemp(pattern);
    }
    ~Folder() { fs::remove_all(path); }
    std::vector<std::string> Names() const {
        std::vector<std::string> names;
        for (const auto& entry : fs::directory_iterator(path)) names.push_back(entry.path().filename());
        std::sort(names.begin(), names.end());
        return names;
    }
};

std::string ReadFile(const fs::path& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
}

}  // namespace

TEST(AtomicFile, AProcessKilledWhileWritingLeavesTheOldFileOrTheNewOneAndTheNextWriterCleansUp) {
    Folder folder;
    const std::string path = (folder.path / "BChainSettings.xml").string();
    // Two large documents, so a kill lands inside a write most of the time.
    const std::string one = zen::host::SettingsDocument(zen::host::BChainDocument::Schema()).ToXml();
    std::string first;
    for (int i = 0; i < 300; ++i) first += one;
    const std::string second(first.size() + 12345, 'y');
    AtomicFile::Replace(path, first);
    std::mt19937 random(3);
    for (int round = 0; round < 8; ++round) {
        const pid_t child = fork();
        ASSERT_GE(child, 0);
        if (child == 0) {
            for (int i = 0;; ++i) AtomicFile::Replace(path, i % 2 == 0 ? second : first);
        }
        std::this_thread::sleep_for(std::chrono::microseconds(std::uniform_int_distribution<int>(200, 30000)(random)));
        kill(child, SIGKILL);
        int status = 0;
        waitpid(child, &status, 0);
        const std::string now = ReadFile(path);
        ASSERT_TRUE(now == first || now == second) << "round " << round << ": " << now.size() << " bytes";
    }
    AtomicFile::Replace(path, first);
    EXPECT_EQ(folder.Names(), std::vector<std::string>{"BChainSettings.xml"});
}

TEST(AtomicFile, WritesThroughLinksKeepsTheModeAndTakesNamesUpToTheLimit) {
    Folder folder;
    const fs::path target = folder.path / "target.xml", link = folder.path / "link.xml";
    AtomicFile::Replace(target.string(), "old");
    ASSERT_EQ(chmod(target.c_str(), 0640), 0);
    fs::create_symlink(target, link);
    AtomicFile::Replace(link.string(), "new");
    EXPECT_TRUE(fs::is_symlink(link));
    EXPECT_EQ(ReadFile(target), "new");
    EXPECT_EQ(fs::status(target).permissions(), fs::perms(0640));

    std::string euros(120, 'x');  // 240 bytes: the temporary's name is cut inside a character
    for (int i = 0; i < 40; ++i) euros += "\xE2\x82\xAC";
    for (const std::string& name : {std::string(255, 'n'), euros}) {
        AtomicFile::Replace((folder.path / name).string(), name);
        EXPECT_EQ(ReadFile(folder.path / name), name);
    }
    EXPECT_EQ(folder.Names().size(), 4u);  // no temporary left
}

TEST(AtomicFile, RefusesWhatIsNoFileAndFoldersItCannotWrite) {
    Folder folder;
    struct stat before {};
    ASSERT_EQ(stat("/dev/null", &before), 0);
    for (const std::string& destination :
         {folder.path.string(), folder.path.string() + "/", std::string("/dev/null"), (folder.path / "no/such").string()})
        EXPECT_THROW(AtomicFile::Replace(destination, "x"), HostError) << destination;
    struct stat after {};
    ASSERT_EQ(stat("/dev/null", &after), 0);
    EXPECT_TRUE(S_ISCHR(after.st_mode));
    EXPECT_EQ(after.st_ino, before.st_ino);
    EXPECT_TRUE(folder.Names().empty());
}

TEST(AtomicFile, StaleTemporariesAreThoseOfThisDestinationWhoseProcessIsGone) {
    Folder folder;
    const pid_t child = fork();
    if (child == 0) _exit(0);
    waitpid(child, nullptr, 0);  // a process that is gone
    const std::string dead = std::to_string(child), alive = std::to_string(getppid());
    for (const std::string& name : {".out.wav.tmp-" + dead + "-abcdef", ".out.wav.tmp-" + alive + "-abcdef",
                                    ".other.wav.tmp-" + dead + "-abcdef", ".out.wav.tmp-" + dead + "-toolong",
                                    "out.wav.tmp-" + dead + "-abcdef"})
        std::ofstream(folder.path / name) << "x";
    const std::string destination = (folder.path / "out.wav").string();
    EXPECT_EQ(AtomicFile::StaleTemporaries(destination),
              std::vector<std::string>{(folder.path / (".out.wav.tmp-" + dead + "-abcdef")).string()});
    AtomicFile::Replace(destination, "whole");
    EXPECT_EQ(folder.Names().size(), 5u);  // the stale one gone, the output there
}

TEST(AtomicFile, RemoveTemporariesUnlinksWhatIsNotCommitted) {
    Folder folder;
    AtomicFile committed((folder.path / "a.txt").string());
    committed.Write("a");
    committed.Commit();
    AtomicFile pending((folder.path / "b.txt").string());
    pending.Write("b");
    ASSERT_EQ(folder.Names().size(), 2u);
    AtomicFile::RemoveTemporaries();
    EXPECT_EQ(folder.Names(), std::vector<std::string>{"a.txt"});
}
