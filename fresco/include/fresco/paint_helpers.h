// Threads that the client lends for painting; the library starts none. What a frame looks like does not
// depend on how many help, nor on whether any does.
#pragma once
#include <cstdint>

namespace fresco {

// A part in the painting of one frame.
class IPaintWork {
  public:
    // Paints until nothing is left; returns at once when the frame is finished already. Any thread, but at
    // most once for each Post.
    virtual void Run() = 0;
    // Gives back what Post handed over, after Run or in place of it. Any thread, at any time before the
    // rendering library ends.
    virtual void Release() = 0;

  protected:
    ~IPaintWork() = default;
};

class IPaintHelpers {
  public:
    virtual ~IPaintHelpers() = default;
    // How many threads may help with the frame that begins; 0 is always right. Render thread.
    virtual uint32_t GetCount() = 0;
    // To be run soon on another thread. The render thread paints as well and never waits for work that nobody
    // has begun. Render thread.
    virtual void Post(IPaintWork* work) = 0;
};

}  // namespace fresco
