// What the platform offers for loading modules, in the form of the platform that the engine ships on. Another
// platform maps the package's file name to its own.
#pragma once

#include <cstdint>

namespace qorvex::platform {

/// Loads a library of the application's package; `reserved` is 0. Null when it is not there.
void* LoadPackagedLibrary(const char16_t* file_name, uint32_t reserved);
void* GetProcAddress(void* library, const char* name);
void FreeLibrary(void* library);

}  // namespace qorvex::platform
