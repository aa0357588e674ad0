// Process-wide interner of font family names: equal names are equal pointers on every thread, from the start
// of the library to its end. It holds 1024 bytes of names, terminators included, and no more: pages bring new
// ones.
#pragma once

#include <string_view>

namespace qorvex {

/// Makes the interner and enters the family of last resort.
void StartFamilyNames(std::string_view default_family);
void StopFamilyNames();

/// The one pointer for the name, ended with a zero; null when the store is full.
const char* InternFamilyName(std::string_view name);
/// Interned; null outside the interner's life.
const char* GetDefaultFamilyName();

}  // namespace qorvex
