#include "core/platform/module_loader.h"

#include "core/logging/log.h"
#include "core/memory/containers.h"
#include "core/platform/packaged_library.h"

namespace qorvex {
namespace {

constexpr std::string_view kModuleEnding = ".UWP.dll";

bool IsPlainName(std::string_view name) {
    // Module names are the engine's own and plain ASCII; a path would lead out of the package.
    for (const char c : name) {
        const bool letter = (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
        const bool other = (c >= '0' && c <= '9') || c == '_' || c == '-' || c == '.';
        if (!letter && !other) return false;
    }
    return !name.empty() && name[0] != '.';
}

}  // namespace

Module& Module::operator=(Module&& other) noexcept {
    Module gone(std::exchange(handle_, std::exchange(other.handle_, nullptr)));
    return *this;
}

Module::~Module() {
    if (handle_) platform::FreeLibrary(handle_);
}

void* Module::Find(const char* name) const {
    return handle_ ? platform::GetProcAddress(handle_, name) : nullptr;
}

Module LoadModule(std::string_view name) {
    if (!IsPlainName(name)) {
        LogWarning("Module name is not plain: ", name);
        return Module();
    }
    SmallVector<char16_t, 64> path;
    for (std::string_view part : {name, kModuleEnding})
        for (const char c : part)
            path.push_back(static_cast<char16_t>(c));
    path.push_back(u'\0');
    return Module(platform::LoadPackagedLibrary(path.data(), 0));
}

}  // namespace qorvex
