#include "zn_reverb_u15_control.h"

#include <algorithm>
#include <cmath>

namespace zen::reverb {

void zn_reverb_u15_control::SetSampleRate(float sampleRate) {
    m_length = std::max(1u, static_cast<std::uint32_t>(kFadeSeconds * sampleRate));
    Clear();
}

void zn_reverb_u15_control::Request(timed_action action) noexcept {
    if (action != timed_action::fadeout_end_reset_and_fadein) return;
    if (m_state == State::Idle) m_position = m_length;
    if (m_state != State::Silent && m_state != State::Holding) m_state = State::FadingOut;
    if (m_state == State::Holding) m_state = State::Silent;  // act again: the lines are not full yet
}

void zn_reverb_u15_control::ActionDone(std::uint32_t holdSamples) noexcept {
    if (m_state != State::Silent) return;
    m_state = holdSamples > 0 ? State::Holding : State::FadingIn;
    m_hold = holdSamples;
    m_position = 0;
}

void zn_reverb_u15_control::Clear() noexcept {
    m_state = State::Idle;
    m_position = m_length;
}

float zn_reverb_u15_control::GainAt(std::uint32_t position) const noexcept {
    constexpr double kPi = 3.141592653589793;
    return static_cast<float>(0.5 - 0.5 * std::cos(kPi * position / m_length));
}

bool zn_reverb_u15_control::Gains(float* gains, std::size_t count) noexcept {
    if (m_state == State::Idle) return false;
    for (std::size_t i = 0; i < count; ++i) {
        switch (m_state) {
            case State::FadingOut:
                if (m_position > 0) --m_position;
                if (m_position == 0) m_state = State::Silent;
                gains[i] = GainAt(m_position);
                break;
            case State::Silent: gains[i] = 0.0f; break;
            case State::Holding:
                gains[i] = 0.0f;
                if (--m_hold == 0) m_state = State::FadingIn;
                break;
            case State::FadingIn:
                if (m_position < m_length) ++m_position;
                if (m_position == m_length) m_state = State::Idle;
                gains[i] = GainAt(m_position);
                break;
            case State::Idle: gains[i] = 1.0f; break;
        }
    }
    return true;
}

}  // namespace zen::reverb
