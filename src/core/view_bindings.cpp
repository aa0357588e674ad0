// The view's end of native and data binding, which come with a later build. What can be refused already is
// refused with its own message.
#include <qorvex/binder.h>

#include "core/api_call.h"
#include "core/unavailable.h"
#include "core/view_impl.h"

namespace qorvex {

bool ViewImpl::IsReadyForBindings() const {
    return false;
}

Binder* ViewImpl::GetBinder() {
    return nullptr;
}

bool ViewImpl::RequireBinder() const {
    if (IsReadyForBindings()) return true;
    AssertFailure("View binding is not initialized yet");
    return false;
}

bool ViewImpl::RequireDocument() const {
    if (document_) return true;
    AssertFailure("Can't use data-bind API when document is not yet created!");
    return false;
}

IEventHandler* ViewImpl::RegisterForEvent(const char*, IEventHandler* handler) {
    const APICall call(family_, api_depth_);
    if (!call) return nullptr;
    LogUnavailable("View::RegisterForEvent");
    RequireBinder();
    delete handler;
    return nullptr;
}

void ViewImpl::UnregisterFromEvent(IEventHandler*) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    LogUnavailable("View::UnregisterFromEvent");
    RequireBinder();
}

IEventHandler* ViewImpl::BindCall(const char*, IEventHandler* handler) {
    const APICall call(family_, api_depth_);
    if (!call) return nullptr;
    LogUnavailable("View::BindCall");
    RequireBinder();
    delete handler;
    return nullptr;
}

void ViewImpl::UnbindCall(const char*) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    LogUnavailable("View::UnbindCall");
    RequireBinder();
}

void ViewImpl::UnregisterAll(void*) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    LogUnavailable("View::UnregisterAll");
    RequireBinder();
}

void ViewImpl::SynchronizeModels() {
    const APICall call(family_, api_depth_);
    if (!call) return;
    if (RequireDocument()) LogUnavailable("View::SynchronizeModels");
}

void ViewImpl::RegisterTypeBinding(const char*, void (*)(Binder*, void*)) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    LogUnavailable("View::RegisterTypeBinding");
}

void ViewImpl::UpdateWholeModel(void*, const char*) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    if (RequireDocument()) LogUnavailable("View::UpdateWholeModel");
}

void ViewImpl::UnregisterModel(void*, const char*) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    if (RequireDocument()) LogUnavailable("View::UnregisterModel");
}

void ViewImpl::CreateModel(const char* name, void* model, const char*, void (*)(Binder*, void*)) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    if (!RequireDocument()) return;
    // The lowest bit of a model's address is a mark of the data binding.
    if (reinterpret_cast<uintptr_t>(model) & 1) {
        String text("Can't register the model \"");
        text.append(name ? name : "");
        text.append(
            "\" because the given model's pointer is odd aligned. Make sure that the model's pointer is even "
            "aligned.");
        AssertFailure(text);
        return;
    }
    LogUnavailable("View::CreateModel");
}

void ViewImpl::RaiseBoundEvent(const char*) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    LogUnavailable("View::RaiseBoundEvent");
}

}  // namespace qorvex
