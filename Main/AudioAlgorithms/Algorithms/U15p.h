// The 15 x 15 orthogonal mixing matrix of the reverb's feedback network,
// applied frame by frame: m = U (d + u) over lanes 0..14, U = 0.5 A - 0.3 J,
// where J is all ones and row r of A has ones in the columns
// {4, 6, 9, 10, 12, 13, 14} + r (mod 15). The column set is a cyclic
// (15, 7, 3) difference set, so A A^T = 4 I + 3 J and U U^T = I exactly.
//
// Lane 15 of d + u is ignored and lane 15 of m is left as it was. Every form
// sums in the same order (the sum of all lanes as a pairwise tree), so the
// forms agree bit for bit.
#pragma once

#include <cstddef>
#include <memory>

#include "Algorithms/LaneFrame.h"
#include "System/DispatchSettings.h"

namespace ora::numeric {

class U15pImpl {
public:
    virtual ~U15pImpl();
    // d, u, m: `frames` consecutive 16-float frames; m may alias d or u.
    virtual void Process(const float* d, const float* u, float* m, std::size_t frames) const noexcept = 0;
};

class U15p {
public:
    static constexpr std::size_t kOrder = 15;
    static constexpr std::size_t kRowOnes = 7;
    static constexpr int kColumns[kRowOnes] = {4, 6, 9, 10, 12, 13, 14};
    static constexpr float kIncidenceWeight = 0.5f;
    static constexpr float kAllOnesWeight = 0.3f;

    // Picks the form from the dispatch settings.
    U15p();
    ~U15p();
    U15p(const U15p&) = delete;
    U15p& operator=(const U15p&) = delete;

    void Process(const float* d, const float* u, float* m, std::size_t frames) const noexcept {
        m_impl->Process(d, u, m, frames);
    }

    system::KernelForm Form() const { return m_form; }
    const char* FormName() const { return system::KernelFormName(m_form); }

private:
    system::KernelForm m_form;
    std::unique_ptr<U15pImpl> m_impl;
};

// Vector forms (simd/m128, simd/m256); the fused ladder steps use them too.
U15pImpl* MakeU15p_m128();
U15pImpl* MakeU15p_m256();

}  // namespace ora::numeric
