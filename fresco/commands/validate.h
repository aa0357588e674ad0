// Checks a stream that came from outside: sizes, counts, kinds and numbers of every record, so that a back
// end can run it as it runs its own recordings.
#pragma once
#include <cstddef>

namespace fresco {

// `pixelCount`: entries in the table that pixel references index. On failure `*error` is a fixed text.
bool ValidateStream(const void* stream, size_t size, size_t pixelCount, const char** error);

}  // namespace fresco
