#include "script/scripting_context.h"

#include <JavaScriptCore/JavaScript.h>

#include <atomic>

#include "core/logging/log.h"
#include "script/evaluate.h"

namespace qorvex::script {

namespace {

bool g_teardown = false;
// How many contexts have a waiting error: lets a callback that raised nothing leave after one load.
std::atomic<uint32_t> g_pending_exceptions{0};
// A context belongs to the thread that runs its view, and so does this list: no lock.
thread_local ScriptingContext* t_contexts = nullptr;

}  // namespace

bool IsScriptContextTeardown() {
    return g_teardown;
}
ScriptContextTeardownScope::ScriptContextTeardownScope() {
    g_teardown = true;
}
ScriptContextTeardownScope::~ScriptContextTeardownScope() {
    g_teardown = false;
}

void UnprotectUnlessTeardown(JSContextRef context, JSValueRef value) {
    if (!value || g_teardown) return;
    for (const ScriptingContext* page = t_contexts; page; page = page->next) {
        if (page->context == context) return JSValueUnprotect(context, value);
    }
}

void RegisterScriptingContext(ScriptingContext& context) {
    context.global_object = JSContextGetGlobalObject(context.context);
    context.next = t_contexts;
    t_contexts = &context;
    context.wrappers.Start(context);
}

void UnregisterScriptingContext(ScriptingContext& context) {
    context.wrappers.Stop();
    for (ScriptingContext** link = &t_contexts; *link; link = &(*link)->next) {
        if (*link != &context) continue;
        *link = context.next;
        break;
    }
    if (context.pending_exception) {
        UnprotectUnlessTeardown(context.context, context.pending_exception);
        context.pending_exception = nullptr;
        g_pending_exceptions.fetch_sub(1, std::memory_order_relaxed);
    }
}

ScriptingContext* GetFirstScriptingContext() {
    return t_contexts;
}

ScriptingContext* GetScriptingContext(JSContextRef context) {
    // What the engine hands to callbacks is the global context itself, so the question that would settle it,
    // which takes the engine's lock, is hardly ever asked.
    for (ScriptingContext* page = t_contexts; page; page = page->next) {
        if (page->context == context) return page;
    }
    if (!t_contexts || !context) return nullptr;
    JSGlobalContextRef global = JSContextGetGlobalContext(context);
    for (ScriptingContext* page = t_contexts; page; page = page->next) {
        if (page->context == global) return page;
    }
    return nullptr;
}

JSGlobalContextRef GetGlobalContext(JSContextRef context) {
    const ScriptingContext* page = GetScriptingContext(context);
    return page ? page->context : JSContextGetGlobalContext(context);
}

JSValueRef MakeError(JSContextRef context, std::string_view message) {
    const JSValueRef text = ToScriptString(context, message);
    return JSObjectMakeError(context, 1, &text, nullptr);
}

void RaiseError(JSContextRef context, std::string_view message, JSValueRef* exception) {
    if (exception) *exception = MakeError(context, message);
}

void RaiseError(ScriptingContext* context, std::string_view message) {
    if (!context || !context->context) {
        LogError("Script error without a script context: ", message);
        return;
    }
    if (context->pending_exception) return;
    context->pending_exception = MakeError(context->context, message);
    JSValueProtect(context->context, context->pending_exception);
    g_pending_exceptions.fetch_add(1, std::memory_order_relaxed);
}

void HandOverPendingException(JSContextRef context, JSValueRef* exception) {
    if (g_pending_exceptions.load(std::memory_order_relaxed) == 0) [[likely]]
        return;
    ScriptingContext* page = GetScriptingContext(context);
    if (!page || !page->pending_exception) return;
    JSValueUnprotect(page->context, page->pending_exception);
    if (exception) *exception = page->pending_exception;
    page->pending_exception = nullptr;
    g_pending_exceptions.fetch_sub(1, std::memory_order_relaxed);
}

}  // namespace qorvex::script
