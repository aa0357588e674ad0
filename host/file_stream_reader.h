#pragma once

#include <qorvex/file_system.h>

#include <cstdio>
#include <filesystem>

namespace qorvex::host {

// A file read piece by piece. Close ends it.
class FileStreamReader final : public ISyncStreamReader {
  public:
    // Null when the file cannot be opened.
    [[nodiscard]] static FileStreamReader* Open(const std::filesystem::path& path);

    std::size_t GetSize() override { return size_; }
    std::size_t Read(std::size_t offset, void* destination, std::size_t size) override;
    void Close() override { delete this; }
    // The file mapped into memory, where the system can. Nobody may cut it short meanwhile: fonts and other
    // files of an installed program are replaced, not written over.
    const void* GetData() override;

  private:
    FileStreamReader(std::FILE* file, std::size_t size) : file_(file), size_(size) {}
    ~FileStreamReader() override;

    std::FILE* file_;
    std::size_t size_;
    void* mapped_ = nullptr;
};

}  // namespace qorvex::host
