// Text that is put together in a buffer of fixed size. What does not fit is cut; one byte is kept for the
// terminator.
#pragma once

#include <charconv>
#include <cstddef>
#include <cstring>
#include <string_view>

namespace qorvex {

template <size_t kBytes>
class FixedStream {
  public:
    void Reset() { size_ = 0; }

    FixedStream& operator<<(std::string_view text) {
        const size_t room = kBytes - 1 - size_;
        const size_t taken = text.size() < room ? text.size() : room;
        if (taken) std::memcpy(buffer_ + size_, text.data(), taken);
        size_ += taken;
        return *this;
    }
    FixedStream& operator<<(char c) { return *this << std::string_view(&c, 1); }

    template <class Number>
    FixedStream& WriteNumber(Number value) {
        char digits[32];
        const auto result = std::to_chars(digits, digits + sizeof(digits), value);
        return *this << std::string_view(digits, static_cast<size_t>(result.ptr - digits));
    }

    // Text whose control characters, line feeds among them, become blanks: whoever writes lines stays on one.
    void WriteOnOneLine(std::string_view text) {
        const size_t begin = size_;
        *this << text;
        for (size_t i = begin; i < size_; ++i) {
            const auto byte = static_cast<unsigned char>(buffer_[i]);
            if (byte < ' ' || byte == 0x7F) buffer_[i] = ' ';
        }
    }

    // A zero in a page's text would end the line for whoever reads it as a C string.
    void BlankZeros() {
        for (char* at = buffer_; (at = static_cast<char*>(std::memchr(at, '\0', size_ - (at - buffer_))));)
            *at = ' ';
    }

    std::string_view view() const { return {buffer_, size_}; }
    const char* Terminated() {
        buffer_[size_] = '\0';
        return buffer_;
    }

  private:
    size_t size_ = 0;
    char buffer_[kBytes];
};

}  // namespace qorvex
