#include "TalkbackSettings.h"

#include "Common/ZenControlPlugin.h"
#include "HostCore/Settings/Documents/TalkbackDocument.h"

TalkbackSettings::TalkbackSettings() : ZenSettingsControl(kClassName, zen::host::TalkbackDocument::Schema()) {}

template class ZenControlPlugin<TalkbackSettings>;
