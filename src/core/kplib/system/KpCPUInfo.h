#pragma once

#include <kplib/foundation/KpExport.h>

#include <cstdint>

/// The machine's processors: counts and features, read once on first use. Thread-safe.
class KPLIB_API KpCPUInfo {
public:
    /// Bits of detectCPUFeatures(), each named after an extension of the x86 instruction set.
    enum Feature : unsigned {
        MMX = 1,                  ///< 64-bit integer vectors
        MMXExtensions = 2,        ///< the AMD extensions of MMX
        ThreeDNow = 4,            ///< 3DNow!
        ThreeDNowExtensions = 8,  ///< extended 3DNow!
        SSE = 16,                 ///< 128-bit float vectors
        SSE2 = 32,                ///< 128-bit double and integer vectors
        ConditionalMove = 64,     ///< CMOV
        SSE3 = 512,               ///< SSE3
        SSSE3 = 1024,             ///< supplemental SSE3
        SSE4_1 = 2048,            ///< SSE4.1
        SSE4_2 = 4096,            ///< SSE4.2
        AVX = 8192,               ///< 256-bit vectors
    };

    /// The machine's processors, read by the first call.
    static const KpCPUInfo& instance();

    /// Whether the counts were read from the system; otherwise each is 1.
    bool cpuInfoSucceed() const { return succeeded_; }
    /// Packages, cores of a package, logical processors of a core.
    int getCPUCount() const { return cpuCount_; }
    /// As above.
    int getCoreCount() const { return coreCount_; }
    /// As above.
    int getLPUCount() const { return lpuCount_; }

    /// Whether the processor has the CPUID instruction.
    bool hasCPUID() const;
    /// The highest function of CPUID, and of its extended ones.
    unsigned getMaxCPUIDFunc() const;
    /// As above.
    unsigned getMaxCPUIDExtFunc() const;
    /// The features as a mask of Feature.
    unsigned detectCPUFeatures() const;
    /// "GenuineIntel" and the like, 12 characters; empty without CPUID.
    const char* vendor() const { return vendor_; }

private:
    KpCPUInfo();
    bool initCPUInfo();
    void readCPUID();

    bool succeeded_ = false;
    char vendor_[13] = {};
    std::uint32_t features_[4] = {};  // EDX and ECX of function 1, EDX and ECX of function 0x80000001
    int cpuCount_ = 1, coreCount_ = 1, lpuCount_ = 1;
};
