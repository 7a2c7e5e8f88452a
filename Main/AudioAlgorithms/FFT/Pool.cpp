#include "FFT/Pool.h"

#include <new>

#include "System/Trace.h"

namespace ora::fft {

Pool::~Pool() {
    system::Trace("~Pool(): %s", m_inUse == 0 ? "all vectors freed" : "some vectors not freed");
}

float* Pool::Allocate(std::size_t floats) {
    for (std::size_t i = 0; i < kCapacity; ++i) {
        if (m_taken[i]) continue;
        try {
            if (m_vectors[i].size() != floats)
                m_vectors[i].Resize(floats);
            else
                m_vectors[i].Clear();
        } catch (const std::bad_alloc&) {
            return nullptr;
        }
        m_taken[i] = true;
        ++m_inUse;
        return m_vectors[i].data();
    }
    return nullptr;
}

bool Pool::Free(float* vector) {
    if (vector == nullptr) return false;
    for (std::size_t i = 0; i < kCapacity; ++i) {
        if (m_taken[i] && m_vectors[i].data() == vector) {
            m_taken[i] = false;
            --m_inUse;
            return true;
        }
    }
    return false;
}

}  // namespace ora::fft
