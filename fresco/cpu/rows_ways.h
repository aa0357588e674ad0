// The tables behind rows.h. A way that the target cannot have is null.
#pragma once
#include "fresco/cpu/rows.h"

namespace fresco::cpu {

extern const RowLoops kPlainRows;
extern const RowLoops* const kSse2Rows;
extern const RowLoops* const kAvx2Rows;
// Puts the loops that are written for AVX-512 in place of others.
void TakeAvx512Rows(RowLoops* rows);

// For the body of a way: the table of the functions that it has defined.
#define FRESCO_ROW_ENTRY(name, parameters) name,
#define FRESCO_ROW_TABLE \
    { FRESCO_ROW_LOOPS(FRESCO_ROW_ENTRY) }

}  // namespace fresco::cpu
