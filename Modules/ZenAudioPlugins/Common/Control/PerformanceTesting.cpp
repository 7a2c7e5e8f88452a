#include "PerformanceTesting.h"

#include "Common/ZenControlPlugin.h"
#include "HostCore/Settings/Documents/PerformanceDocument.h"

PerformanceTesting::PerformanceTesting() : ZenSettingsControl(kClassName, zen::host::PerformanceDocument::Schema()) {}

template class ZenControlPlugin<PerformanceTesting>;
