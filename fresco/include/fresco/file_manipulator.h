// The client's file access. The library opens no file of its own.
#pragma once
#include <fresco/stream_reader.h>

namespace fresco {

class IFileManipulator {
  public:
    virtual ~IFileManipulator() = default;
    // Null when the file cannot be read. The reader is given back with `Close`: after reading, or, of a font
    // that it has in place, when the rendering library ends.
    virtual IStreamReader* OpenFile(const char* /*path*/) { return nullptr; }
};

}  // namespace fresco
