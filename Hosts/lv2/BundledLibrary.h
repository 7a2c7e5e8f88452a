// The plug-in library of the bundle a binary was loaded from, loaded once:
// beside the bundle (installed side by side under the same lib folder), in
// the bundle, else on the system path. Each binary of the bundle (the plug-in
// adapter, the UI) compiles this with its own ZEN_LV2_LIBRARY_FILE.
#pragma once

#include "Library.h"

namespace zenlv2 {

Library& BundledLibrary();

// ZEN_LV2_LIBRARY_FILE, for messages.
const char* BundledLibraryFile();

}  // namespace zenlv2
