#include "script/script_text.h"

namespace qorvex::script {

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
}

}  // namespace qorvex::script
