// Random valid settings documents, for property tests over every schema.
#pragma once

#include <random>

#include "HostCore/Settings/SettingsDocument.h"

namespace zentest {

// Every field random within its range (numbers at full double precision,
// texts with XML's special characters and non-ASCII letters), lists of random
// length; drawn again until the schema's check passes.
zen::host::SettingsDocument RandomDocument(const zen::host::DocumentSchema& schema, std::mt19937& random);

}  // namespace zentest
