// Processor detection, forced mode and the choice ladder of kernel forms.
#include <gtest/gtest.h>

#include <cpuid.h>
#include <thread>

#include "System/DispatchSettings.h"

using namespace ora::system;

namespace {

// CPUID bits: leaf 1 EDX, leaf 1 ECX, leaf 7 EBX.
constexpr unsigned kMmx = 1u << 23, kSse = 1u << 25, kSse2 = 1u << 26;
constexpr unsigned kSse3 = 1u << 0, kFma = 1u << 12, kSse41 = 1u << 19, kSse42 = 1u << 20;
constexpr unsigned kOsxsave = 1u << 27, kAvx = 1u << 28;
constexpr unsigned kAvx2 = 1u << 5;
constexpr unsigned kBaseEcx = kSse3 | kSse41 | kSse42;

CpuidWords Words(unsigned ecx, unsigned long long xcr0, unsigned leaf7Ebx = kAvx2, unsigned highestLeaf = 13) {
    CpuidWords w;
    w.highestStandardLeaf = highestLeaf;
    w.leaf1Edx = kMmx | kSse | kSse2;
    w.leaf1Ecx = ecx;
    w.leaf7Ebx = leaf7Ebx;
    w.xcr0 = xcr0;
    return w;
}

bool VexEncoded(KernelForm form) { return form != KernelForm::M128 && form != KernelForm::Ref; }

}  // namespace

TEST(CpuInfo, DetectionFillsTheFeatureFields) {
    const ora_cpuinfo_x86 info = DetectCpu();
    ASSERT_TRUE(info.valid);
    EXPECT_GE(info.highestStandardLeaf, 1u);
    EXPECT_FALSE(info.vendor.empty());
    // Every x86-64 processor has these.
    EXPECT_TRUE(info.mmx);
    EXPECT_TRUE(info.sse);
    EXPECT_TRUE(info.sse2);
    EXPECT_EQ(info.logicalProcessors, static_cast<int>(std::thread::hardware_concurrency()));
    EXPECT_GE(info.logicalProcessors, info.physicalCores);
    EXPECT_EQ(info.logicalExceedsPhysical, info.logicalProcessors > info.physicalCores);
    if (info.highestStandardLeaf < 7) {
        EXPECT_FALSE(info.avx2);
    }
    // Implied features agree with the compiler's own view of this machine.
    __builtin_cpu_init();
    EXPECT_EQ(info.sse41, __builtin_cpu_supports("sse4.1") != 0);
    EXPECT_EQ(info.avx2 && info.osAvx, __builtin_cpu_supports("avx2") != 0);
}

TEST(DispatchSettings, ForcedLevelsAreOrderedAndStandInForTheProcessor) {
    {
        ScopedDispatch forced(InstructionLevel::None, false);
        for (bool feature : {HasSSE(), HasSSE2(), HasSSE3(), HasLevel4(), HasSSE41(), HasSSE42(), HasAVX(), HasAVX2(),
                             HasFMA(), HasWideVectors()})
            EXPECT_FALSE(feature);
    }
    {
        ScopedDispatch forced(InstructionLevel::SSSE3, false);
        EXPECT_TRUE(HasSSE3() && HasLevel4());
        EXPECT_FALSE(HasSSE41());
        // The forced counts replace the detected ones.
        EXPECT_EQ(LogicalProcessorCount(), 64);
        EXPECT_EQ(PhysicalCoreCount(), 4);
    }
    ScopedDispatch forced(InstructionLevel::AVX2, true);
    EXPECT_TRUE(HasSSE42() && HasAVX() && HasAVX2() && HasFMA());
    EXPECT_FALSE(HasWideVectors());
}

TEST(DispatchSettings, EachFamilyClimbsItsOwnLadderOfForms) {
    struct Case {
        InstructionLevel level;
        bool fma;
        KernelForm withFma, plain;
        IntegerKernelForm integer;
    } cases[] = {
        {InstructionLevel::AVX2, true, KernelForm::M256Fma, KernelForm::M256, IntegerKernelForm::M256Avx2},
        // AVX without AVX2 has no 256-bit integers.
        {InstructionLevel::AVX, true, KernelForm::M256Fma, KernelForm::M256, IntegerKernelForm::M128Sse41},
        {InstructionLevel::AVX, false, KernelForm::M256, KernelForm::M256, IntegerKernelForm::M128Sse41},
        // FMA below AVX: 128-bit fused.
        {InstructionLevel::SSE42, true, KernelForm::M128Fma, KernelForm::M128, IntegerKernelForm::M128Sse41},
        // No 32-bit integer multiply before SSE4.1.
        {InstructionLevel::SSSE3, false, KernelForm::M128, KernelForm::M128, IntegerKernelForm::Ref},
        {InstructionLevel::SSE2, false, KernelForm::M128, KernelForm::M128, IntegerKernelForm::Ref},
        {InstructionLevel::SSE, false, KernelForm::Ref, KernelForm::Ref, IntegerKernelForm::Ref},
        {InstructionLevel::None, false, KernelForm::Ref, KernelForm::Ref, IntegerKernelForm::Ref},
    };
    for (const Case& c : cases) {
        ScopedDispatch forced(c.level, c.fma);
        EXPECT_EQ(ChooseKernelForm(), c.withFma) << static_cast<int>(c.level) << " fma " << c.fma;
        EXPECT_EQ(ChooseKernelFormWithoutFma(), c.plain) << static_cast<int>(c.level);
        EXPECT_EQ(ChooseIntegerKernelForm(), c.integer) << static_cast<int>(c.level);
    }
    EXPECT_STREQ(KernelFormName(IntegerKernelForm::M256Avx2), "m256_avx2");
    EXPECT_STREQ(KernelFormName(IntegerKernelForm::M128Sse41), "m128_sse41");
}

TEST(DispatchSettings, DetectedModeFollowsTheProcessor) {
    if (DispatchSettings::Instance().GetMode() != DispatchMode::Detected) GTEST_SKIP() << "ORA_DISPATCH is set";
    const ora_cpuinfo_x86& cpu = DispatchSettings::Instance().Detected();
    EXPECT_EQ(HasSSE2(), cpu.sse2);
    EXPECT_EQ(HasLevel4(), cpu.sse41);  // SSSE3 is not detected separately
    EXPECT_EQ(HasAVX(), cpu.osAvx);
    EXPECT_FALSE(HasWideVectors());
    EXPECT_EQ(LogicalProcessorCount(), cpu.logicalProcessors);
    EXPECT_EQ(HighestStandardLeaf(), static_cast<int>(cpu.highestStandardLeaf));
    {
        ScopedDispatch forced(InstructionLevel::None, false);
        EXPECT_FALSE(HasSSE2());
    }
    EXPECT_EQ(DispatchSettings::Instance().GetMode(), DispatchMode::Detected);  // restored
}

TEST(DispatchSettings, ChoosesFromTheCpuidWordsAndXcr0OfAnyProcessor) {
    const unsigned all = kBaseEcx | kFma | kOsxsave | kAvx;
    struct Case {
        const char* what;
        CpuidWords words;
        KernelForm withFma, plain;
        IntegerKernelForm integer;
    } cases[] = {
        {"AVX, FMA and AVX2 with YMM state saved", Words(all, 0b111), KernelForm::M256Fma, KernelForm::M256,
         IntegerKernelForm::M256Avx2},
        {"XCR0 = 0b110", Words(all, 0b110), KernelForm::M256Fma, KernelForm::M256, IntegerKernelForm::M256Avx2},
        // The detection accepts either state bit: with XCR0 = 0b010 the OS saves
        // no YMM state, yet the VEX-encoded forms are chosen.
        {"XCR0 = 0b010", Words(all, 0b010), KernelForm::M256Fma, KernelForm::M256, IntegerKernelForm::M256Avx2},
        {"XCR0 = 0b100", Words(all, 0b100), KernelForm::M256Fma, KernelForm::M256, IntegerKernelForm::M256Avx2},
        {"XCR0 = 0: the OS saves no vector state", Words(all, 0), KernelForm::M128, KernelForm::M128,
         IntegerKernelForm::M128Sse41},
        {"AVX without OSXSAVE", Words(kBaseEcx | kFma | kAvx, 0b111), KernelForm::M128, KernelForm::M128,
         IntegerKernelForm::M128Sse41},
        {"no AVX", Words(kBaseEcx | kOsxsave, 0b111, 0), KernelForm::M128, KernelForm::M128,
         IntegerKernelForm::M128Sse41},
        // FMA's forms are VEX-encoded: without OS AVX support they must not run.
        {"FMA without AVX", Words(kBaseEcx | kFma | kOsxsave, 0b111, 0), KernelForm::M128, KernelForm::M128,
         IntegerKernelForm::M128Sse41},
        {"AVX2 without OS AVX support", Words(kBaseEcx | kFma | kAvx, 0), KernelForm::M128, KernelForm::M128,
         IntegerKernelForm::M128Sse41},
        {"AVX without FMA", Words(kBaseEcx | kOsxsave | kAvx, 0b111, 0), KernelForm::M256, KernelForm::M256,
         IntegerKernelForm::M128Sse41},
        {"leaf 7 beyond the highest leaf", Words(all, 0b111, kAvx2, 6), KernelForm::M256Fma, KernelForm::M256,
         IntegerKernelForm::M128Sse41},
        {"SSE2 only", Words(0, 0, 0), KernelForm::M128, KernelForm::M128, IntegerKernelForm::Ref},
    };
    for (const Case& c : cases) {
        const FeatureSet features = DetectedFeatures(DecodeCpuid(c.words));
        EXPECT_EQ(ChooseKernelForm(features), c.withFma) << c.what;
        EXPECT_EQ(ChooseKernelFormWithoutFma(features), c.plain) << c.what;
        EXPECT_EQ(ChooseIntegerKernelForm(features), c.integer) << c.what;
    }
    // No processor information at all: the reference forms.
    EXPECT_EQ(ChooseKernelForm(DetectedFeatures(ora_cpuinfo_x86{})), KernelForm::Ref);
}

TEST(DispatchSettings, NoVexFormWithoutOsxsaveAvxAndAnXcr0StateBit) {
    // Every combination of the feature bits that matter and of XCR0's low bits.
    for (unsigned mask = 0; mask < 16; ++mask) {
        const unsigned ecx = kBaseEcx | ((mask & 1) ? kOsxsave : 0) | ((mask & 2) ? kAvx : 0) | ((mask & 4) ? kFma : 0);
        const unsigned leaf7 = (mask & 8) ? kAvx2 : 0;
        for (unsigned long long xcr0 = 0; xcr0 < 8; ++xcr0) {
            const FeatureSet f = DetectedFeatures(DecodeCpuid(Words(ecx, xcr0, leaf7)));
            const bool osAvx = (ecx & kOsxsave) && (ecx & kAvx) && (xcr0 & 0b110) != 0;
            const bool vex = VexEncoded(ChooseKernelForm(f)) || ChooseIntegerKernelForm(f) == IntegerKernelForm::M256Avx2;
            EXPECT_TRUE(!vex || osAvx) << "ecx " << std::hex << ecx << " xcr0 " << xcr0;
        }
    }
}
