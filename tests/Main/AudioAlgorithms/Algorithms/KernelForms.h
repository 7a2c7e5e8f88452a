// Helpers for the kernel-family tests: the table of forms forced one by one
// (also those this machine's dispatcher would not pick), awkward lengths,
// misaligned buffers with guard zones, and ULP distances.
#pragma once

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "System/DispatchSettings.h"

namespace kerneltest {

using ora::system::InstructionLevel;
using ora::system::KernelForm;

struct Form {
    const char* name;  // as FormName() reports it
    InstructionLevel level;
    bool fma;
    bool fused;  // sums may round differently from ref
};

// The floating-point ladder's forms, each forced by the settings that pick it.
inline const std::vector<Form>& FloatForms() {
    static const std::vector<Form> forms = {
        {"ref", InstructionLevel::None, false, false},     {"m128", InstructionLevel::SSE2, false, false},
        {"m128_fma", InstructionLevel::SSE42, true, true}, {"m256", InstructionLevel::AVX, false, false},
        {"m256_fma", InstructionLevel::AVX, true, true},
    };
    return forms;
}

// A family without fused forms reports the plain form of the width.
inline std::string PlainName(const Form& form) {
    const std::string name = form.name;
    return name.substr(0, name.find("_fma"));
}

// Whether this processor can run code of the form.
inline bool Runnable(const Form& form) {
    const auto& cpu = ora::system::DispatchSettings::Instance().Detected();
    if (form.fma && !(cpu.fma && cpu.osAvx)) return false;
    if (form.level >= InstructionLevel::AVX2 && !(cpu.avx2 && cpu.osAvx)) return false;
    if (form.level >= InstructionLevel::AVX && !cpu.osAvx) return false;
    if (form.level >= InstructionLevel::SSE41 && !cpu.sse41) return false;
    return true;
}

inline const std::vector<std::size_t>& AwkwardLengths() {
    static const std::vector<std::size_t> lengths = {0,  1,  2,  3,  4,  5,  6,  7,  8,   9,   10,
                                                     11, 12, 13, 14, 15, 16, 17, 65, 999, 4095};
    return lengths;
}

// Samples one float past a 64-byte boundary (so never aligned for vector
// loads), with guard zones before and after that must stay untouched.
template <class T = float>
class Guarded {
public:
    static constexpr std::size_t kGuard = 19;
    explicit Guarded(std::size_t size, T fill = T{}) : m_size(size), m_store(size + 2 * kGuard + 32) {
        const auto address = reinterpret_cast<std::uintptr_t>(m_store.data());
        m_offset = ((64 - address % 64) % 64) / sizeof(T) % 16 + 1 + kGuard;
        for (T& v : m_store) std::memcpy(&v, &kPattern, sizeof(T));
        std::fill(m_store.begin() + static_cast<std::ptrdiff_t>(m_offset),
                  m_store.begin() + static_cast<std::ptrdiff_t>(m_offset + size), fill);
    }
    T* data() { return m_store.data() + m_offset; }
    const T* data() const { return m_store.data() + m_offset; }
    T& operator[](std::size_t i) { return data()[i]; }
    std::size_t size() const { return m_size; }
    std::vector<T> Values() const { return std::vector<T>(data(), data() + m_size); }
    bool GuardsIntact() const {
        for (std::size_t i = m_offset - kGuard; i < m_offset; ++i)
            if (std::memcmp(&m_store[i], &kPattern, sizeof(T)) != 0) return false;
        for (std::size_t i = m_offset + m_size; i < m_offset + m_size + kGuard; ++i)
            if (std::memcmp(&m_store[i], &kPattern, sizeof(T)) != 0) return false;
        return true;
    }

private:
    static constexpr std::uint32_t kPattern = 0x7FC0BEEF;  // a NaN as float
    std::size_t m_size;
    std::size_t m_offset = 0;
    std::vector<T> m_store;
};

// Distance in units in the last place between two finite floats.
inline std::int64_t UlpDistance(float a, float b) {
    std::int32_t ia, ib;
    std::memcpy(&ia, &a, 4);
    std::memcpy(&ib, &b, 4);
    const std::int64_t la = ia < 0 ? std::int64_t{INT32_MIN} - ia : ia;
    const std::int64_t lb = ib < 0 ? std::int64_t{INT32_MIN} - ib : ib;
    return la > lb ? la - lb : lb - la;
}

// Reproducible uniform noise in [-1, 1).
inline std::vector<float> Noise(std::size_t n, std::uint32_t seed) {
    std::vector<float> x(n);
    std::uint32_t s = seed * 747796405u + 1u;
    for (float& v : x) {
        s = s * 1664525u + 1013904223u;
        v = static_cast<float>(static_cast<double>(s) / 2147483648.0 - 1.0);
    }
    return x;
}

}  // namespace kerneltest

namespace kerneltest {

// Runs `body` once per runnable floating-point form, forced, with the name
// the family should report (families without fused forms report the plain
// form of the width).
template <class Body>
void ForEachForm(bool hasFusedForms, Body body) {
    for (const Form& form : FloatForms()) {
        if (!Runnable(form)) continue;
        ora::system::ScopedDispatch forced(form.level, form.fma);
        body(form, hasFusedForms ? std::string(form.name) : PlainName(form));
    }
}

// The sum of AwkwardLengths(): a signal long enough to walk them all.
inline std::size_t AwkwardTotal() {
    std::size_t total = 0;
    for (std::size_t n : AwkwardLengths()) total += n;
    return total;
}

}  // namespace kerneltest
