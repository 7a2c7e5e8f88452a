// Parameters and state, shared by audio and control plug-ins.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "ParameterInfo.h"

namespace zen {

class EditorLink;

class PluginParameters {
public:
    // Number of parameters; fixed for the instance's life. Any thread.
    virtual std::uint32_t GetParameterCount() const = 0;

    // Full description of one parameter; false for an index out of range.
    // UI thread; allocates.
    virtual bool GetParameterInfo(std::uint32_t index, ParameterInfo& info) const = 0;

    // Sets a value in the parameter's own unit. Any thread, at any time, also
    // while another thread processes: the value is exchanged atomically and
    // reaches the audio path without a lock (smoothed where a jump would
    // click). Values outside the range are clamped; NaN and an index out of
    // range are refused with false and change nothing. Never allocates or
    // blocks.
    virtual bool SetParameter(std::uint32_t index, float value) = 0;

    // Current value; 0 for an index out of range. Any thread; lock-free.
    virtual float GetParameter(std::uint32_t index) const = 0;

    // Every parameter and the bypass state as text. Restoring the text into an
    // instance of the same plug-in reproduces every value; unknown parameters
    // in the text are ignored, missing ones keep their values. Malformed text
    // is refused with false and changes nothing. UI thread, outside
    // processing; allocates.
    virtual std::string SaveState() const = 0;
    virtual bool LoadState(const std::string& state) = 0;

    // Factory presets shipped with the plug-in, by name; loading one is
    // LoadState of its text. UI thread.
    virtual std::vector<std::string> GetPresetNames() const = 0;
    virtual bool LoadPreset(const std::string& name) = 0;

    // Builds the plug-in's editor panel as a child of a toolkit widget
    // (QWidget*, may be null for a top-level window) and returns it as a
    // QWidget*. The editor talks to this instance: it reads parameters and
    // meters about 30 times a second on the UI thread, never from the audio
    // thread, so an open editor does not change what Process does. Null when
    // the plug-in has no editor. The host owns the returned widget (or its
    // parent does) and deletes it before the instance; a deleted editor
    // leaves no timer or thread behind. UI thread; allocates.
    virtual void* CreateEditor(void* parentWidget) = 0;

    // Builds the same editor over a link the host supplies, for a host that
    // keeps the running instance out of the UI's reach (an LV2 UI over
    // control ports, a remote panel): the editor reads and sets everything
    // through `link`, which must outlive it; this instance only lends its
    // class's layout, so it need not be prepared. Returns a QWidget* child
    // of `parentWidget`, or null. UI thread; allocates.
    virtual void* CreateEditorFor(EditorLink& link, void* parentWidget) = 0;

protected:
    ~PluginParameters() = default;  // destroyed through PluginInstance
};

}  // namespace zen
