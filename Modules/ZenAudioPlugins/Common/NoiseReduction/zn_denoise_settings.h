// Settings of the spectral denoiser, handed whole to zn_denoiser (and from
// it to its frame processor). Plain values in working units.
#pragma once

namespace zen::noise_reduction {

struct zn_denoise_settings {
    enum class Estimate { Adaptive, Learned };

    Estimate estimate = Estimate::Adaptive;
    // Least gain outside speech (the reduction amount), linear.
    float floor = 0.25f;
    // Least gain while the voice-activity detector hears speech; used only
    // when voice guided (the floor moves between the two with the voice
    // probability).
    float speechFloor = 0.25f;
    // Factor on the noise the suppression gain sees where speech is present
    // (the sensitivity), linear power; presence itself is decided on the
    // estimate as it is. Below 1 by default (-4.8 dB): the voice masks what
    // noise is left beside it, and keeps its shape.
    float overSubtraction = 0.33f;
    // Share of the floor's depth in dB given back up to 4 kHz while the voice
    // band holds speech (0.6: a 20 dB floor stands at 8 dB). Weak parts of
    // a voice sunk in the noise keep their level beside the strong ones, and
    // the noise let through with them is masked. Ignored when voice guided,
    // where the speech floor does this.
    float speechFloorLift = 0.6f;
    // Musical-noise control, 0..1.
    float smoothing = 0.5f;
    // Share of the suppression applied, 0..1 (0 passes the input through).
    float amount = 1.0f;
    // Output the removed part instead of the cleaned signal.
    bool listenToRemoved = false;
    // Frames heard while on are learnt as the noise profile.
    bool learning = false;
    // A voice-activity detector steers the noise estimate and the floor.
    bool voiceGuided = false;
};

}  // namespace zen::noise_reduction
