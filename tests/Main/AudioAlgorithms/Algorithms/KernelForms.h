// The kernel forms of the algorithm library, each forced in turn, for tests
// that compare every form with the reference form. Forms this processor
// cannot run are skipped, not failed.
#pragma once

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <random>
#include <string>
#include <vector>

#include "System/DispatchSettings.h"

namespace kerneltest {

using ora::system::InstructionLevel;
using ora::system::KernelForm;

struct Form {
    ora::system::KernelForm form;
    ora::system::InstructionLevel level;
    bool fma;
};

inline const std::vector<Form>& AllForms() {
    using ora::system::InstructionLevel;
    using ora::system::KernelForm;
    static const std::vector<Form> forms = {
        {KernelForm::Ref, InstructionLevel::None, false},
        {KernelForm::M128, InstructionLevel::SSE2, false},
        {KernelForm::M128Fma, InstructionLevel::SSE42, true},
        {KernelForm::M256, InstructionLevel::AVX, false},
        {KernelForm::M256Fma, InstructionLevel::AVX, true},
    };
    return forms;
}

inline bool Runnable(const Form& f) {
    const auto& cpu = ora::system::DispatchSettings::Instance().Detected();
    if (f.level >= ora::system::InstructionLevel::AVX && !cpu.osAvx) return false;
    if (f.fma && !(cpu.fma && cpu.osAvx)) return false;
    return true;
}

inline bool Fused(ora::system::KernelForm form) {
    return form == ora::system::KernelForm::M128Fma || form == ora::system::KernelForm::M256Fma;
}

// Lengths that catch tails and vector-width mistakes.
inline const std::vector<std::size_t>& AwkwardLengths() {
    static const std::vector<std::size_t> lengths = {0,  1,  2,  3,  4,  5,  6,  7,  8,   9,   10,
                                                     11, 12, 13, 14, 15, 16, 17, 65, 999, 4095};
    return lengths;
}

// Their sum: a signal long enough to walk them all.
inline std::size_t AwkwardTotal() {
    std::size_t total = 0;
    for (std::size_t n : AwkwardLengths()) total += n;
    return total;
}

inline std::vector<float> RandomFloats(std::size_t n, std::uint32_t seed, float amplitude = 1.0f) {
    std::mt19937 rng(seed);
    std::uniform_real_distribution<float> dist(-amplitude, amplitude);
    std::vector<float> v(n);
    for (float& x : v) x = dist(rng);
    return v;
}

// Symmetric taps of `length` from their first half.
inline std::vector<float> Symmetric(const std::vector<float>& half, std::size_t length) {
    std::vector<float> h(length);
    for (std::size_t k = 0; k < length; ++k) h[k] = half[std::min(k, length - 1 - k)];
    return h;
}

// Samples one float past a 64-byte boundary, with guard zones before and
// after them that must stay untouched; for floats and 32-bit integers.
template <class T = float>
class Guarded {
public:
    static constexpr std::size_t kGuard = 19;
    explicit Guarded(std::size_t size) : m_size(size), m_store(size + 2 * kGuard + 32) {
        const auto address = reinterpret_cast<std::uintptr_t>(m_store.data());
        m_offset = ((64 - address % 64) % 64) / sizeof(T) % 16 + 1 + kGuard;
        for (T& v : m_store) std::memcpy(&v, &kPattern, sizeof(T));
        std::fill(m_store.begin() + static_cast<std::ptrdiff_t>(m_offset),
                  m_store.begin() + static_cast<std::ptrdiff_t>(m_offset + size), T{});
    }
    T* data() { return m_store.data() + m_offset; }
    T& operator[](std::size_t i) { return data()[i]; }
    std::vector<T> Values() { return std::vector<T>(data(), data() + m_size); }
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

// Runs `body(form, name)` once per form this processor runs, forced, with the
// name the family should report: families without fused forms report the
// plain form of the width.
template <class Body>
void ForEachForm(bool hasFusedForms, Body body) {
    for (const Form& form : AllForms()) {
        if (!Runnable(form)) continue;
        ora::system::ScopedDispatch forced(form.level, form.fma);
        const std::string name = ora::system::KernelFormName(form.form);
        body(form, hasFusedForms ? name : name.substr(0, name.find("_fma")));
    }
}

}  // namespace kerneltest
