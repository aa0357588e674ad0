// File access and piecemeal data, as the rendering library expects them.
#pragma once

#include <fresco/file_manipulator.h>

namespace qorvex {

// The client's file access object. The engine reads no file of its own: it only hands this object to the
// rendering library while Library::Initialize runs. The client owns it and keeps it alive until
// Library::Uninitialize has returned.
class IFileSystemReader : public fresco::IFileManipulator {};

// Data that is read piece by piece: font files and media. Made by the client, given to
// IAsyncResourceStreamResponse::SetStreamReader and closed by the engine through its Close operation,
// possibly on another thread than the one that made it. One thread reads at a time.
class ISyncStreamReader : public fresco::IStreamReader {};

}  // namespace qorvex
