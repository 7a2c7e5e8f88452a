// Settings of the pitch shifter: the stretch settings, the re-timer's
// interpolation settings and its rate control, in that order.
#pragma once

#include <cstddef>

#include "Retimer/InterpParam.h"
#include "Retimer/RateControl.h"
#include "Retimer/StretchEngineParam.h"
#include "System/ParamGroup.h"

namespace ora::pitchshift {

class EngineParam : public ParamGroup {
public:
    EngineParam(std::size_t frameLength, std::size_t overlap, std::size_t fftLength, int history)
        : m_stretch(frameLength, overlap, fftLength, history) {}

    fft::stretch::pv::EngineParam m_stretch;
    retimer::interp::Param m_interp;
    retimer::rate_control::Param m_rateControl;
};

}  // namespace ora::pitchshift
