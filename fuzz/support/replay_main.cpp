// Runs a target's entry once for every file below the given paths: how the corpora run as tests, in builds
// that know nothing of libFuzzer.
#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size);

namespace {

namespace fs = std::filesystem;

std::vector<fs::path> FilesBelow(const fs::path& path) {
    if (fs::is_regular_file(path)) return {path};
    std::vector<fs::path> files;
    for (const fs::directory_entry& entry : fs::recursive_directory_iterator(path))
        if (entry.is_regular_file()) files.push_back(entry.path());
    std::sort(files.begin(), files.end());
    return files;
}

void Run(const fs::path& path) {
    std::ifstream file(path, std::ios::binary);
    const std::vector<char> bytes{std::istreambuf_iterator<char>(file), {}};
    // A block of the exact size: a read behind the end is one behind the block.
    const std::unique_ptr<uint8_t[]> input(new uint8_t[bytes.size()]);
    std::copy(bytes.begin(), bytes.end(), input.get());
    LLVMFuzzerTestOneInput(input.get(), bytes.size());
}

}  // namespace

int main(int count, char** arguments) {
    size_t files = 0;
    for (int i = 1; i < count; ++i) {
        for (const fs::path& path : FilesBelow(arguments[i])) {
            // Said first: when the run ends in it, the log names the input.
            std::printf("%s\n", path.c_str());
            std::fflush(stdout);
            Run(path);
            ++files;
        }
    }
    std::printf("%zu inputs\n", files);
    return files == 0;
}
