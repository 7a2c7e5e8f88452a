#include "Retimer/StretchEngineParam.h"

namespace ora::fft::stretch::pv {

EngineParam::EngineParam(std::size_t frameLength, std::size_t overlap, std::size_t fftLength, int history)
    : m_frameLength(frameLength),
      m_overlap(overlap),
      m_fftLength(fftLength),
      m_history(history),
      m_bins(frameLength / 2 + 1),
      m_hop(overlap != 0 ? frameLength / overlap : 0) {}

bool EngineParam::IsValid() const {
    return m_overlap != 0 && m_hop > 0 && m_hop * m_overlap == m_frameLength && m_fftLength >= m_frameLength &&
           m_fftLength % 2 == 0 && m_history >= 2;
}

}  // namespace ora::fft::stretch::pv
