#include "script/bindings/bindings_fixture.h"

#include <JavaScriptCore/JavaScript.h>

#include "script/engine_seam.h"
#include "script/evaluate.h"

namespace qorvex::script::test {

BindingsTest::BindingsTest() {
    StartScriptEngine();
    CreateScriptClasses();
}

BindingsTest::~BindingsTest() {
    ClosePage();
    DropDocument();
    ReleaseScriptClasses();
}

void BindingsTest::OpenPage(std::string_view html) {
    Load(html);
    page_ = CreateScriptingContext(window_host_, *document_);
    RunPreludeScripts(*page_);
}

void BindingsTest::ClosePage() {
    if (page_) DestroyScriptingContext(std::move(page_));
}

std::string BindingsTest::Run(const std::string& source) {
    JSStringRef text = JSStringCreateWithUTF8CString(source.c_str());
    JSValueRef exception = nullptr;
    const JSValueRef value = JSEvaluateScript(page_->context, text, nullptr, nullptr, 0, &exception);
    JSStringRelease(text);
    const String result = ToNativeString(page_->context, exception ? exception : value);
    return (exception ? "throws " : "") + std::string(result.view());
}

void BindingsTest::Advance(double milliseconds) {
    window_host_.time += milliseconds;
    page_->window->RunTimersAndFrameCallbacks(window_host_.time);
}

void BindingsTest::Collect() {
    Run("(function() { let a = []; for (let i = 0; i < 2000; ++i) a.push({ i }); })()");
    CollectGarbageNow(page_->context);
}

size_t BindingsTest::Count(Logging::Severity severity, const std::string& text) const {
    size_t count = 0;
    for (const auto& line : log_.Lines()) {
        count += line.severity == severity && line.text == text;
    }
    return count;
}

}  // namespace qorvex::script::test
