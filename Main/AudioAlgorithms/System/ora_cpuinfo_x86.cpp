#include "System/ora_cpuinfo_x86.h"

#include <cpuid.h>
#include <immintrin.h>
#include <unistd.h>

#include <cassert>
#include <cstring>
#include <fstream>
#include <set>
#include <utility>

#include "System/Trace.h"

namespace ora::system {

namespace {

constexpr unsigned kLeafFeatures = 1;
constexpr unsigned kLeafExtendedFeatures = 7;
constexpr int kOsxsaveBit = 27;  // leaf 1 ECX
constexpr int kAvxBit = 28;      // leaf 1 ECX
// XCR0: the OS saves SSE (bit 1) and AVX (bit 2) state.
constexpr unsigned long long kXcr0SseAndAvxState = 0x6u;

bool Bit(unsigned value, int bit) { return ((value >> bit) & 1u) != 0; }

// The compiler's intrinsic, for the cross-check of our own reading.
__attribute__((target("xsave"))) unsigned long long IntrinsicXgetbv0() { return _xgetbv(0); }

// Distinct (package, core) pairs; the logical count when unknown.
int CountPhysicalCores(int logical) {
    std::ifstream cpuinfo("/proc/cpuinfo");
    std::set<std::pair<int, int>> cores;
    std::string line;
    int package = 0;
    while (std::getline(cpuinfo, line)) {
        const auto colon = line.find(':');
        if (colon == std::string::npos) continue;
        const std::string key = line.substr(0, line.find_last_not_of(" \t", colon - 1) + 1);
        if (key == "physical id") package = std::atoi(line.c_str() + colon + 1);
        if (key == "core id") cores.emplace(package, std::atoi(line.c_str() + colon + 1));
    }
    return cores.empty() ? logical : static_cast<int>(cores.size());
}

}  // namespace

unsigned long long xgetbv0() {
    unsigned eax = 0, ebx = 0, ecx = 0, edx = 0;
    if (!__get_cpuid(kLeafFeatures, &eax, &ebx, &ecx, &edx) || !Bit(ecx, kOsxsaveBit)) return 0;
    unsigned low = 0, high = 0;
    __asm__ volatile("xgetbv" : "=a"(low), "=d"(high) : "c"(0));
    return (static_cast<unsigned long long>(high) << 32) | low;
}

ora_cpuinfo_x86 DecodeCpuid(const CpuidWords& words) {
    ora_cpuinfo_x86 info;
    info.highestStandardLeaf = words.highestStandardLeaf;
    if (words.highestStandardLeaf >= kLeafFeatures) {
        const unsigned ebx = words.leaf1Ebx, ecx = words.leaf1Ecx, edx = words.leaf1Edx;
        info.initialApicId = (ebx >> 24) & 0xFFu;
        info.mmx = Bit(edx, 23);
        info.sse = Bit(edx, 25);
        info.sse2 = Bit(edx, 26);
        info.sse3 = Bit(ecx, 0);
        info.fma = Bit(ecx, 12);
        info.sse41 = Bit(ecx, 19);
        info.sse42 = Bit(ecx, 20);
        // Either state bit is accepted, not only both together.
        info.osAvx = Bit(ecx, kOsxsaveBit) && Bit(ecx, kAvxBit) && (words.xcr0 & kXcr0SseAndAvxState) != 0;
    }
    if (words.highestStandardLeaf >= kLeafExtendedFeatures) {
        const unsigned ebx = words.leaf7Ebx, ecx = words.leaf7Ecx;
        info.bmi1 = Bit(ebx, 3);
        info.avx2 = Bit(ebx, 5);
        info.bmi2 = Bit(ebx, 8);
        info.mpx = Bit(ebx, 14);
        info.avx512f = Bit(ebx, 16);
        info.avx512dq = Bit(ebx, 17);
        info.adx = Bit(ebx, 19);
        info.avx512ifma = Bit(ebx, 21);
        info.avx512pf = Bit(ebx, 26);
        info.avx512er = Bit(ebx, 27);
        info.avx512cd = Bit(ebx, 28);
        info.sha = Bit(ebx, 29);
        info.avx512bw = Bit(ebx, 30);
        info.avx512vl = Bit(ebx, 31);
        info.prefetchwt1 = Bit(ecx, 0);
        info.avx512vbmi = Bit(ecx, 1);
    }
    info.valid = true;
    return info;
}

ora_cpuinfo_x86 DetectCpu() {
    CpuidWords words;
    std::string vendor;
    unsigned eax = 0, ebx = 0, ecx = 0, edx = 0;
    if (__get_cpuid(0, &eax, &ebx, &ecx, &edx)) {
        words.highestStandardLeaf = eax;
        char name[13] = {};
        std::memcpy(name, &ebx, 4);
        std::memcpy(name + 4, &edx, 4);
        std::memcpy(name + 8, &ecx, 4);
        vendor = name;
        if (name[0] == 'G') Trace("Intel CPU: %s", name);
        if (name[0] == 'A') Trace("AMD CPU: %s", name);
    }
    if (words.highestStandardLeaf >= kLeafFeatures && __get_cpuid(kLeafFeatures, &eax, &ebx, &ecx, &edx)) {
        words.leaf1Ebx = ebx;
        words.leaf1Ecx = ecx;
        words.leaf1Edx = edx;
        if (Bit(ecx, kOsxsaveBit)) {
            words.xcr0 = xgetbv0();
            [[maybe_unused]] const unsigned long long intrinsic = IntrinsicXgetbv0();
            assert(words.xcr0 == intrinsic);
        }
    }
    if (words.highestStandardLeaf >= kLeafExtendedFeatures &&
        __get_cpuid_count(kLeafExtendedFeatures, 0, &eax, &ebx, &ecx, &edx)) {
        words.leaf7Ebx = ebx;
        words.leaf7Ecx = ecx;
    }
    ora_cpuinfo_x86 info = DecodeCpuid(words);
    info.vendor = vendor;
    const long online = sysconf(_SC_NPROCESSORS_ONLN);
    info.logicalProcessors = online > 0 ? static_cast<int>(online) : 1;
    info.physicalCores = CountPhysicalCores(info.logicalProcessors);
    info.logicalExceedsPhysical = info.logicalProcessors > info.physicalCores;
    return info;
}

}  // namespace ora::system
