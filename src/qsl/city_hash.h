// CityHash64: a fast hash of short byte strings with good spread (Geoff Pike, Jyrki Alakuijala, 2011).
#pragma once

#include <cstdint>
#include <string_view>

namespace qsl {

uint64_t CityHash64(std::string_view text);

}  // namespace qsl
