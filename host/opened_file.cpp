#include "opened_file.h"

#include <cerrno>
#include <climits>
#include <cstdio>
#include <cstdlib>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace qorvex::host {
namespace {

// The kernel knows the path of what is open; without /proc it is searched for once more, link by link.
std::string PathOf(int descriptor, const std::string& name) {
    char link[32];
    std::snprintf(link, sizeof link, "/proc/self/fd/%d", descriptor);
    char path[PATH_MAX];
    const ssize_t length = readlink(link, path, sizeof path);
    if (length > 0 && static_cast<std::size_t>(length) < sizeof path)
        return std::string(path, static_cast<std::size_t>(length));
    return realpath(name.c_str(), path) ? path : std::string();
}

}  // namespace

OpenedFile::OpenedFile(const std::string& name) {
    // Without waiting: a pipe without a writer would hold the caller for ever.
    descriptor_ = open(name.c_str(), O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC);
    if (descriptor_ < 0) {
        fault_ = errno == EACCES ? "not readable" : "no such file";
        return;
    }
    struct stat status {};
    path_ = PathOf(descriptor_, name);
    if (fstat(descriptor_, &status) != 0 || path_.empty())
        fault_ = "no such file";
    else if (!S_ISREG(status.st_mode))
        fault_ = "not a file";
    else
        size_ = static_cast<std::uintmax_t>(status.st_size);
}

OpenedFile::~OpenedFile() {
    if (descriptor_ >= 0) close(descriptor_);
}

bool OpenedFile::ReadAll(void* destination, std::size_t size) {
    auto* out = static_cast<char*>(destination);
    while (size > 0) {
        const ssize_t count = read(descriptor_, out, size);
        if (count < 0 && errno == EINTR) continue;
        if (count <= 0) return false;
        out += count;
        size -= static_cast<std::size_t>(count);
    }
    return true;
}

}  // namespace qorvex::host
