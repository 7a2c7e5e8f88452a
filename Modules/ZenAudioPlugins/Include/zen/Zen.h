// Everything a host includes to use the library.
#pragma once

#include "AudioPlugin.h"
#include "BackgroundTask.h"
#include "ControlPlugin.h"
#include "ParameterInfo.h"
#include "PluginInstance.h"
#include "PluginInterface.h"
#include "PluginParameters.h"
#include "PluginTypes.h"
#include "ZenControlValueHost.h"
