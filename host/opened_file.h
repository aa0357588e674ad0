#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

namespace qorvex::host {

// A regular file, open for reading, with the path that it really has: what is checked is what is read, even
// if somebody exchanges a link meanwhile.
class OpenedFile {
  public:
    // An absolute path, links allowed. Without a file `GetFault` says why.
    explicit OpenedFile(const std::string& name);
    ~OpenedFile();
    OpenedFile(const OpenedFile&) = delete;
    OpenedFile& operator=(const OpenedFile&) = delete;

    explicit operator bool() const { return !fault_; }
    [[nodiscard]] const char* GetFault() const { return fault_; }
    [[nodiscard]] std::uintmax_t GetSize() const { return size_; }
    // Without links, "." and "..".
    [[nodiscard]] const std::string& GetPath() const { return path_; }
    // True when all `size` bytes from the start were there.
    [[nodiscard]] bool ReadAll(void* destination, std::size_t size);

  private:
    int descriptor_ = -1;
    std::uintmax_t size_ = 0;
    std::string path_;
    const char* fault_ = nullptr;
};

}  // namespace qorvex::host
