#include "script/native_private.h"

#include "script/scripting_context.h"

namespace qorvex::script {

NativePrivate PrivateOfGlobal(JSContextRef context, JSObjectRef object) {
    if (object != JSContextGetGlobalObject(context)) return {};
    const ScriptingContext* page = GetScriptingContext(context);
    if (!page || !page->global_handle) return {};
    return {page->global_handle, ScriptClass::Window, true};
}

}  // namespace qorvex::script
