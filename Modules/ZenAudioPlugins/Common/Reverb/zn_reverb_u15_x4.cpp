#include "zn_reverb_u15_x4.h"

#include "Common/ZenAssert.h"

namespace zen::reverb {

bool zn_reverb_u15_x4::Process(float* const* channels, std::uint64_t nsamples) {
    if ((nsamples & 3) != 0) {
        ZEN_ASSERT((nsamples & 3) == 0, "(nsamples & 3) == 0");
        return false;
    }
    return ProcessResampled(channels, static_cast<std::size_t>(nsamples));
}

}  // namespace zen::reverb
