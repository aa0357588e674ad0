#include "script/script_text.h"

#include "qsl/utf8.h"

namespace qorvex::script {

namespace {

// How many UTF-16 units the text stands for.
size_t CountUnits(std::string_view utf8) {
    size_t units = 0;
    for (const char c : utf8) {
        const auto byte = static_cast<uint8_t>(c);
        units += ((byte & 0xC0) != 0x80) + (byte >= 0xF0);
    }
    return units;
}

char* Append(uint32_t code, char* to) {
    if (code < 0x80) return *to++ = static_cast<char>(code), to;
    const int more = code < 0x800 ? 1 : code < 0x10000 ? 2 : 3;
    constexpr uint32_t kLeads[] = {0, 0xC0, 0xE0, 0xF0};
    *to++ = static_cast<char>(kLeads[more] | code >> (6 * more));
    for (int i = more - 1; i >= 0; --i)
        *to++ = static_cast<char>(0x80 | (code >> (6 * i) & 0x3F));
    return to;
}

// With U+FFFD in the place of each half of a pair that stands alone; three bytes a unit are room enough.
size_t WriteUnits(JSStringRef text, char* target) {
    const JSChar* units = JSStringGetCharactersPtr(text);
    const size_t count = JSStringGetLength(text);
    char* to = target;
    for (size_t i = 0; i < count; ++i) {
        const uint32_t unit = units[i];
        const bool is_half = unit >= 0xD800 && unit < 0xE000;
        const bool has_pair = is_half && unit < 0xDC00 && i + 1 < count && (units[i + 1] & 0xFC00) == 0xDC00;
        if (has_pair)
            to = Append(0x10000 + ((unit - 0xD800) << 10) + (units[++i] - 0xDC00u), to);
        else
            to = Append(is_half ? qsl::kReplacementCharacter : unit, to);
    }
    *to = '\0';
    return static_cast<size_t>(to - target);
}

}  // namespace

bool ScriptText::Read(JSContextRef context, JSValueRef value, JSValueRef* exception) {
    JSStringRef text = JSValueToStringCopy(context, value, exception);
    if (!text) return false;
    Read(text);
    JSStringRelease(text);
    return true;
}

void ScriptText::Read(JSStringRef text) {
    const size_t room = JSStringGetMaximumUTF8CStringSize(text);
    char* target = short_text_;
    if (room > kInlineBytes) {
        long_text_.resize(room);
        target = long_text_.data();
    }
    const size_t written = JSStringGetUTF8CString(text, target, room);
    view_ = written ? std::string_view(target, written - 1) : std::string_view("");
    // The engine stops at half a surrogate pair, as in text that a page writes out letter by letter.
    if (CountUnits(view_) != JSStringGetLength(text))
        view_ = std::string_view(target, WriteUnits(text, target));
}

}  // namespace qorvex::script
