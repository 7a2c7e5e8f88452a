#include "OscillatorSettings.h"

#include "Common/ZenControlPlugin.h"
#include "HostCore/Settings/Documents/OscillatorDocument.h"

OscillatorSettings::OscillatorSettings() : ZenSettingsControl(kClassName, zen::host::OscillatorDocument::Schema()) {}

template class ZenControlPlugin<OscillatorSettings>;
