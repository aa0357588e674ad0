// The script side of one loaded document. Owned by the view; the document keeps a pointer so that any node
// reaches it. Created and destroyed by script/bindings/context_lifecycle.h.
//
// Invariant: one thread, the view's script thread, touches a context; two contexts of one view are never
// alive together.
#pragma once

#include <JavaScriptCore/JSBase.h>

#include <array>
#include <string_view>

#include "core/memory/containers.h"
#include "script/class_table.h"
#include "script/wrapper_table.h"

namespace qorvex::dom {
class Window;
}

namespace qorvex::script {

class ScriptingHandleEnabled;

// What classes are made with (class_installation.cpp): functions, symbols and property descriptors of the
// language, kept before any script of the page can change it, and two functions of our own in script, which
// are made when they are first needed.
enum class ClassTool : uint8_t {
    DefineProperty,
    SetPrototypeOf,
    Apply,
    InstanceOf,
    HasInstance,
    ToStringTag,
    Iterator,
    WalkArray,
    DefineGetter,
    DefineSetter,
    SharedAccessors,
    HiddenAccessor,
    HiddenValue,
    Method,
    GetKey,
    SetKey,
    ValueKey,
    ConstructorKey,
    ConstructorAccessor,
    MakePrototype,
    ConstructorOf,
    BlanksOf,
};
inline constexpr size_t kClassToolCount = static_cast<size_t>(ClassTool::BlanksOf) + 1;

// A global name whose class is made when script reads it.
struct LazyClassName {
    const char* name;
    ScriptClass script_class;
};

// A property with functions instead of a value; without a setter it cannot be written.
struct ScriptAccessor {
    JSValueRef name;
    JSObjectRef getter;
    JSObjectRef setter;
};

struct ScriptingContext {
    // Error raised by native code that has no exception out-parameter at hand; protected while it stands
    // here. Set by RaiseError, moved out by HandOverPendingException.
    JSValueRef pending_exception = nullptr;
    dom::Window* window = nullptr;
    JSGlobalContextRef context = nullptr;

    // The global object, and the window as the handle that calls on it act on.
    JSObjectRef global_object = nullptr;
    ScriptingHandleEnabled* global_handle = nullptr;
    // What has been made of the bound classes (class_installation.h), all held by `class_keeper`.
    std::array<JSObjectRef, kScriptClassCount> prototypes{};
    std::array<JSValueRef, kClassToolCount> class_tools{};
    Vector<LazyClassName, MemoryTag::DOM> class_names;
    Vector<ScriptAccessor, MemoryTag::DOM> shared_accessors;
    JSObjectRef class_keeper = nullptr;
    WrapperTable wrappers;
    // Chain of the thread's contexts, see GetScriptingContext.
    ScriptingContext* next = nullptr;
};

// Puts a context whose `context` field is set among those that GetScriptingContext finds, or takes it out,
// which parts all wrappers from their natives. To be called on the context's own thread.
void RegisterScriptingContext(ScriptingContext& context);
void UnregisterScriptingContext(ScriptingContext& context);

// The chain of the thread's contexts; null for an empty one.
[[nodiscard]] ScriptingContext* GetFirstScriptingContext();

// The context of the page that `context` belongs to; null for a context that no page owns. A short walk: a
// thread has as many contexts as it has views.
[[nodiscard]] ScriptingContext* GetScriptingContext(JSContextRef context);

// The global context behind any context.
[[nodiscard]] JSGlobalContextRef GetGlobalContext(JSContextRef context);

// While true nobody issues a JSValueUnprotect: the heap is on its way out. Process-wide and plain, as the
// views of a system share one thread.
[[nodiscard]] bool IsScriptContextTeardown();

class ScriptContextTeardownScope {
  public:
    ScriptContextTeardownScope();
    ~ScriptContextTeardownScope();
    ScriptContextTeardownScope(const ScriptContextTeardownScope&) = delete;
    ScriptContextTeardownScope& operator=(const ScriptContextTeardownScope&) = delete;
};

// JSValueUnprotect, or nothing during a teardown and for a context that is gone: what native code kept of a
// page may be dropped after it. `context` is a global context; null values are fine.
void UnprotectUnlessTeardown(JSContextRef context, JSValueRef value);

// An `Error` with this message, as all errors that native code raises are: no TypeError, no DOMException.
[[nodiscard]] JSValueRef MakeError(JSContextRef context, std::string_view message);

// For a binding callback, which has the exception out-parameter.
void RaiseError(JSContextRef context, std::string_view message, JSValueRef* exception);

// For native code deeper down: the error waits in the context and the code goes on. The first error wins. A
// null context drops the message into the log.
void RaiseError(ScriptingContext* context, std::string_view message);

// The end of each binding callback: moves a waiting error to the out-parameter. Costs one load when no
// context of the process has one.
void HandOverPendingException(JSContextRef context, JSValueRef* exception);

}  // namespace qorvex::script
