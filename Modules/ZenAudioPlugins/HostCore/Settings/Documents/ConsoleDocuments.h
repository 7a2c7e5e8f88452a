// The schemas of the console's settings documents, one per control plug-in.
#pragma once

#include <string>
#include <vector>

#include "HostCore/Settings/DocumentSchema.h"

namespace zen::host {

const std::vector<const DocumentSchema*>& ConsoleDocuments();
// By root element ("BChainSettings"); null when none has it.
const DocumentSchema* FindConsoleDocument(const std::string& root);
// The root element's name of an XML text, or empty when it has none.
std::string DocumentRoot(const std::string& xml);

}  // namespace zen::host
