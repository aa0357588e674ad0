#include "qsl/city_hash.h"

#include <bit>
#include <cstring>
#include <utility>

namespace qsl {
namespace {

constexpr uint64_t k0 = 0xc3a5c85c97cb3127ULL;
constexpr uint64_t k1 = 0xb492b66fbe98f273ULL;
constexpr uint64_t k2 = 0x9ae16a3b2f90404fULL;

using Pair = std::pair<uint64_t, uint64_t>;

uint64_t Fetch64(const char* p) {
    uint64_t value;
    std::memcpy(&value, p, sizeof(value));
    return value;
}

uint32_t Fetch32(const char* p) {
    uint32_t value;
    std::memcpy(&value, p, sizeof(value));
    return value;
}

uint64_t ShiftMix(uint64_t value) {
    return value ^ (value >> 47);
}

uint64_t HashLen16(uint64_t u, uint64_t v, uint64_t mul) {
    const uint64_t a = ShiftMix((u ^ v) * mul);
    return ShiftMix((v ^ a) * mul) * mul;
}

uint64_t HashLen16(uint64_t u, uint64_t v) {
    return HashLen16(u, v, 0x9ddfea08eb382d69ULL);
}

uint64_t HashLen0To16(const char* s, size_t length) {
    const uint64_t mul = k2 + length * 2;
    if (length >= 8) {
        const uint64_t a = Fetch64(s) + k2;
        const uint64_t b = Fetch64(s + length - 8);
        const uint64_t c = std::rotr(b, 37) * mul + a;
        const uint64_t d = (std::rotr(a, 25) + b) * mul;
        return HashLen16(c, d, mul);
    }
    if (length >= 4) {
        const uint64_t a = Fetch32(s);
        return HashLen16(length + (a << 3), Fetch32(s + length - 4), mul);
    }
    if (length > 0) {
        const auto a = static_cast<uint8_t>(s[0]);
        const auto b = static_cast<uint8_t>(s[length >> 1]);
        const auto c = static_cast<uint8_t>(s[length - 1]);
        const uint32_t y = uint32_t{a} + (uint32_t{b} << 8);
        const uint32_t z = static_cast<uint32_t>(length) + (uint32_t{c} << 2);
        return ShiftMix(y * k2 ^ z * k0) * k2;
    }
    return k2;
}

uint64_t HashLen17To32(const char* s, size_t length) {
    const uint64_t mul = k2 + length * 2;
    const uint64_t a = Fetch64(s) * k1;
    const uint64_t b = Fetch64(s + 8);
    const uint64_t c = Fetch64(s + length - 8) * mul;
    const uint64_t d = Fetch64(s + length - 16) * k2;
    return HashLen16(std::rotr(a + b, 43) + std::rotr(c, 30) + d, a + std::rotr(b + k2, 18) + c, mul);
}

uint64_t HashLen33To64(const char* s, size_t length) {
    const uint64_t mul = k2 + length * 2;
    const uint64_t a = Fetch64(s) * k2;
    const uint64_t b = Fetch64(s + 8);
    const uint64_t c = Fetch64(s + length - 24);
    const uint64_t d = Fetch64(s + length - 32);
    const uint64_t e = Fetch64(s + 16) * k2;
    const uint64_t f = Fetch64(s + 24) * 9;
    const uint64_t g = Fetch64(s + length - 8);
    const uint64_t h = Fetch64(s + length - 16) * mul;
    const uint64_t u = std::rotr(a + g, 43) + (std::rotr(b, 30) + c) * 9;
    const uint64_t v = ((a + g) ^ d) + f + 1;
    const uint64_t w = __builtin_bswap64((u + v) * mul) + h;
    const uint64_t x = std::rotr(e + f, 42) + c;
    const uint64_t y = (__builtin_bswap64((v + w) * mul) + g) * mul;
    const uint64_t z = e + f + c;
    const uint64_t first = __builtin_bswap64((x + z) * mul + y) + b;
    return ShiftMix((z + first) * mul + d + h) * mul + x;
}

Pair WeakHashLen32WithSeeds(const char* s, uint64_t a, uint64_t b) {
    const uint64_t w = Fetch64(s);
    const uint64_t x = Fetch64(s + 8);
    const uint64_t y = Fetch64(s + 16);
    const uint64_t z = Fetch64(s + 24);
    a += w;
    b = std::rotr(b + a + z, 21);
    const uint64_t c = a;
    a += x;
    a += y;
    b += std::rotr(a, 44);
    return {a + z, b + c};
}

uint64_t HashLong(const char* s, size_t length) {
    uint64_t x = Fetch64(s + length - 40);
    uint64_t y = Fetch64(s + length - 16) + Fetch64(s + length - 56);
    uint64_t z = HashLen16(Fetch64(s + length - 48) + length, Fetch64(s + length - 24));
    Pair v = WeakHashLen32WithSeeds(s + length - 64, length, z);
    Pair w = WeakHashLen32WithSeeds(s + length - 32, y + k1, x);
    x = x * k1 + Fetch64(s);
    for (size_t left = (length - 1) & ~size_t{63}; left != 0; left -= 64, s += 64) {
        x = std::rotr(x + y + v.first + Fetch64(s + 8), 37) * k1;
        y = std::rotr(y + v.second + Fetch64(s + 48), 42) * k1;
        x ^= w.second;
        y += v.first + Fetch64(s + 40);
        z = std::rotr(z + w.first, 33) * k1;
        v = WeakHashLen32WithSeeds(s, v.second * k1, x + w.first);
        w = WeakHashLen32WithSeeds(s + 32, z + w.second, y + Fetch64(s + 16));
        std::swap(z, x);
    }
    return HashLen16(HashLen16(v.first, w.first) + ShiftMix(y) * k1 + z, HashLen16(v.second, w.second) + x);
}

}  // namespace

uint64_t CityHash64(std::string_view text) {
    const char* s = text.data();
    const size_t length = text.size();
    if (length <= 16) return HashLen0To16(s, length);
    if (length <= 32) return HashLen17To32(s, length);
    if (length <= 64) return HashLen33To64(s, length);
    return HashLong(s, length);
}

}  // namespace qsl
