// A pause inside a loop that waits for another thread without sleeping.
#pragma once

namespace qsl {

/// Tells the processor that this thread only looks, so that its sibling gets the core.
inline void Relax() {
#if defined(__x86_64__) || defined(__i386__)
    __builtin_ia32_pause();
#elif defined(__aarch64__)
    __asm__ volatile("yield");
#endif
}

}  // namespace qsl
