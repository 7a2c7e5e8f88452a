#include "BChainSettings.h"

#include "Common/ZenControlPlugin.h"
#include "HostCore/Settings/Documents/BChainDocument.h"

BChainSettings::BChainSettings() : ZenSettingsControl(kClassName, zen::host::BChainDocument::Schema()) {}

template class ZenControlPlugin<BChainSettings>;
