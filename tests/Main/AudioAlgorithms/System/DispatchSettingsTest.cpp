// Processor detection, forced mode and the choice ladder of kernel forms.
#include <gtest/gtest.h>

#include <cpuid.h>
#include <thread>

#include "System/DispatchSettings.h"

using namespace ora::system;

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
