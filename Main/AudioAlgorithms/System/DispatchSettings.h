// Process-wide choice of instruction set for the kernel families.
//
// Detected mode answers the feature queries from the processor; forced mode
// answers them from an ordered level and two booleans, so tests (and users,
// through ORA_DISPATCH) can run every form on one machine. Kernel fronts
// consult the queries once, when they are built, never per block.
//
// ORA_DISPATCH, read at first use: "ref", "sse2", "sse41", "avx", "avx-fma",
// "avx2" (forced levels) or "detected" (the default).
#pragma once

#include <atomic>

#include "System/ora_cpuinfo_x86.h"

namespace ora::system {

// Ordered: each level implies the ones below it.
enum class InstructionLevel : int { None = 0, SSE = 1, SSE2 = 2, SSE3 = 3, SSSE3 = 4, SSE41 = 5, SSE42 = 6, AVX = 7, AVX2 = 8 };

enum class DispatchMode : int { Forced = 0, Detected = 1 };

class DispatchSettings {
public:
    static DispatchSettings& Instance();

    DispatchMode GetMode() const { return static_cast<DispatchMode>(m_mode.load()); }
    const ora_cpuinfo_x86& Detected() const { return m_detected; }

    // Forced mode with this level and booleans. The second boolean stands for
    // 512-bit vectors; detection never enables them (no such forms exist).
    void Force(InstructionLevel level, bool fma, bool wide = false);
    void UseDetected() { m_mode.store(static_cast<int>(DispatchMode::Detected)); }

    InstructionLevel GetForcedLevel() const { return static_cast<InstructionLevel>(m_level.load()); }
    bool GetForcedFma() const { return m_fma.load(); }
    bool GetForcedWide() const { return m_wide.load(); }

    // Counts and identifiers that stand in for the detected ones in forced mode.
    int GetForcedLogicalProcessors() const { return m_forcedLogical.load(); }
    void SetForcedLogicalProcessors(int count) { m_forcedLogical.store(count); }
    int GetForcedHighestStandardLeaf() const { return m_forcedHighestLeaf.load(); }
    void SetForcedHighestStandardLeaf(int leaf) { m_forcedHighestLeaf.store(leaf); }
    int GetForcedInitialApicId() const { return m_forcedApicId.load(); }
    void SetForcedInitialApicId(int id) { m_forcedApicId.store(id); }
    int GetForcedPhysicalCores() const { return m_forcedPhysical.load(); }
    void SetForcedPhysicalCores(int count) { m_forcedPhysical.store(count); }
    int GetForcedThreadsPerCore() const { return m_forcedThreadsPerCore.load(); }
    void SetForcedThreadsPerCore(int count) { m_forcedThreadsPerCore.store(count); }

private:
    DispatchSettings();

    ora_cpuinfo_x86 m_detected;
    std::atomic<int> m_mode{static_cast<int>(DispatchMode::Detected)};
    std::atomic<int> m_level{0};
    std::atomic<bool> m_fma{false};
    std::atomic<bool> m_wide{false};
    std::atomic<int> m_forcedLogical{64};
    std::atomic<int> m_forcedHighestLeaf{32768};
    std::atomic<int> m_forcedApicId{32768};
    std::atomic<int> m_forcedPhysical{4};
    std::atomic<int> m_forcedThreadsPerCore{2};
};

// What the feature queries answer; every choice of form is a function of it.
struct FeatureSet {
    bool sse = false, sse2 = false, sse3 = false, level4 = false, sse41 = false, sse42 = false;
    bool avx = false, avx2 = false, fma = false, wide = false;
};

// Forced mode: each level implies the ones below it; FMA and the second
// boolean as given.
FeatureSet ForcedFeatures(InstructionLevel level, bool fma, bool wide = false);
// Detected mode: level 4 is SSE4.1 (SSSE3 is not detected separately), AVX
// is operating-system AVX support. AVX2 and FMA also need that support:
// their forms are VEX-encoded (the fused 128-bit ones too, being built with
// -mfma), so without it the ladder falls to the non-VEX 128-bit forms.
FeatureSet DetectedFeatures(const ora_cpuinfo_x86& cpu);
// The process-wide settings' answer.
FeatureSet CurrentFeatures();

// Feature queries: forced level and booleans in forced mode, the processor
// in detected mode.
bool HasSSE();
bool HasSSE2();
bool HasSSE3();
bool HasLevel4();  // SSSE3 when forced; SSE4.1 when detected (SSSE3 is not detected separately)
bool HasSSE41();
bool HasSSE42();
bool HasAVX();     // operating-system AVX support when detected
bool HasAVX2();
bool HasFMA();
bool HasWideVectors();  // the second forced boolean; always false when detected
int LogicalProcessorCount();
int PhysicalCoreCount();
int HighestStandardLeaf();
int InitialApicId();

// The forms of a kernel family, best first, and the ladder that picks one.
enum class KernelForm { M256Fma, M256, M128Fma, M128, Ref };

// 256-bit FMA when AVX and FMA; else 256-bit when AVX; else 128-bit FMA when
// FMA; else 128-bit when SSE2; else the reference form.
KernelForm ChooseKernelForm(const FeatureSet& features);
KernelForm ChooseKernelForm();
// The same ladder for a family without fused forms: they become the plain
// vector form of their width.
KernelForm ChooseKernelFormWithoutFma(const FeatureSet& features);
KernelForm ChooseKernelFormWithoutFma();
const char* KernelFormName(KernelForm form);

// Families of integer arithmetic have a ladder of their own: 256-bit integer
// vectors need AVX2, 128-bit 32-bit multiplies SSE4.1.
enum class IntegerKernelForm { M256Avx2, M128Sse41, Ref };
IntegerKernelForm ChooseIntegerKernelForm(const FeatureSet& features);
IntegerKernelForm ChooseIntegerKernelForm();
const char* KernelFormName(IntegerKernelForm form);

// Sets forced mode for a scope and restores the previous settings.
class ScopedDispatch {
public:
    ScopedDispatch(InstructionLevel level, bool fma);
    ~ScopedDispatch();
    ScopedDispatch(const ScopedDispatch&) = delete;
    ScopedDispatch& operator=(const ScopedDispatch&) = delete;

private:
    DispatchMode m_mode;
    InstructionLevel m_level;
    bool m_fma;
    bool m_wide;
};

}  // namespace ora::system
