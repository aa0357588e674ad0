#include "script/native_private.h"

#include "script/scripting_context.h"

namespace qorvex::script {

NativePrivate FindWrapped(JSContextRef context, JSObjectRef object) {
    const ScriptingContext* page = GetScriptingContext(context);
    if (!page) return {};
    if (const void* packed = page->wrappers.Find(object)) return UnpackPrivate(packed);
    if (!page->global_handle || object != page->global_object) return {};
    return {page->global_handle, ScriptClass::Window, true};
}

}  // namespace qorvex::script
