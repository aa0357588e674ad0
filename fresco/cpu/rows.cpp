#include "fresco/cpu/rows_ways.h"

namespace fresco::cpu {
namespace {

bool HasAvx2() {
#if defined(__x86_64__) || defined(__i386__)
    return __builtin_cpu_supports("avx2");
#else
    return false;
#endif
}

// The first processors that had it ran all else more slowly for a while after wide instructions; those that
// know VBMI2 do not.
bool HasAvx512() {
#if defined(__x86_64__)
    return HasAvx2() && __builtin_cpu_supports("avx512bw") && __builtin_cpu_supports("avx512vbmi2");
#else
    return false;
#endif
}

const RowLoops* Avx512Rows() {
    static const RowLoops rows = [] {
        RowLoops loops = *kAvx2Rows;
        TakeAvx512Rows(&loops);
        return loops;
    }();
    return &rows;
}

const RowLoops& Choose() {
    if (kAvx2Rows && HasAvx512()) return *Avx512Rows();
    if (kAvx2Rows && HasAvx2()) return *kAvx2Rows;
    return kSse2Rows ? *kSse2Rows : kPlainRows;
}

}  // namespace

const RowLoops* GetRowLoops(RowWay way) {
    switch (way) {
        case RowWay::Plain:
            return &kPlainRows;
        case RowWay::Sse2:
            return kSse2Rows;
        case RowWay::Avx2:
            return HasAvx2() ? kAvx2Rows : nullptr;
        default:
            return kAvx2Rows && HasAvx512() ? Avx512Rows() : nullptr;
    }
}

const RowLoops& Rows() {
    static const RowLoops& rows = Choose();
    return rows;
}

}  // namespace fresco::cpu
