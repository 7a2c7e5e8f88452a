#include "FFT/FrameTypes.h"

namespace ora::fft {

namespace {

enum Trait : unsigned { kVector = 1, kReal = 2, kComplex = 4, kInteger = 8, kSplit = 16, kMono = 32, kFreq = 64, kEx = 128 };

struct TypeRow {
    const char* name;
    unsigned traits;
};

constexpr TypeRow kTypes[kTypeCount] = {
    {"FREQ_REAL_VECTOR", kVector | kReal | kFreq},
    {"FREQ_CPLX_VECTOR", kVector | kComplex | kFreq},
    {"SIG_REAL_VECTOR", kVector | kReal},
    {"FREQ_REAL_MONO_VECTOR", kVector | kReal | kFreq | kMono},
    {"FREQ_CPLX_MONO_VECTOR", kVector | kComplex | kFreq | kMono},
    {"SIG_REAL_MONO_VECTOR", kVector | kReal | kMono},
    {"SIG_SPLIT_REAL_VECTOR", kVector | kReal | kSplit},
    {"FREQ_EX_REAL_VECTOR", kVector | kReal | kFreq | kEx},
    {"FREQ_EX_CPLX_VECTOR", kVector | kComplex | kFreq | kEx},
    {"FREQ_EX_REAL_MONO_VECTOR", kVector | kReal | kFreq | kEx | kMono},
    {"FREQ_EX_CPLX_MONO_VECTOR", kVector | kComplex | kFreq | kEx | kMono},
    {"INT_SCALAR", kInteger},
    {"REAL_SCALAR", kReal},
};

constexpr const char* kVariables[kVariableCount] = {
    "TSIG", "FSIG", "SGAIN", "CGAIN", "SMGAIN", "CMGAIN", "SFEAT", "CFEAT", "SMFEAT", "CMFEAT",
    "PHASE_START", "PHASE_IN", "MAG2", "MAG_LOG", "TGRAD", "FGRAD", "FGRAD_LEFT", "FGRAD_RIGHT", "MASK",
    "PRE_PHASE_OFFSET", "POST_PHASE_OFFSET", "FREQ_SCALE", "TIME_SCALE", "SGAIN_DIRTY", "THRESHOLD",
    "THRESHOLD_FREQ", "FSIG_EX", "SGAIN_EX", "MAG_EX", "PHASE_EX", "PHASE_START_EX", "PHASE_IN_EX", "MAG2_EX",
    "MAG_LOG_EX", "TGRAD_EX", "FGRAD_EX", "FGRAD_LEFT_EX", "FGRAD_RIGHT_EX",
    "VM0_LEN", "VM1_LEN", "VM2_LEN", "VM3_LEN", "VM4_LEN", "VM5_LEN", "VM6_LEN", "VM7_LEN",
    "VMC0", "VMC1", "VMC2", "VMC3", "VMC0_LEN", "VMC1_LEN", "VMC2_LEN", "VMC3_LEN",
    "V0_LEN", "V1_LEN", "V2_LEN", "V3_LEN", "V4_LEN", "V5_LEN", "V6_LEN", "V7_LEN",
    "VC0_LEN", "VC1_LEN", "VC2_LEN", "VC3_LEN",
    "LVM0", "LVM1", "LVM2", "LVM3", "LVM0_LEN", "LVM1_LEN", "LVM2_LEN", "LVM3_LEN",
    "LV0_LEN", "LV1_LEN", "LV2_LEN", "LV3_LEN",
};

unsigned Traits(type t) {
    const auto i = static_cast<std::size_t>(t);
    return i < kTypeCount ? kTypes[i].traits : 0u;
}

}  // namespace

bool IsVector(type t) { return (Traits(t) & kVector) != 0; }
bool IsScalar(type t) { return Traits(t) != 0 && !IsVector(t); }
bool IsReal(type t) { return (Traits(t) & kReal) != 0; }
bool IsComplex(type t) { return (Traits(t) & kComplex) != 0; }
bool IsInteger(type t) { return (Traits(t) & kInteger) != 0; }
bool IsSplit(type t) { return (Traits(t) & kSplit) != 0; }
bool IsMono(type t) { return (Traits(t) & kMono) != 0; }
bool IsFrequency(type t) { return (Traits(t) & kFreq) != 0; }
bool IsExtended(type t) { return (Traits(t) & kEx) != 0; }

const char* TypeName(type t) {
    const auto i = static_cast<std::size_t>(t);
    return i < kTypeCount ? kTypes[i].name : "Invalid";
}

const char* VariableName(variable v) {
    const auto i = static_cast<std::size_t>(v);
    return i < kVariableCount ? kVariables[i] : "Invalid";
}

}  // namespace ora::fft
