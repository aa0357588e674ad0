#include <dlfcn.h>

#include <string_view>

#include "core/memory/containers.h"
#include "core/platform/packaged_library.h"

namespace qorvex::platform {
namespace {

constexpr std::string_view kPackageEnding = ".UWP.dll";

/// "Name.UWP.dll" is "libName.so" here.
String LibraryName(const char16_t* file_name) {
    String name;
    for (; *file_name; ++file_name) {
        if (*file_name > 0x7F) return String();
        name.push_back(static_cast<char>(*file_name));
    }
    if (name.ends_with(kPackageEnding)) name.resize(name.size() - kPackageEnding.size());
    return String("lib") + name + ".so";
}

/// The folder that the engine itself was loaded from, with its slash: the package.
String PackageFolder() {
    Dl_info info{};
    if (!dladdr(reinterpret_cast<void*>(&LoadPackagedLibrary), &info) || !info.dli_fname) return String();
    const std::string_view file = info.dli_fname;
    return String(file.substr(0, file.rfind('/') + 1));
}

}  // namespace

void* LoadPackagedLibrary(const char16_t* file_name, uint32_t) {
    const String name = LibraryName(file_name);
    if (name.empty()) return nullptr;
    const String packaged = PackageFolder() + name;
    if (void* library = dlopen(packaged.c_str(), RTLD_NOW | RTLD_LOCAL)) return library;
    return dlopen(name.c_str(), RTLD_NOW | RTLD_LOCAL);
}

void* GetProcAddress(void* library, const char* name) {
    return dlsym(library, name);
}

void FreeLibrary(void* library) {
    dlclose(library);
}

}  // namespace qorvex::platform
