#include "script/scripting_handle_enabled.h"

#include <JavaScriptCore/JavaScript.h>

#include <new>

#include "core/memory/allocator.h"
#include "script/native_private.h"
#include "script/scripting_context.h"

namespace qorvex::script {

ScriptingHandleEnabled::~ScriptingHandleEnabled() = default;

void* ScriptingHandleEnabled::operator new(size_t size) {
    return GetAllocator()->Allocate(size, MemoryTag::DOM);
}

void ScriptingHandleEnabled::operator delete(void* memory) {
    GetAllocator()->Deallocate(memory, MemoryTag::DOM);
}

void ScriptingHandleEnabled::ReleaseWrapper() {
    if (wrapper_) UnprotectUnlessTeardown(wrapper_context_, wrapper_);
}

void ScriptingHandleEnabled::ProtectWrapper() {
    JSValueProtect(wrapper_context_, wrapper_);
}

bool ScriptingHandleEnabled::MakeWrapper(ScriptClass script_class, bool has_weak, JSContextRef context) {
    JSClassRef engine_class = GetScriptClassTable()[script_class];
    if (!engine_class) return false;
    const ScriptingContext* page = GetScriptingContext(context);
    if (!wrapper_context_) wrapper_context_ = GetGlobalContext(context);
    wrapper_ = JSObjectMake(wrapper_context_, engine_class, PackPrivate(this, script_class, has_weak));
    // The classes have no prototypes of their own, see prototypes.h.
    const JSObjectRef prototype = page ? page->prototypes[static_cast<size_t>(script_class)] : nullptr;
    if (prototype) JSObjectSetPrototype(wrapper_context_, wrapper_, prototype);
    return true;
}

WeakHandleBlock* MakeWeakHandleBlock(ScriptingHandleEnabledRefCountedWithWeak* object) {
    void* memory = GetAllocator()->Allocate(sizeof(WeakHandleBlock), MemoryTag::DOM);
    auto* block = new (memory) WeakHandleBlock;
    block->object = object;
    return block;
}

void DropWeakHandleBlock(WeakHandleBlock* block) {
    if (!block->count.Drop()) return;
    block->~WeakHandleBlock();
    GetAllocator()->Deallocate(block, MemoryTag::DOM);
}

}  // namespace qorvex::script
