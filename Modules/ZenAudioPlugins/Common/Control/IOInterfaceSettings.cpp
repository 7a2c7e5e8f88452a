#include "IOInterfaceSettings.h"

#include "Common/ZenControlPlugin.h"
#include "HostCore/Settings/Documents/IOInterfaceDocument.h"

IOInterfaceSettings::IOInterfaceSettings() : ZenSettingsControl(kClassName, zen::host::IOInterfaceDocument::Schema()) {}

template class ZenControlPlugin<IOInterfaceSettings>;
