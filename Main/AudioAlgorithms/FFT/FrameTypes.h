// The types and identifiers of the variables a frame holds.
//
// Vector types hold one row per channel unless they are MONO (one row);
// FREQ rows hold the n/2 + 1 bins of a real transform, FREQ_EX rows all n
// bins, SIG rows a time frame of the transform length. SPLIT marks a signal
// whose channels each keep their own row even where others are shared.
#pragma once

#include <cstddef>

namespace ora::fft {

enum class type : int {
    FREQ_REAL_VECTOR,
    FREQ_CPLX_VECTOR,
    SIG_REAL_VECTOR,
    FREQ_REAL_MONO_VECTOR,
    FREQ_CPLX_MONO_VECTOR,
    SIG_REAL_MONO_VECTOR,
    SIG_SPLIT_REAL_VECTOR,
    FREQ_EX_REAL_VECTOR,
    FREQ_EX_CPLX_VECTOR,
    FREQ_EX_REAL_MONO_VECTOR,
    FREQ_EX_CPLX_MONO_VECTOR,
    INT_SCALAR,
    REAL_SCALAR,
    LastId
};

enum class variable : int {
    TSIG, FSIG, SGAIN, CGAIN, SMGAIN, CMGAIN, SFEAT, CFEAT, SMFEAT, CMFEAT,
    PHASE_START, PHASE_IN, MAG2, MAG_LOG, TGRAD, FGRAD, FGRAD_LEFT, FGRAD_RIGHT, MASK,
    PRE_PHASE_OFFSET, POST_PHASE_OFFSET, FREQ_SCALE, TIME_SCALE, SGAIN_DIRTY, THRESHOLD, THRESHOLD_FREQ,
    FSIG_EX, SGAIN_EX, MAG_EX, PHASE_EX, PHASE_START_EX, PHASE_IN_EX, MAG2_EX, MAG_LOG_EX,
    TGRAD_EX, FGRAD_EX, FGRAD_LEFT_EX, FGRAD_RIGHT_EX,
    VM0_LEN, VM1_LEN, VM2_LEN, VM3_LEN, VM4_LEN, VM5_LEN, VM6_LEN, VM7_LEN,
    VMC0, VMC1, VMC2, VMC3, VMC0_LEN, VMC1_LEN, VMC2_LEN, VMC3_LEN,
    V0_LEN, V1_LEN, V2_LEN, V3_LEN, V4_LEN, V5_LEN, V6_LEN, V7_LEN,
    VC0_LEN, VC1_LEN, VC2_LEN, VC3_LEN,
    LVM0, LVM1, LVM2, LVM3, LVM0_LEN, LVM1_LEN, LVM2_LEN, LVM3_LEN,
    LV0_LEN, LV1_LEN, LV2_LEN, LV3_LEN,
    LastId
};

constexpr std::size_t kTypeCount = static_cast<std::size_t>(type::LastId);
constexpr std::size_t kVariableCount = static_cast<std::size_t>(variable::LastId);

bool IsVector(type t);
bool IsScalar(type t);
bool IsReal(type t);
bool IsComplex(type t);
bool IsInteger(type t);
bool IsSplit(type t);
bool IsMono(type t);
bool IsFrequency(type t);
bool IsExtended(type t);  // all n bins rather than n/2 + 1

// "FREQ_REAL_VECTOR", ..., "Invalid" outside the table.
const char* TypeName(type t);
// "TSIG", ..., "Invalid" outside the table.
const char* VariableName(variable v);

}  // namespace ora::fft
