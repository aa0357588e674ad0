#pragma once

#include <qorvex/file_system.h>

#include "file_stream_reader.h"

namespace qorvex::host {

// Lets the rendering library open the files that its options name, such as the system's fonts.
class FileSystem final : public IFileSystemReader {
  public:
    fresco::IStreamReader* OpenFile(const char* path) override { return FileStreamReader::Open(path); }
};

}  // namespace qorvex::host
