// The files one run reads and writes, checked before anything is processed:
// names that are no files ("-", folders, devices, missing folders), and
// outputs that name an input or another output by any path (./, ..,
// symbolic or hard links), which would otherwise be overwritten.
#pragma once

#include <string>
#include <vector>

namespace zenfx {

class RunFiles {
public:
    // Throws ZenfxError for "-", a folder, a missing or unreadable file, or
    // anything but a regular file.
    void AddInput(const std::string& path);
    // `option` names the output in messages ("-o", "--meters-json"). Throws
    // ZenfxError for "-", a folder, a device, a missing folder, or a file
    // added before.
    void AddOutput(const std::string& option, const std::string& path);

private:
    struct Entry {
        std::string option;  // empty for an input
        std::string path;
        std::string identity;
    };
    void Add(Entry entry);

    std::vector<Entry> m_files;
};

}  // namespace zenfx
