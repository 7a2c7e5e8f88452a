#include "FFT/Frame.h"

#include "System/Check.h"

namespace ora::fft {

Frame::Variable* Frame::Slot(variable var) {
    const auto i = static_cast<std::size_t>(var);
    return i < kVariableCount ? &m_variables[i] : nullptr;
}

const Frame::Variable* Frame::Find(variable var) const {
    const auto i = static_cast<std::size_t>(var);
    return i < kVariableCount && m_present[i] ? &m_variables[i] : nullptr;
}

bool Frame::CreateVector(variable var, type typeId, std::size_t rows, std::size_t length) {
    const type type_id = typeId;
    const variable var_id = var;
    if (!ORA_CHECK(Find(var_id) == nullptr) || !ORA_CHECK(IsVector(type_id)) || Slot(var_id) == nullptr) return false;
    if (IsMono(type_id)) rows = 1;
    if (rows == 0 || length == 0) return false;
    const std::size_t floats = rows * length * (IsComplex(type_id) ? 2u : 1u);
    float* data = m_pool.Allocate(floats);
    if (data == nullptr) return false;
    Variable& v = *Slot(var_id);
    v = Variable{};
    v.typeId = type_id;
    v.rows = rows;
    v.length = length;
    v.data = data;
    m_present[static_cast<std::size_t>(var_id)] = true;
    return true;
}

bool Frame::RequireVector(variable var, type typeId, std::size_t rows, std::size_t length) {
    const Variable* v = Find(var);
    if (v == nullptr) return CreateVector(var, typeId, rows, length);
    if (IsMono(typeId)) rows = 1;
    const type type_id = typeId;
    return ORA_CHECK(v->TypeOf() == type_id) && ORA_CHECK(v->rows == rows && v->length == length);
}

bool Frame::CreateScalar(variable var, type typeId) {
    const type type_id = typeId;
    const variable var_id = var;
    if (!ORA_CHECK(Find(var_id) == nullptr) || !ORA_CHECK(IsScalar(type_id)) || Slot(var_id) == nullptr) return false;
    Variable& v = *Slot(var_id);
    v = Variable{};
    v.typeId = type_id;
    v.rows = 1;
    v.length = 1;
    m_present[static_cast<std::size_t>(var_id)] = true;
    return true;
}

const Frame::Variable* Frame::Get(variable var, type typeId) const {
    const Variable* v = Find(var);
    const type type_id = typeId;
    if (v == nullptr || !ORA_CHECK(v->TypeOf() == type_id)) return nullptr;
    return v;
}

float* Frame::Real(variable var, type typeId) {
    const Variable* v = Get(var, typeId);
    return v != nullptr && IsVector(typeId) && IsReal(typeId) ? v->data : nullptr;
}

Complex* Frame::Cplx(variable var, type typeId) {
    const Variable* v = Get(var, typeId);
    return v != nullptr && IsVector(typeId) && IsComplex(typeId) ? reinterpret_cast<Complex*>(v->data) : nullptr;
}

std::int64_t* Frame::Int(variable var) {
    return Get(var, type::INT_SCALAR) != nullptr ? &Slot(var)->integer : nullptr;
}

double* Frame::Scalar(variable var) {
    return Get(var, type::REAL_SCALAR) != nullptr ? &Slot(var)->real : nullptr;
}

void Frame::Clear() {
    for (std::size_t i = 0; i < kVariableCount; ++i) {
        if (!m_present[i]) continue;
        if (m_variables[i].data != nullptr) m_pool.Free(m_variables[i].data);
        m_variables[i] = Variable{};
        m_present[i] = false;
    }
}

void Frame::Dump(std::FILE* out) const {
    std::fprintf(out, "---- Frame %p ----\n", static_cast<const void*>(this));
    for (std::size_t i = 0; i < kVariableCount; ++i) {
        if (!m_present[i]) continue;
        const Variable& v = m_variables[i];
        const char* name = VariableName(static_cast<variable>(i));
        const char* typeName = TypeName(v.typeId);
        if (v.typeId == type::INT_SCALAR)
            std::fprintf(out, "[%s, %s]: %d\n", name, typeName, static_cast<int>(v.integer));
        else if (v.typeId == type::REAL_SCALAR)
            std::fprintf(out, "[%s, %s]: %f\n", name, typeName, v.real);
        else if (IsVector(v.typeId) && v.data != nullptr)
            std::fprintf(out, "[%s, %s]: 0x%p\n", name, typeName, static_cast<const void*>(v.data));
        else if (IsVector(v.typeId))
            std::fprintf(out, "[%s, %s]: Invalid\n", name, typeName);
        else
            std::fprintf(out, "[%s, %s]: unknown\n", name, typeName);
    }
}

}  // namespace ora::fft
