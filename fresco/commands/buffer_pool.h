// Released command buffers wait here with their memory, so that recording in the steady state allocates
// nothing.
#pragma once

namespace fresco {

// Frees the waiting buffers; done before the allocator changes.
void DrainBufferPool();

}  // namespace fresco
