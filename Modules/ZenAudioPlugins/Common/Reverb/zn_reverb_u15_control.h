// Timed actions around the running network. `fadeout_end_reset_and_fadein`
// fades the late output out along a half cosine, holds it silent until the
// owner has done the action (a reset with new line lengths) and for as long
// as the owner asks (until the emptied lines have filled again, so that no
// line starts abruptly in the output), then fades it back in. A request
// during the fade-in turns it around from where it is.
#pragma once

#include <cstddef>
#include <cstdint>

namespace zen::reverb {

class zn_reverb_u15_control {
public:
    enum class timed_action { none, fadeout_end_reset_and_fadein };

    static constexpr double kFadeSeconds = 0.02;

    void SetSampleRate(float sampleRate);
    void Request(timed_action action) noexcept;
    // The action is due: the output is silent and the owner may act now.
    bool ActionDue() const { return m_state == State::Silent; }
    // Called by the owner once it has acted; the fade-in starts after
    // `holdSamples` more samples of silence.
    void ActionDone(std::uint32_t holdSamples = 0) noexcept;
    // Back to unity at once, nothing pending.
    void Clear() noexcept;

    // `count` gains for the next samples; false when all are 1 (nothing written).
    bool Gains(float* gains, std::size_t count) noexcept;

    bool Idle() const { return m_state == State::Idle; }
    std::uint32_t FadeLength() const { return m_length; }

private:
    enum class State { Idle, FadingOut, Silent, Holding, FadingIn };
    float GainAt(std::uint32_t position) const noexcept;

    State m_state = State::Idle;
    std::uint32_t m_length = 960;
    std::uint32_t m_position = 0;  // 0 silent .. m_length unity
    std::uint32_t m_hold = 0;
};

}  // namespace zen::reverb
