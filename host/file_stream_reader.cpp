#include "file_stream_reader.h"

namespace qorvex::host {

FileStreamReader* FileStreamReader::Open(const std::filesystem::path& path) {
    std::error_code fault;
    const std::uintmax_t size = std::filesystem::file_size(path, fault);
    std::FILE* file = fault ? nullptr : std::fopen(path.c_str(), "rb");
    return file ? new FileStreamReader(file, static_cast<std::size_t>(size)) : nullptr;
}

std::size_t FileStreamReader::Read(std::size_t offset, void* destination, std::size_t size) {
    if (offset > size_ || std::fseek(file_, static_cast<long>(offset), SEEK_SET) != 0) return 0;
    return std::fread(destination, 1, size, file_);
}

}  // namespace qorvex::host
