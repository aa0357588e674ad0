// The UTF-8 text of a script value for the length of a call. Short text stays on the stack.
#pragma once

#include <JavaScriptCore/JavaScript.h>

#include <string_view>

#include "core/memory/containers.h"

namespace qorvex::script {

class ScriptText {
  public:
    ScriptText() = default;
    ScriptText(const ScriptText&) = delete;
    ScriptText& operator=(const ScriptText&) = delete;

    // String(value). False, with empty text, when the conversion throws.
    bool Read(JSContextRef context, JSValueRef value, JSValueRef* exception);
    void Read(JSStringRef text);

    [[nodiscard]] std::string_view view() const { return view_; }
    [[nodiscard]] const char* c_str() const { return view_.data(); }

  private:
    // Attribute names, class lists, colours: nearly all arguments fit (an engine character may take 3 bytes).
    static constexpr size_t kInlineBytes = 256;

    std::string_view view_{""};
    String long_text_;
    char short_text_[kInlineBytes];
};

}  // namespace qorvex::script
