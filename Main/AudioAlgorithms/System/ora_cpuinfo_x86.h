// What the processor can do, read once with cpuid and xgetbv.
#pragma once

#include <string>

namespace ora::system {

struct ora_cpuinfo_x86 {
    bool valid = false;  // detection has run
    int logicalProcessors = 1;
    int physicalCores = 1;
    bool logicalExceedsPhysical = false;  // simultaneous multithreading
    unsigned highestStandardLeaf = 0;
    unsigned initialApicId = 0;  // leaf 1, EBX bits 24..31
    std::string vendor;          // "GenuineIntel", "AuthenticAMD", ...

    bool mmx = false, sse = false, sse2 = false;                  // leaf 1 EDX 23, 25, 26
    bool sse3 = false, sse41 = false, sse42 = false, fma = false;  // leaf 1 ECX 0, 19, 20, 12
    bool avx2 = false, bmi1 = false, bmi2 = false, adx = false, mpx = false, sha = false;  // leaf 7 EBX
    bool avx512f = false, avx512cd = false, avx512pf = false, avx512er = false, avx512vl = false,
         avx512bw = false, avx512dq = false, avx512ifma = false;  // leaf 7 EBX
    bool prefetchwt1 = false, avx512vbmi = false;                   // leaf 7 ECX 0, 1
    // Leaf 1 ECX has OSXSAVE (27) and AVX (28), and XCR0 has bit 1 or bit 2.
    bool osAvx = false;
};

// The words detection reads. Kept apart from the reading, so that what
// follows from them can be tested for any processor.
struct CpuidWords {
    unsigned highestStandardLeaf = 0;  // leaf 0 EAX
    unsigned leaf1Ebx = 0, leaf1Ecx = 0, leaf1Edx = 0;
    unsigned leaf7Ebx = 0, leaf7Ecx = 0;  // subleaf 0; ignored when the highest leaf is below 7
    unsigned long long xcr0 = 0;          // xgetbv(0); ignored without OSXSAVE
};

// The feature fields and the APIC identifier the words give, valid set;
// counts and vendor stay at their defaults.
ora_cpuinfo_x86 DecodeCpuid(const CpuidWords& words);

// Runs cpuid/xgetbv now.
ora_cpuinfo_x86 DetectCpu();

// XCR0 as read by the xgetbv instruction (0 without OSXSAVE).
unsigned long long xgetbv0();

}  // namespace ora::system
