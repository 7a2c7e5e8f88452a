#include "RemoteControlSettings.h"

#include "Common/ZenControlPlugin.h"
#include "HostCore/Settings/Documents/RemoteControlDocument.h"

RemoteControlSettings::RemoteControlSettings()
    : ZenSettingsControl(kClassName, zen::host::RemoteControlDocument::Schema()) {}

template class ZenControlPlugin<RemoteControlSettings>;
