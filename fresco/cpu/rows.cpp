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

const RowLoops& Choose() {
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
        default:
            return HasAvx2() ? kAvx2Rows : nullptr;
    }
}

const RowLoops& Rows() {
    static const RowLoops& rows = Choose();
    return rows;
}

}  // namespace fresco::cpu
