#include "ZenfxRunner.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <stdexcept>

namespace zentest {

namespace {

std::string Quote(const std::string& s) {
    std::string quoted = "'";
    for (char c : s) quoted += c == '\'' ? std::string("'\\''") : std::string(1, c);
    return quoted + "'";
}

std::string Slurp(const std::string& path) {
    std::ifstream in(path);
    std::stringstream text;
    text << in.rdbuf();
    return text.str();
}

}  // namespace

ZenfxResult RunZenfx(const std::vector<std::string>& arguments) { return RunProgram(ZENFX_PATH, arguments); }

ZenfxResult RunProgram(const std::string& program, const std::vector<std::string>& arguments,
                       const std::vector<std::string>& environment) {
    char outPath[] = "/tmp/zenfx-out-XXXXXX";
    char errPath[] = "/tmp/zenfx-err-XXXXXX";
    close(mkstemp(outPath));
    close(mkstemp(errPath));
    std::string command = "env";
    for (const std::string& variable : environment) command += " " + Quote(variable);
    command += " " + Quote(program);
    for (const std::string& a : arguments) command += " " + Quote(a);
    command += " </dev/null >" + std::string(outPath) + " 2>" + errPath;
    const int status = std::system(command.c_str());
    ZenfxResult result;
    result.exitCode = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    result.out = Slurp(outPath);
    result.err = Slurp(errPath);
    unlink(outPath);
    unlink(errPath);
    return result;
}

ZenfxProcess::ZenfxProcess(const std::vector<std::string>& arguments, bool ignoreHangup) {
    char errPath[] = "/tmp/zenfx-err-XXXXXX";
    close(mkstemp(errPath));
    m_errPath = errPath;
    std::vector<std::string> argv = {ZENFX_PATH};
    argv.insert(argv.end(), arguments.begin(), arguments.end());
    std::vector<char*> pointers;
    for (std::string& a : argv) pointers.push_back(a.data());
    pointers.push_back(nullptr);
    m_pid = fork();
    if (m_pid != 0) return;
    // The child: a terminal's dispositions, whatever the test runner had.
    for (int signal : {SIGHUP, SIGINT, SIGTERM, SIGPIPE}) std::signal(signal, SIG_DFL);
    if (ignoreHangup) std::signal(SIGHUP, SIG_IGN);
    sigset_t none;
    sigemptyset(&none);
    sigprocmask(SIG_SETMASK, &none, nullptr);
    const int null = open("/dev/null", O_RDWR);
    const int err = open(errPath, O_WRONLY | O_TRUNC);
    dup2(null, 0);
    dup2(null, 1);
    dup2(err, 2);
    execv(ZENFX_PATH, pointers.data());
    _exit(127);
}

ZenfxProcess::~ZenfxProcess() {
    if (m_pid > 0 && !m_reaped) {
        kill(m_pid, SIGKILL);
        Wait();
    }
    unlink(m_errPath.c_str());
}

int ZenfxProcess::Wait() {
    int status = 0;
    while (waitpid(m_pid, &status, 0) < 0 && errno == EINTR) {
    }
    m_reaped = true;
    return status;
}

std::string ZenfxProcess::Err() const { return Slurp(m_errPath); }

std::vector<float> AudioData::Channel(int c) const {
    std::vector<float> channel;
    for (std::size_t i = static_cast<std::size_t>(c); i < samples.size(); i += static_cast<std::size_t>(info.channels))
        channel.push_back(samples[i]);
    return channel;
}

void WriteAudio(const std::string& path, const std::vector<std::vector<float>>& channels, int sampleRate,
                int format) {
    SF_INFO info{};
    info.samplerate = sampleRate;
    info.channels = static_cast<int>(channels.size());
    info.format = format;
    SNDFILE* file = sf_open(path.c_str(), SFM_WRITE, &info);
    if (file == nullptr) throw std::runtime_error("cannot write test file " + path);
    const std::size_t frames = channels[0].size();
    std::vector<float> interleaved(frames * channels.size());
    for (std::size_t n = 0; n < frames; ++n)
        for (std::size_t c = 0; c < channels.size(); ++c) interleaved[n * channels.size() + c] = channels[c][n];
    sf_writef_float(file, interleaved.data(), static_cast<sf_count_t>(frames));
    sf_close(file);
}

AudioData ReadAudio(const std::string& path) {
    AudioData data;
    SNDFILE* file = sf_open(path.c_str(), SFM_READ, &data.info);
    if (file == nullptr) throw std::runtime_error("cannot read test file " + path);
    data.samples.resize(static_cast<std::size_t>(data.info.frames * data.info.channels));
    sf_readf_float(file, data.samples.data(), data.info.frames);
    sf_close(file);
    return data;
}

TempFolder::TempFolder() {
    char path[] = "/tmp/zenfx-test-XXXXXX";
    if (mkdtemp(path) == nullptr) throw std::runtime_error("mkdtemp failed");
    m_path = path;
}

TempFolder::~TempFolder() { std::filesystem::remove_all(m_path); }

std::vector<std::string> TempFolder::Files() const {
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(m_path)) names.push_back(entry.path().filename());
    std::sort(names.begin(), names.end());
    return names;
}

}  // namespace zentest
