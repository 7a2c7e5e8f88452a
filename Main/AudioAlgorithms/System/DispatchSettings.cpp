#include "System/DispatchSettings.h"

#include <cstdlib>
#include <cstring>

namespace ora::system {

namespace {

bool Forced() { return DispatchSettings::Instance().GetMode() == DispatchMode::Forced; }

bool LevelAtLeast(InstructionLevel level) {
    return static_cast<int>(DispatchSettings::Instance().GetForcedLevel()) >= static_cast<int>(level);
}

const ora_cpuinfo_x86& Cpu() { return DispatchSettings::Instance().Detected(); }

}  // namespace

DispatchSettings& DispatchSettings::Instance() {
    static DispatchSettings settings;
    return settings;
}

DispatchSettings::DispatchSettings() : m_detected(DetectCpu()) {
    const char* requested = std::getenv("ORA_DISPATCH");
    if (requested == nullptr) return;
    struct Choice {
        const char* name;
        InstructionLevel level;
        bool fma;
    };
    static const Choice choices[] = {
        {"ref", InstructionLevel::None, false},   {"sse2", InstructionLevel::SSE2, false},
        {"sse41", InstructionLevel::SSE41, false}, {"avx", InstructionLevel::AVX, false},
        {"avx-fma", InstructionLevel::AVX, true},  {"avx2", InstructionLevel::AVX2, true},
    };
    for (const Choice& choice : choices)
        if (std::strcmp(requested, choice.name) == 0) Force(choice.level, choice.fma);
}

void DispatchSettings::Force(InstructionLevel level, bool fma, bool wide) {
    m_level.store(static_cast<int>(level));
    m_fma.store(fma);
    m_wide.store(wide);
    m_mode.store(static_cast<int>(DispatchMode::Forced));
}

bool HasSSE() { return Forced() ? LevelAtLeast(InstructionLevel::SSE) : Cpu().valid && Cpu().sse; }
bool HasSSE2() { return Forced() ? LevelAtLeast(InstructionLevel::SSE2) : Cpu().valid && Cpu().sse2; }
bool HasSSE3() { return Forced() ? LevelAtLeast(InstructionLevel::SSE3) : Cpu().valid && Cpu().sse3; }
bool HasLevel4() { return Forced() ? LevelAtLeast(InstructionLevel::SSSE3) : Cpu().valid && Cpu().sse41; }
bool HasSSE41() { return Forced() ? LevelAtLeast(InstructionLevel::SSE41) : Cpu().valid && Cpu().sse41; }
bool HasSSE42() { return Forced() ? LevelAtLeast(InstructionLevel::SSE42) : Cpu().valid && Cpu().sse42; }
bool HasAVX() { return Forced() ? LevelAtLeast(InstructionLevel::AVX) : Cpu().valid && Cpu().osAvx; }
bool HasAVX2() { return Forced() ? LevelAtLeast(InstructionLevel::AVX2) : Cpu().valid && Cpu().avx2 && Cpu().osAvx; }
bool HasFMA() { return Forced() ? DispatchSettings::Instance().GetForcedFma() : Cpu().valid && Cpu().fma && Cpu().osAvx; }
bool HasWideVectors() { return Forced() && DispatchSettings::Instance().GetForcedWide(); }

int LogicalProcessorCount() {
    return Forced() ? DispatchSettings::Instance().GetForcedLogicalProcessors() : Cpu().logicalProcessors;
}

int PhysicalCoreCount() {
    return Forced() ? DispatchSettings::Instance().GetForcedPhysicalCores() : Cpu().physicalCores;
}

int HighestStandardLeaf() {
    return Forced() ? DispatchSettings::Instance().GetForcedHighestStandardLeaf()
                    : static_cast<int>(Cpu().highestStandardLeaf);
}

int InitialApicId() {
    return Forced() ? DispatchSettings::Instance().GetForcedInitialApicId() : static_cast<int>(Cpu().initialApicId);
}

KernelForm ChooseKernelForm() {
    if (HasAVX() && HasFMA()) return KernelForm::M256Fma;
    if (HasAVX()) return KernelForm::M256;
    if (HasFMA()) return KernelForm::M128Fma;
    if (HasSSE2()) return KernelForm::M128;
    return KernelForm::Ref;
}

KernelForm ChooseKernelFormWithoutFma() {
    switch (ChooseKernelForm()) {
        case KernelForm::M256Fma:
        case KernelForm::M256: return KernelForm::M256;
        case KernelForm::M128Fma:
        case KernelForm::M128: return KernelForm::M128;
        default: return KernelForm::Ref;
    }
}

IntegerKernelForm ChooseIntegerKernelForm() {
    if (HasAVX2()) return IntegerKernelForm::M256Avx2;
    if (HasSSE41()) return IntegerKernelForm::M128Sse41;
    return IntegerKernelForm::Ref;
}

const char* KernelFormName(IntegerKernelForm form) {
    switch (form) {
        case IntegerKernelForm::M256Avx2: return "m256_avx2";
        case IntegerKernelForm::M128Sse41: return "m128_sse41";
        case IntegerKernelForm::Ref: return "ref";
    }
    return "ref";
}

const char* KernelFormName(KernelForm form) {
    switch (form) {
        case KernelForm::M256Fma: return "m256_fma";
        case KernelForm::M256: return "m256";
        case KernelForm::M128Fma: return "m128_fma";
        case KernelForm::M128: return "m128";
        case KernelForm::Ref: return "ref";
    }
    return "ref";
}

ScopedDispatch::ScopedDispatch(InstructionLevel level, bool fma)
    : m_mode(DispatchSettings::Instance().GetMode()),
      m_level(DispatchSettings::Instance().GetForcedLevel()),
      m_fma(DispatchSettings::Instance().GetForcedFma()),
      m_wide(DispatchSettings::Instance().GetForcedWide()) {
    DispatchSettings::Instance().Force(level, fma);
}

ScopedDispatch::~ScopedDispatch() {
    DispatchSettings& settings = DispatchSettings::Instance();
    settings.Force(m_level, m_fma, m_wide);
    if (m_mode == DispatchMode::Detected) settings.UseDetected();
}

}  // namespace ora::system
