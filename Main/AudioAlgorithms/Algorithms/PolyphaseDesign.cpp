#include "Algorithms/PolyphaseDesign.h"

#include "Algorithms/KaiserLowPass.h"

namespace ora::numeric {

std::vector<float> DefaultPolyphasePrototype(std::size_t factor, std::size_t tapsPerPhase) {
    return KaiserLowPass(factor * tapsPerPhase, kPolyphaseCutoff * 0.5 / static_cast<double>(factor), kPolyphaseBeta);
}

}  // namespace ora::numeric
