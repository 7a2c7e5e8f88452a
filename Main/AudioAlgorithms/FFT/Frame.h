// One frame of the FFT engine: the typed variables its plug-ins share.
// Plug-ins create their variables when the pipeline is configured (vectors
// come from the pool) and look them up by identifier and type while frames
// run. A variable is created once; a lookup with the wrong type is refused.
#pragma once

#include <array>
#include <cstdint>
#include <cstdio>

#include "FFT/FFTBackend.h"
#include "FFT/FrameTypes.h"
#include "FFT/Pool.h"

namespace ora::fft {

class Frame {
public:
    struct Variable {
        type typeId = type::LastId;
        std::size_t rows = 0;    // channels (1 for MONO types)
        std::size_t length = 0;  // elements per row (complex elements for CPLX types)
        float* data = nullptr;   // vectors: rows * length (* 2 for complex), row-major
        std::int64_t integer = 0;
        double real = 0.0;

        type TypeOf() const { return typeId; }
    };

    explicit Frame(Pool& pool) : m_pool(pool) {}
    ~Frame() { Clear(); }
    Frame(const Frame&) = delete;
    Frame& operator=(const Frame&) = delete;

    // Vectors: `rows` rows of `length` elements, zeroed. False when the
    // variable exists already ("Find(var_id) == nullptr"), the type is not a
    // vector, or the pool cannot supply it.
    bool CreateVector(variable var, type typeId, std::size_t rows, std::size_t length);
    // Creates the vector, or accepts one already created with the same type
    // and shape (plug-ins that share a variable both require it).
    bool RequireVector(variable var, type typeId, std::size_t rows, std::size_t length);
    // Scalars start at zero.
    bool CreateScalar(variable var, type typeId);

    const Variable* Find(variable var) const;

    // Typed access; null (with a reported check) when the variable is
    // missing or of another type ("TypeOf() == type_id").
    float* Real(variable var, type typeId);
    Complex* Cplx(variable var, type typeId);
    std::int64_t* Int(variable var);
    double* Scalar(variable var);
    const Variable* Get(variable var, type typeId) const;

    // Gives every vector back to the pool and forgets every variable.
    void Clear();

    // "---- Frame %p ----", then one line per variable.
    void Dump(std::FILE* out) const;

private:
    Variable* Slot(variable var);

    Pool& m_pool;
    std::array<Variable, kVariableCount> m_variables{};
    std::array<bool, kVariableCount> m_present{};
};

}  // namespace ora::fft
