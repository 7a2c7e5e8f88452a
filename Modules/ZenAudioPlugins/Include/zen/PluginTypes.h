// Plug-in identity: codes, kinds, descriptors and list entries.
//
// Everything here is plain data; it is safe to read from any thread once the
// library is loaded, because the registries are filled during the library's
// static initialisation and never change afterwards.
#pragma once

#include <cstdint>
#include <string>

namespace zen {

class PluginInstance;
struct HostServices;

// Four ASCII characters packed into a signed 32-bit integer, first character in
// the most significant byte ("ZnSc" = 0x5A6E5363 = 1517179747). Several
// plug-ins share one code on purpose: a code identifies a plug-in only together
// with its name.
using PluginCode = std::int32_t;

constexpr PluginCode MakePluginCode(char a, char b, char c, char d) {
    return static_cast<PluginCode>((static_cast<std::uint32_t>(static_cast<unsigned char>(a)) << 24) |
                                   (static_cast<std::uint32_t>(static_cast<unsigned char>(b)) << 16) |
                                   (static_cast<std::uint32_t>(static_cast<unsigned char>(c)) << 8) |
                                   static_cast<std::uint32_t>(static_cast<unsigned char>(d)));
}

// The four characters of a code, in order.
inline std::string PluginCodeToString(PluginCode code) {
    const auto u = static_cast<std::uint32_t>(code);
    return std::string{static_cast<char>(u >> 24), static_cast<char>((u >> 16) & 0xFF),
                       static_cast<char>((u >> 8) & 0xFF), static_cast<char>(u & 0xFF)};
}

// Kinds accepted by PluginInterface::GetPluginList and CreatePlugin.
enum PluginKind : int {
    kAudioPluginKind = 0,    // processes sample streams; instances expose AudioPlugin
    kControlPluginKind = 2,  // edits settings of the host's console; instances expose ControlPlugin
};

// Registration state of a descriptor.
enum PluginState : std::uint32_t {
    kPluginStateTemplate = 0,  // levelling templates before they copy their parent's state
    kPluginStateOffered = 1,
    kPluginStateWithheld = 2,  // compiled in, never registered: neither listed nor creatable
};

using AudioPluginFactory = PluginInstance* (*)(void* hostContext, HostServices* hostServices,
                                               const struct PluginDescriptor* descriptor);

// The static record of an audio plug-in class. The library owns every
// descriptor for its whole life; the pointer returned by
// PluginInstance::GetDescriptor stays valid until the library is unloaded.
struct PluginDescriptor {
    const char* name;                 // display name, e.g. "Soft Clipper"
    double version;                   // 1.0 for released plug-ins
    std::uint32_t state;              // PluginState
    PluginCode code;
    std::uint32_t inputChannelLimit;  // 0 for plug-ins without audio input
    std::uint32_t outputChannelLimit;
    const char* className;            // implementing class, e.g. "ZenSoftClipper"
    std::uint64_t flags;              // carried for the host; 0x80 on "Flanger"
    std::uint32_t listFlags;          // reported by GetPluginList
    std::int32_t templateNumber;      // -1, or the levelling template number
    AudioPluginFactory factory;
};

// One row of PluginInterface::GetPluginList.
struct PluginListEntry {
    std::string name;               // display name (control plug-ins: registry name)
    std::uint32_t channelCount = 0; // larger of the input and output channel limits
    std::uint32_t reserved0 = 0;    // always 0
    std::uint32_t reserved1 = 0;    // always 0
    std::uint32_t listFlags = 0;    // descriptor list flags (0 for control plug-ins)
};

// Layout version of HostServices that this header describes.
constexpr std::uint32_t kHostServicesVersion = 1;

// Services a host may hand to the library before creating instances.
//
// Rules for hosts: set structSize to sizeof(HostServices) as your build sees
// it and version to the kHostServicesVersion of your header; set every entry
// you do not offer to null. New versions only append entries, and the library
// reads an entry only when structSize covers it, so a host built against an
// older header keeps working with a newer library and the other way round.
// Each entry is called with the services object itself, which must outlive
// the instances created while it was set.
struct HostServices {
    std::uint32_t structSize;  // sizeof(HostServices) as the host compiled it
    std::uint32_t version;     // kHostServicesVersion of the host's header

    // Asked once per audio instance, at its creation.
    std::int64_t (*GetChannelIndex)(HostServices* self);  // mixer channel the instance is inserted on
    std::int64_t (*GetSessionId)(HostServices* self);     // identifies the host session

    // Runs a host action by name ("LoadPlugin", "SetIntParameter",
    // "AudioLevellerEngine", ...) with text arguments. The host writes a
    // NUL-terminated answer, possibly empty and cut to resultCapacity bytes,
    // into result (null when resultCapacity is 0). False for an action the
    // host does not know or could not run. Called from the UI thread, never
    // from the audio thread; the host may allocate and block.
    bool (*CallAction)(HostServices* self, const char* action, const char* const* arguments,
                       std::uint32_t argumentCount, char* result, std::uint32_t resultCapacity);
};

}  // namespace zen
