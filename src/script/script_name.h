// A name as a string of the script engine, for one scope.
#pragma once

#include <JavaScriptCore/JavaScript.h>

#include <cstddef>

namespace qorvex::script {

// By way of UTF-16, which the engine takes as it is: names are ASCII, and in UTF-8 it would look for other
// characters, whose conversion takes two thirds of the whole.
class ScriptName {
  public:
    ScriptName() = default;
    explicit ScriptName(const char* text) { Set(text); }
    ScriptName(const JSChar* text, size_t length) : string_(JSStringCreateWithCharacters(text, length)) {}
    ~ScriptName() {
        if (string_) JSStringRelease(string_);
    }
    // Once. A text of more than kLongestName characters goes by way of UTF-8.
    void Set(const char* text) {
        JSChar characters[kLongestName];
        size_t length = 0;
        for (; text[length] && length < kLongestName; ++length)
            characters[length] = static_cast<unsigned char>(text[length]);
        string_ = text[length] ? JSStringCreateWithUTF8CString(text)
                               : JSStringCreateWithCharacters(characters, length);
    }
    ScriptName(const ScriptName&) = delete;
    ScriptName& operator=(const ScriptName&) = delete;
    operator JSStringRef() const { return string_; }  // NOLINT: implicit by design

  private:
    static constexpr size_t kLongestName = 64;
    JSStringRef string_ = nullptr;
};

}  // namespace qorvex::script
