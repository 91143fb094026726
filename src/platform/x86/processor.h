/// \file
/// What this processor and this system let a program use.
///
/// The C library has asked the processor when the program began, and its
/// answers are read here. Asking once more is dear: in a virtual machine each
/// of the ten questions leaves the machine, which took a third of the time of
/// loading the library.

#ifndef ZT_PLATFORM_X86_PROCESSOR_H
#define ZT_PLATFORM_X86_PROCESSOR_H

// The header is no C++ to clang.
#if __has_include(<sys/platform/x86.h>) && !defined(__clang__)
#include <sys/platform/x86.h>
#else
/// The compiler's own questions, where the C library answers none.
#define CPU_FEATURE_ACTIVE(name)                                               \
    (__builtin_cpu_init(), __builtin_cpu_supports(ZT_FEATURE_##name) != 0)
#define ZT_FEATURE_AVX "avx"
#define ZT_FEATURE_AVX2 "avx2"
#define ZT_FEATURE_AVX512F "avx512f"
#define ZT_FEATURE_AVX512BW "avx512bw"
#define ZT_FEATURE_AVX512VL "avx512vl"
#define ZT_FEATURE_AVX512_VNNI "avx512vnni"
#endif

namespace zt_platform {

inline bool processor_has_avx()
{
    return CPU_FEATURE_ACTIVE(AVX);
}

inline bool processor_has_avx2()
{
    return CPU_FEATURE_ACTIVE(AVX2);
}

/// 512 bits wide, with bytes, words and the shorter widths.
inline bool processor_has_avx512()
{
    return CPU_FEATURE_ACTIVE(AVX512F) && CPU_FEATURE_ACTIVE(AVX512BW) &&
           CPU_FEATURE_ACTIVE(AVX512VL);
}

inline bool processor_has_avx512_vnni()
{
    return processor_has_avx512() && CPU_FEATURE_ACTIVE(AVX512_VNNI);
}

} // namespace zt_platform

#endif
