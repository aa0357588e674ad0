#include "file_stream_reader.h"

#if defined(__unix__)
#include <sys/mman.h>
#endif

namespace qorvex::host {

FileStreamReader* FileStreamReader::Open(const std::filesystem::path& path) {
    std::error_code fault;
    const std::uintmax_t size = std::filesystem::file_size(path, fault);
    std::FILE* file = fault ? nullptr : std::fopen(path.c_str(), "rb");
    return file ? new FileStreamReader(file, static_cast<std::size_t>(size)) : nullptr;
}

#if defined(__unix__)

FileStreamReader::~FileStreamReader() {
    if (mapped_) munmap(mapped_, size_);
    std::fclose(file_);
}

const void* FileStreamReader::GetData() {
    if (mapped_ || size_ == 0) return mapped_;
    void* mapped = mmap(nullptr, size_, PROT_READ, MAP_PRIVATE, fileno(file_), 0);
    if (mapped != MAP_FAILED) mapped_ = mapped;
    return mapped_;
}

#else

FileStreamReader::~FileStreamReader() {
    std::fclose(file_);
}

const void* FileStreamReader::GetData() {
    return nullptr;
}

#endif

std::size_t FileStreamReader::Read(std::size_t offset, void* destination, std::size_t size) {
    if (offset > size_ || std::fseek(file_, static_cast<long>(offset), SEEK_SET) != 0) return 0;
    return std::fread(destination, 1, size, file_);
}

}  // namespace qorvex::host
