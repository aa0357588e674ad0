// Large blocks that are about to be filled.
#pragma once
#include <cstddef>

namespace fresco {

// Makes the system give the block's pages at once. A page that is first written otherwise costs an interrupt
// of its own, which for a font file of 760 KB is more than reading it takes. Only a hint: contents stay as
// they are.
void Prefault(void* block, size_t size);

}  // namespace fresco
