#include "script/scripting_handle_enabled.h"

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
    if (!wrapper_ || IsScriptContextTeardown()) return;
    for (ScriptingContext* page = GetFirstScriptingContext(); page; page = page->next)
        page->wrappers.LetGo(wrapper_);
}

void ScriptingHandleEnabled::HoldWrapper() {
    if (IsScriptContextTeardown()) return;
    for (ScriptingContext* page = GetFirstScriptingContext(); page; page = page->next)
        page->wrappers.Hold(wrapper_);
}

bool ScriptingHandleEnabled::MakeWrapper(ScriptClass script_class, bool has_weak, JSContextRef context) {
    ScriptingContext* page = GetScriptingContext(context);
    if (!page) return false;
    wrapper_ = page->wrappers.Add(script_class, PackPrivate(this, script_class, has_weak));
    return wrapper_ != nullptr;
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
