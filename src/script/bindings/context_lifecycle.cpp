#include "script/bindings/context_lifecycle.h"

#include <JavaScriptCore/JavaScript.h>

#include "dom/document.h"
#include "script/bindings/window.h"
#include "script/class_installation.h"
#include "script/convert.h"
#include "script/engine_seam.h"
#include "script/evaluate.h"
#include "script/make_handle.h"

namespace qorvex::script {

namespace {

// Gives a property of `object` the value of another one.
void Copy(JSContextRef context, JSObjectRef object, std::string_view to, std::string_view from) {
    if (const JSValueRef value = GetProperty(context, object, from))
        SetProperty(context, object, to, value, kJSPropertyAttributeNone);
}

JSObjectRef GetObject(JSContextRef context, JSObjectRef holder, std::string_view name) {
    return holder ? AsObject(context, GetProperty(context, holder, name)) : nullptr;
}

// Dates print in one form everywhere, whatever the locale of the machine.
void FixDates(JSContextRef context, JSObjectRef global) {
    const JSObjectRef prototype = GetObject(context, GetObject(context, global, "Date"), "prototype");
    if (!prototype) return;
    Copy(context, prototype, "toLocaleString", "toString");
    Copy(context, prototype, "toLocaleDateString", "toDateString");
    Copy(context, prototype, "toLocaleTimeString", "toTimeString");
}

// Pages look for its functions among its own properties, as on the web. They need no binding: a first call of
// `bind` takes longer than all of the above (the engine has it in script of its own, to be parsed first).
void OwnConsoleFunctions(JSContextRef context, JSObjectRef global) {
    constexpr std::string_view kMethods[] = {"assert", "debug", "error",   "info",
                                             "log",    "time",  "timeEnd", "warn"};
    const JSObjectRef console = GetObject(context, global, "console");
    for (const std::string_view name : kMethods) {
        if (console) Copy(context, console, name, name);
    }
}

void DefineGlobals(ScriptingContext& page) {
    JSContextRef context = page.context;
    const JSObjectRef global = JSContextGetGlobalObject(context);
    constexpr JSPropertyAttributes kFixed = kJSPropertyAttributeReadOnly | kJSPropertyAttributeDontDelete;
    SetProperty(context, global, "window", global, kJSPropertyAttributeNone);
    // Its place until the Location object comes.
    SetProperty(context, global, "location", global, kJSPropertyAttributeNone);
    SetProperty(context, global, "self", global, kFixed);
    SetProperty(context, global, "parent", global, kFixed);
    SetProperty(context, global, "document", ToScript(context, page.window->GetEventTargetDocument()),
                kFixed);
    SetProperty(context, global, "performance", ToScript(context, &page.window->performance()), kFixed);
    // The script engine has a console of its own, which leads nowhere.
    SetProperty(context, global, "console", ToScript(context, &page.window->console()),
                kJSPropertyAttributeNone);
}

}  // namespace

ScriptingContextPtr CreateScriptingContext(dom::IWindowHost& host, dom::Document& document,
                                           double time_limit) {
    ScriptingContextPtr page = MakeUnique<ScriptingContext>();
    JSContextGroupRef group = JSContextGroupCreate();
    page->context = JSGlobalContextCreateInGroup(group, nullptr);
    RegisterScriptingContext(*page);
    // Each call below would take and leave the engine's lock for itself.
    const ScriptEngineLock lock(page->context);

    // The context owns the window by the reference that it was made with.
    page->window = MakeHandle<dom::Window>(host, *page, document).leak();
    page->global_handle = page->window;
    document.SetScriptingContext(page.get());
    document.SetWindow(page->window);

    InstallClasses(*page);
    DefineGlobals(*page);
    // Not before: each entry into the script engine takes the clock twice for it.
    SetScriptTimeLimit(group, time_limit);
    return page;
}

// Done by calls: as scripts, parsed and run cold for each page, the same takes a tenth of a context.
void RunPreludeScripts(ScriptingContext& page) {
    const ScriptEngineLock lock(page.context);
    FixDates(page.context, page.global_object);
    OwnConsoleFunctions(page.context, page.global_object);
}

void DestroyScriptingContext(ScriptingContextPtr page) {
    if (!page || !page->context) return;
    ScriptContextTeardownScope teardown;
    dom::Window* window = std::exchange(page->window, nullptr);
    dom::Document& document = *window->GetEventTargetDocument();
    page->global_handle = nullptr;
    window->DetachFromContext();
    window->performance().ForgetWindow();
    // Listeners hold functions of the heap that goes.
    document.GetEventListenerTable().Clear();
    document.SetWindow(nullptr);
    document.SetScriptingContext(nullptr);

    UninstallClasses(*page);
    UnregisterScriptingContext(*page);
    JSContextGroupRef group = JSContextGetGroup(page->context);
    JSGlobalContextRelease(std::exchange(page->context, nullptr));
    JSContextGroupRelease(group);
    window->Release();
}

}  // namespace qorvex::script
