#include "script/native_private.h"

#include "script/scripting_context.h"

namespace qorvex::script {

NativePrivate PrivateOfGlobal(JSContextRef context, JSObjectRef object) {
    const ScriptingContext* page = GetScriptingContext(context);
    if (!page || !page->global_handle || object != page->global_object) return {};
    return {page->global_handle, ScriptClass::Window, true};
}

}  // namespace qorvex::script
