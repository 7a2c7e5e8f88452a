// Runs the zenfx binary as a user does and reads what it wrote.
#pragma once

#include <sndfile.h>
#include <sys/types.h>

#include <string>
#include <vector>

namespace zentest {

struct ZenfxResult {
    int exitCode = -1;
    std::string out;
    std::string err;
};

// Arguments are quoted for the shell; stdin is empty, stdout and stderr are
// captured separately (so no terminal: no progress bar).
ZenfxResult RunZenfx(const std::vector<std::string>& arguments);

// Any program the same way; `environment` holds NAME=VALUE pairs set for it.
ZenfxResult RunProgram(const std::string& program, const std::vector<std::string>& arguments,
                       const std::vector<std::string>& environment = {});

// zenfx started in the background, as from a terminal (every signal at its
// default disposition unless `ignoreHangup`, as nohup starts it), for tests
// that signal it. Killed and reaped at the end if still running.
class ZenfxProcess {
public:
    explicit ZenfxProcess(const std::vector<std::string>& arguments, bool ignoreHangup = false);
    ~ZenfxProcess();
    ZenfxProcess(const ZenfxProcess&) = delete;
    ZenfxProcess& operator=(const ZenfxProcess&) = delete;

    pid_t Pid() const { return m_pid; }
    // Waits for the end; the wait status (WIFSIGNALED, WEXITSTATUS, ...).
    int Wait();
    std::string Err() const;

private:
    pid_t m_pid = -1;
    bool m_reaped = false;
    std::string m_errPath;
};

struct AudioData {
    SF_INFO info{};
    std::vector<float> samples;  // interleaved
    std::vector<float> Channel(int c) const;
};

void WriteAudio(const std::string& path, const std::vector<std::vector<float>>& channels, int sampleRate,
                int format = SF_FORMAT_WAV | SF_FORMAT_FLOAT);
AudioData ReadAudio(const std::string& path);

// A fresh folder, removed with everything in it at the end of the test.
class TempFolder {
public:
    TempFolder();
    ~TempFolder();
    std::string operator/(const std::string& name) const { return m_path + "/" + name; }
    std::vector<std::string> Files() const;  // names, sorted
    const std::string& Path() const { return m_path; }

private:
    std::string m_path;
};

}  // namespace zentest
