#include "FoleyBank.h"

#include <algorithm>
#include <cctype>
#include <filesystem>
#include <system_error>

#include "FoleySynthesizer.h"

namespace {

std::shared_ptr<const std::vector<FoleyBank::Pad>> SharedBuiltIns() {
    static const auto pads = std::make_shared<const std::vector<FoleyBank::Pad>>(FoleySynthesizer::MakePads());
    return pads;
}

bool IsSoundFileName(const std::filesystem::path& path) {
    std::string extension = path.extension().string();
    std::transform(extension.begin(), extension.end(), extension.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return extension == ".wav" || extension == ".flac";
}

}  // namespace

FoleyBank::FoleyBank() : m_builtIns(SharedBuiltIns()) { Measure(); }

std::unique_ptr<FoleyBank> FoleyBank::WithFolder(const std::string& folder, std::vector<std::string>& skipped) {
    namespace fs = std::filesystem;
    auto bank = std::make_unique<FoleyBank>();
    std::error_code error;
    if (!fs::is_directory(folder, error)) {
        skipped.push_back(folder + ": no such folder");
        return bank;
    }
    std::vector<fs::path> files;
    for (fs::directory_iterator it(folder, error), end; !error && it != end; it.increment(error))
        if (IsSoundFileName(it->path())) files.push_back(it->path());
    if (error) skipped.push_back(folder + ": " + error.message());
    std::sort(files.begin(), files.end());
    for (const fs::path& file : files) {
        FoleySound sound;
        std::string reason;
        if (!FoleySound::Load(file.string(), sound, reason)) {
            skipped.push_back(file.filename().string() + ": " + reason);
            continue;
        }
        bank->m_user.push_back({file.stem().string(), {std::move(sound)}});
    }
    bank->Measure();
    return bank;
}

const FoleyBank::Pad* FoleyBank::GetPad(std::uint32_t number) const {
    if (number < 1 || number > PadCount()) return nullptr;
    const std::size_t index = number - 1;
    return index < m_builtIns->size() ? &(*m_builtIns)[index] : &m_user[index - m_builtIns->size()];
}

void FoleyBank::Measure() {
    m_longestSeconds = 0.0;
    for (std::uint32_t p = 1; p <= PadCount(); ++p)
        for (const FoleySound& take : GetPad(p)->takes) m_longestSeconds = std::max(m_longestSeconds, take.Seconds());
}
