// "Remote Control Settings": the control surface's ports and the bindings of
// its messages (MIDI control changes and notes, OSC addresses) to a studio
// channel, a slot of its chain and a parameter of the plug-in there.
#pragma once

#include <cstddef>

#include "HostCore/Settings/SettingsDocument.h"

namespace zen::host {

class RemoteControlDocument {
public:
    static constexpr std::size_t kMaximumBindings = 512;
    static constexpr double kMaximumStudioChannels = 128;
    static constexpr double kMaximumSlots = 16;

    enum Section : std::size_t { kSurfaceSection, kBindingSection };
    enum SurfaceField : std::size_t { kMidiInput, kOscPort };
    enum BindingField : std::size_t { kType, kMidiChannel, kNumber, kAddress, kChannel, kSlot, kParameter };
    enum Type : int { kControlChange, kNote, kOsc };

    static const DocumentSchema& Schema();
};

}  // namespace zen::host
