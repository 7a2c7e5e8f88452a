#include "EditorLayoutRegistry.h"

#include <map>
#include <string>

namespace {

// Filled by static initialisers of the plug-in folders, read afterwards from
// the UI thread only.
std::map<std::string, EditorLayoutRegistry::Function>& Layouts() {
    static std::map<std::string, EditorLayoutRegistry::Function> layouts;
    return layouts;
}

}  // namespace

EditorLayoutRegistry::Entry::Entry(const char* className, Function function) {
    if (className != nullptr && function != nullptr) Layouts()[className] = function;
}

EditorLayoutRegistry::Function EditorLayoutRegistry::Find(const char* className) {
    if (className == nullptr) return nullptr;
    const auto it = Layouts().find(className);
    return it != Layouts().end() ? it->second : nullptr;
}
