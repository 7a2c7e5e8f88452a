// libfvad's interface over the voice-activity core of libwebrtc-audio-processing.
// The core takes 8, 16, 32 and 48 kHz itself (it decimates to 8 kHz inside),
// so no resampling is needed here.
#include "zen/fvad.h"

#include <new>

#include "Common/NoiseReduction/WebRtcVad.h"

struct Fvad {
    VadInst* core = nullptr;
    int sampleRate = 8000;
};

namespace {

constexpr int kDefaultSampleRate = 8000;
constexpr int kSampleRates[] = {8000, 16000, 32000, 48000};

}  // namespace

extern "C" {

Fvad* fvad_new(void) {
    Fvad* inst = new (std::nothrow) Fvad;
    if (inst == nullptr) return nullptr;
    inst->core = WebRtcVad_Create();
    if (inst->core == nullptr || WebRtcVad_Init(inst->core) != 0) {
        fvad_free(inst);
        return nullptr;
    }
    return inst;
}

void fvad_free(Fvad* inst) {
    if (inst == nullptr) return;
    if (inst->core != nullptr) WebRtcVad_Free(inst->core);
    delete inst;
}

void fvad_reset(Fvad* inst) {
    if (inst == nullptr) return;
    WebRtcVad_Init(inst->core);
    inst->sampleRate = kDefaultSampleRate;
}

int fvad_set_mode(Fvad* inst, int mode) {
    if (inst == nullptr) return -1;
    return WebRtcVad_set_mode(inst->core, mode) == 0 ? 0 : -1;
}

int fvad_set_sample_rate(Fvad* inst, int sample_rate) {
    if (inst == nullptr) return -1;
    for (int rate : kSampleRates) {
        if (rate == sample_rate) {
            inst->sampleRate = sample_rate;
            return 0;
        }
    }
    return -1;
}

int fvad_process(Fvad* inst, const int16_t* frame, size_t length) {
    if (inst == nullptr || frame == nullptr) return -1;
    if (WebRtcVad_ValidRateAndFrameLength(inst->sampleRate, length) != 0) return -1;
    const int decision = WebRtcVad_Process(inst->core, inst->sampleRate, frame, length);
    return decision < 0 ? -1 : (decision > 0 ? 1 : 0);
}

}  // extern "C"
