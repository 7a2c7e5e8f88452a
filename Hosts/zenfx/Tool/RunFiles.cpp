#include "RunFiles.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <filesystem>

#include "ZenfxError.h"

namespace zenfx {

namespace {

// The same file by any path: device and inode when it exists (hard links,
// symbolic links), else the path with links and dots resolved.
std::string Identity(const std::string& path) {
    struct stat info {};
    if (stat(path.c_str(), &info) == 0)
        return "inode " + std::to_string(info.st_dev) + ":" + std::to_string(info.st_ino);
    std::error_code error;
    const std::filesystem::path absolute = std::filesystem::absolute(path, error);
    return "path " + std::filesystem::weakly_canonical(absolute, error).string();
}

std::string Folder(const std::string& path) {
    const std::size_t slash = path.find_last_of('/');
    return slash == std::string::npos ? "." : (slash == 0 ? "/" : path.substr(0, slash));
}

}  // namespace

void RunFiles::AddInput(const std::string& path) {
    if (path == "-")
        throw ZenfxError("reading standard input ('-') is not supported: give the input as a file", kExitUsage);
    struct stat info {};
    if (stat(path.c_str(), &info) != 0 || access(path.c_str(), R_OK) != 0)
        throw ZenfxError("cannot read '" + path + "': " + std::strerror(errno));
    if (S_ISDIR(info.st_mode)) throw ZenfxError("cannot read '" + path + "': it is a folder, not an audio file");
    if (!S_ISREG(info.st_mode))
        throw ZenfxError("cannot read '" + path + "': it is not a regular file (zenfx reads files, not streams)");
    Add({"", path, Identity(path)});
}

void RunFiles::AddOutput(const std::string& option, const std::string& path) {
    const std::string named = option + " '" + path + "'";
    if (path == "-")
        throw ZenfxError("writing to standard output ('-') is not supported: give " + option + " a file name",
                         kExitUsage);
    struct stat info {};
    const bool exists = stat(path.c_str(), &info) == 0;
    if (path.empty() || path.back() == '/' || (exists && S_ISDIR(info.st_mode)))
        throw ZenfxError(named + " is a folder: give a file name in it", kExitUsage);
    if (exists && !S_ISREG(info.st_mode))
        throw ZenfxError(named + " is not a regular file: zenfx writes only files, "
                         "which it replaces whole when complete");
    const std::string folder = Folder(path);
    struct stat folderInfo {};
    if (stat(folder.c_str(), &folderInfo) != 0 || !S_ISDIR(folderInfo.st_mode))
        throw ZenfxError("cannot write " + named + ": the folder '" + folder + "' does not exist");
    Add({option, path, Identity(path)});
}

void RunFiles::Add(Entry entry) {
    for (const Entry& earlier : m_files) {
        if (earlier.identity != entry.identity) continue;
        const std::string named = entry.option + " '" + entry.path + "'";
        if (earlier.option.empty())
            throw ZenfxError(named + " is the input file; choose another path", kExitUsage);
        throw ZenfxError(named + " is the same file as " + earlier.option + " '" + earlier.path +
                             "'; choose another path",
                         kExitUsage);
    }
    m_files.push_back(std::move(entry));
}

}  // namespace zenfx
