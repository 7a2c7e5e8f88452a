// The voice-activity core of libwebrtc-audio-processing, which exports these
// C functions but installs no header for them. The signatures are those of
// the library version the build links (a handle returned by Create, lengths
// as size_t).
#pragma once

#include <cstddef>
#include <cstdint>

extern "C" {

struct WebRtcVadInst;
typedef struct WebRtcVadInst VadInst;

// Allocates an instance (uninitialised: Init before use); null on failure.
VadInst* WebRtcVad_Create(void);
void WebRtcVad_Free(VadInst* handle);
// Clears the state and sets mode 0; 0 on success, -1 for a null handle.
int WebRtcVad_Init(VadInst* handle);
// Mode 0..3; 0 on success, -1 otherwise (or when not initialised).
int WebRtcVad_set_mode(VadInst* handle, int mode);
// 1 voice, 0 no voice, -1 on error (rate, length, null, not initialised).
int WebRtcVad_Process(VadInst* handle, int fs, const std::int16_t* audio_frame, std::size_t frame_length);
// 0 when the core takes frames of `frame_length` samples at `rate`, else -1.
int WebRtcVad_ValidRateAndFrameLength(int rate, std::size_t frame_length);
}
