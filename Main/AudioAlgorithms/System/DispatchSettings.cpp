#include "System/DispatchSettings.h"

#include <cstdlib>
#include <cstring>

namespace ora::system {

namespace {

bool Forced() { return DispatchSettings::Instance().GetMode() == DispatchMode::Forced; }

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

FeatureSet ForcedFeatures(InstructionLevel level, bool fma, bool wide) {
    const auto atLeast = [level](InstructionLevel wanted) { return static_cast<int>(level) >= static_cast<int>(wanted); };
    FeatureSet f;
    f.sse = atLeast(InstructionLevel::SSE);
    f.sse2 = atLeast(InstructionLevel::SSE2);
    f.sse3 = atLeast(InstructionLevel::SSE3);
    f.level4 = atLeast(InstructionLevel::SSSE3);
    f.sse41 = atLeast(InstructionLevel::SSE41);
    f.sse42 = atLeast(InstructionLevel::SSE42);
    f.avx = atLeast(InstructionLevel::AVX);
    f.avx2 = atLeast(InstructionLevel::AVX2);
    f.fma = fma;
    f.wide = wide;
    return f;
}

FeatureSet DetectedFeatures(const ora_cpuinfo_x86& cpu) {
    FeatureSet f;
    if (!cpu.valid) return f;
    f.sse = cpu.sse;
    f.sse2 = cpu.sse2;
    f.sse3 = cpu.sse3;
    f.level4 = cpu.sse41;
    f.sse41 = cpu.sse41;
    f.sse42 = cpu.sse42;
    f.avx = cpu.osAvx;
    f.avx2 = cpu.osAvx && cpu.avx2;
    f.fma = cpu.osAvx && cpu.fma;
    return f;
}

FeatureSet CurrentFeatures() {
    const DispatchSettings& settings = DispatchSettings::Instance();
    return Forced() ? ForcedFeatures(settings.GetForcedLevel(), settings.GetForcedFma(), settings.GetForcedWide())
                    : DetectedFeatures(settings.Detected());
}

bool HasSSE() { return CurrentFeatures().sse; }
bool HasSSE2() { return CurrentFeatures().sse2; }
bool HasSSE3() { return CurrentFeatures().sse3; }
bool HasLevel4() { return CurrentFeatures().level4; }
bool HasSSE41() { return CurrentFeatures().sse41; }
bool HasSSE42() { return CurrentFeatures().sse42; }
bool HasAVX() { return CurrentFeatures().avx; }
bool HasAVX2() { return CurrentFeatures().avx2; }
bool HasFMA() { return CurrentFeatures().fma; }
bool HasWideVectors() { return CurrentFeatures().wide; }

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

KernelForm ChooseKernelForm(const FeatureSet& f) {
    if (f.avx && f.fma) return KernelForm::M256Fma;
    if (f.avx) return KernelForm::M256;
    if (f.fma) return KernelForm::M128Fma;
    if (f.sse2) return KernelForm::M128;
    return KernelForm::Ref;
}

KernelForm ChooseKernelFormWithoutFma(const FeatureSet& f) {
    switch (ChooseKernelForm(f)) {
        case KernelForm::M256Fma:
        case KernelForm::M256: return KernelForm::M256;
        case KernelForm::M128Fma:
        case KernelForm::M128: return KernelForm::M128;
        default: return KernelForm::Ref;
    }
}

IntegerKernelForm ChooseIntegerKernelForm(const FeatureSet& f) {
    if (f.avx2) return IntegerKernelForm::M256Avx2;
    if (f.sse41) return IntegerKernelForm::M128Sse41;
    return IntegerKernelForm::Ref;
}

KernelForm ChooseKernelForm() { return ChooseKernelForm(CurrentFeatures()); }
KernelForm ChooseKernelFormWithoutFma() { return ChooseKernelFormWithoutFma(CurrentFeatures()); }
IntegerKernelForm ChooseIntegerKernelForm() { return ChooseIntegerKernelForm(CurrentFeatures()); }

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
