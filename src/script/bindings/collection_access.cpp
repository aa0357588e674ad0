#include "script/bindings/collection_access.h"

namespace qorvex::script {

bool ReadIndexName(JSStringRef name, uint32_t& index) {
    // Every property name of a list comes through here; short ones are read without making a UTF-16 copy.
    constexpr size_t kShortName = 20;
    const size_t length = JSStringGetLength(name);
    index = 0;
    const auto take = [&](unsigned character) {
        if (character < '0' || character > '9') return false;
        index = index * 10 + (character - '0');
        return true;
    };
    if (length <= kShortName) {
        char text[kShortName * 3 + 1];
        JSStringGetUTF8CString(name, text, sizeof text);
        for (const char* c = text; *c; ++c) {
            if (!take(static_cast<unsigned char>(*c))) return false;
        }
        return true;
    }
    const JSChar* characters = JSStringGetCharactersPtr(name);
    for (size_t i = 0; i < length; ++i) {
        if (!take(characters[i])) return false;
    }
    return true;
}

bool HasIndexName(JSContextRef, JSObjectRef, JSStringRef name) {
    uint32_t index = 0;
    return ReadIndexName(name, index);
}

}  // namespace qorvex::script
