// UTF-8 text of 24 bytes. Short texts, up to 22 bytes and their terminator, live in the object itself; bit 0
// of the first byte is set for them, and the rest of that byte is the length. A long text keeps its (even)
// capacity in the first word, so that the same bit is clear. c_str() always ends with a zero.
#pragma once

#include <bit>
#include <compare>
#include <cstdint>
#include <cstring>
#include <functional>
#include <iterator>
#include <string_view>

#include "qsl/allocation.h"

namespace qsl {
namespace container {

static_assert(std::endian::native == std::endian::little,
              "the first byte holds the low bits of the capacity");

template <class Alloc = std::allocator<char>>
class basic_string {
  public:
    using TriviallyRelocatable = basic_string;
    using value_type = char;
    using iterator = char*;
    using const_iterator = const char*;
    static constexpr size_t npos = std::string_view::npos;
    static constexpr size_t kInlineCapacity = 22;

    basic_string() noexcept { SetEmpty(); }
    basic_string(const char* text) : basic_string(std::string_view(text ? text : "")) {}
    basic_string(const char* text, size_t length) : basic_string(std::string_view(text, length)) {}
    explicit basic_string(std::string_view text) {
        SetEmpty();
        append(text);
    }
    basic_string(size_t count, char c) {
        SetEmpty();
        resize(count, c);
    }
    template <std::input_iterator It>
    basic_string(It first, It last) {
        SetEmpty();
        for (; first != last; ++first)
            push_back(*first);
    }
    basic_string(const basic_string& other) {
        SetEmpty();
        append(other.view());
    }
    basic_string(basic_string&& other) noexcept : bytes_(other.bytes_) { other.SetEmpty(); }
    ~basic_string() { Release(); }

    basic_string& operator=(const basic_string& other) {
        if (this != &other) assign(other.view());
        return *this;
    }
    basic_string& operator=(basic_string&& other) noexcept {
        if (this != &other) {
            Release();
            bytes_ = other.bytes_;
            other.SetEmpty();
        }
        return *this;
    }
    basic_string& operator=(std::string_view text) { return assign(text); }
    basic_string& operator=(const char* text) { return assign(std::string_view(text ? text : "")); }

    bool is_short() const { return bytes_.short_form.tag & 1; }
    size_t size() const { return is_short() ? size_t{bytes_.short_form.tag} >> 1 : bytes_.long_form.size; }
    size_t length() const { return size(); }
    bool empty() const { return size() == 0; }
    size_t capacity() const { return is_short() ? kInlineCapacity : bytes_.long_form.capacity - 1; }
    char* data() { return is_short() ? bytes_.short_form.text : bytes_.long_form.text; }
    const char* data() const { return is_short() ? bytes_.short_form.text : bytes_.long_form.text; }
    const char* c_str() const { return data(); }
    std::string_view view() const { return {data(), size()}; }
    operator std::string_view() const { return view(); }

    char* begin() { return data(); }
    char* end() { return data() + size(); }
    const char* begin() const { return data(); }
    const char* end() const { return data() + size(); }
    char& operator[](size_t index) { return data()[index]; }
    char operator[](size_t index) const { return data()[index]; }
    char& front() { return data()[0]; }
    char front() const { return data()[0]; }
    char& back() { return data()[size() - 1]; }
    char back() const { return data()[size() - 1]; }

    void reserve(size_t capacity) {
        if (capacity > this->capacity()) Reallocate(capacity);
    }
    void shrink_to_fit() {
        if (!is_short() && size() + 2 < capacity()) Reallocate(size());
    }
    void clear() { SetSize(0); }

    void resize(size_t count, char fill = '\0') {
        const size_t old = size();
        if (count > old) {
            GrowFor(count);
            std::memset(data() + old, fill, count - old);
        }
        SetSize(count);
    }

    void push_back(char c) {
        const size_t old = size();
        GrowFor(old + 1);
        data()[old] = c;
        SetSize(old + 1);
    }
    void pop_back() { SetSize(size() - 1); }

    /// `text` may lie inside this string.
    basic_string& append(std::string_view text) {
        if (text.empty()) return *this;
        const size_t old = size();
        const size_t needed = old + text.size();
        if (needed > capacity() && Holds(text)) return append(basic_string(text).view());
        GrowFor(needed);
        std::memmove(data() + old, text.data(), text.size());
        SetSize(needed);
        return *this;
    }
    basic_string& append(const char* text, size_t length) { return append(std::string_view(text, length)); }
    basic_string& append(size_t count, char c) {
        resize(size() + count, c);
        return *this;
    }
    basic_string& operator+=(std::string_view text) { return append(text); }
    basic_string& operator+=(char c) {
        push_back(c);
        return *this;
    }

    /// `text` may lie inside this string.
    basic_string& assign(std::string_view text) {
        if (text.size() > capacity()) {
            basic_string fresh;
            fresh.append(text);
            swap(fresh);
            return *this;
        }
        if (!text.empty()) std::memmove(data(), text.data(), text.size());
        SetSize(text.size());
        return *this;
    }
    basic_string& assign(const char* text, size_t length) { return assign(std::string_view(text, length)); }

    basic_string& insert(size_t position, std::string_view text) { return replace(position, 0, text); }

    basic_string& erase(size_t position = 0, size_t count = npos) { return replace(position, count, {}); }

    basic_string& replace(size_t position, size_t count, std::string_view text) {
        const size_t old = size();
        if (position > old) position = old;
        if (count > old - position) count = old - position;
        if (!text.empty() && Holds(text)) return replace(position, count, basic_string(text).view());
        const size_t fresh = old - count + text.size();
        GrowFor(fresh);
        char* at = data() + position;
        std::memmove(at + text.size(), at + count, old - position - count);
        if (!text.empty()) std::memcpy(at, text.data(), text.size());
        SetSize(fresh);
        return *this;
    }

    void swap(basic_string& other) noexcept { std::swap(bytes_, other.bytes_); }

    size_t find(std::string_view text, size_t from = 0) const { return view().find(text, from); }
    size_t find(char c, size_t from = 0) const { return view().find(c, from); }
    size_t rfind(std::string_view text, size_t from = npos) const { return view().rfind(text, from); }
    size_t rfind(char c, size_t from = npos) const { return view().rfind(c, from); }
    size_t find_first_of(std::string_view set, size_t from = 0) const {
        return view().find_first_of(set, from);
    }
    size_t find_first_not_of(std::string_view set, size_t from = 0) const {
        return view().find_first_not_of(set, from);
    }
    size_t find_last_of(std::string_view set, size_t from = npos) const {
        return view().find_last_of(set, from);
    }
    size_t find_last_not_of(std::string_view set, size_t from = npos) const {
        return view().find_last_not_of(set, from);
    }
    bool contains(std::string_view text) const { return find(text) != npos; }
    bool contains(char c) const { return find(c) != npos; }
    bool starts_with(std::string_view text) const { return view().starts_with(text); }
    bool starts_with(char c) const { return view().starts_with(c); }
    bool ends_with(std::string_view text) const { return view().ends_with(text); }
    bool ends_with(char c) const { return view().ends_with(c); }
    int compare(std::string_view text) const { return view().compare(text); }
    basic_string substr(size_t position, size_t count = npos) const {
        return position >= size() ? basic_string() : basic_string(view().substr(position, count));
    }

    friend bool operator==(const basic_string& a, const basic_string& b) { return a.view() == b.view(); }
    friend bool operator==(const basic_string& a, std::string_view b) { return a.view() == b; }
    friend bool operator==(const basic_string& a, const char* b) { return a.view() == std::string_view(b); }
    friend auto operator<=>(const basic_string& a, const basic_string& b) { return a.view() <=> b.view(); }
    friend auto operator<=>(const basic_string& a, std::string_view b) { return a.view() <=> b; }

    friend basic_string operator+(const basic_string& a, std::string_view b) {
        basic_string sum;
        sum.reserve(a.size() + b.size());
        sum.append(a.view()).append(b);
        return sum;
    }
    friend basic_string operator+(basic_string&& a, std::string_view b) { return std::move(a.append(b)); }

  private:
    struct ShortForm {
        unsigned char tag;
        char text[23];
    };
    struct LongForm {
        size_t capacity;  ///< Bytes of the block, terminator included; always even.
        size_t size;
        char* text;
    };
    union Bytes {
        ShortForm short_form;
        LongForm long_form;
    };

    void SetEmpty() {
        bytes_.short_form.tag = 1;
        bytes_.short_form.text[0] = '\0';
    }

    void SetSize(size_t size) {
        if (is_short()) {
            bytes_.short_form.tag = static_cast<unsigned char>(size << 1 | 1);
            bytes_.short_form.text[size] = '\0';
        } else {
            bytes_.long_form.size = size;
            bytes_.long_form.text[size] = '\0';
        }
    }

    bool Holds(std::string_view text) const {
        return std::less_equal<const char*>()(data(), text.data()) &&
               std::less<const char*>()(text.data(), data() + size());
    }

    void GrowFor(size_t size) {
        const size_t room = capacity();
        if (size > room) [[unlikely]]
            Reallocate(size > room + room / 2 ? size : room + room / 2);
    }

    [[gnu::noinline]] void Reallocate(size_t capacity) {
        const size_t size = this->size();
        const size_t block = (capacity + 2) & ~size_t{1};
        char* text = AllocateArray<char, Alloc>(block);
        std::memcpy(text, data(), size + 1);
        Release();
        bytes_.long_form = {block, size, text};
    }

    void Release() {
        if (!is_short()) DeallocateArray<char, Alloc>(bytes_.long_form.text, bytes_.long_form.capacity);
    }

    Bytes bytes_;
};

}  // namespace container

using string = container::basic_string<>;
static_assert(sizeof(string) == 24);

}  // namespace qsl
