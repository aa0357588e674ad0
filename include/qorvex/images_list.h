// The URLs of the images that a view's page uses (View::GetImagesList).
#pragma once

namespace qorvex {

// Owned by the caller, released with Destroy on the main thread. Implemented by the engine.
class ImagesList {
  public:
    // The next URL, or null at the end. Lives as long as the list.
    virtual const char* GetNext() = 0;
    // Starts over.
    virtual void Reset() = 0;
    virtual void Destroy() = 0;

  protected:
    virtual ~ImagesList() = default;
};

}  // namespace qorvex
