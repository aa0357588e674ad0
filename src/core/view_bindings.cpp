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
    APICall call(family_, api_depth_);
    LogUnavailable("View::RegisterForEvent");
    RequireBinder();
    delete handler;
    return nullptr;
}

void ViewImpl::UnregisterFromEvent(IEventHandler*) {
    APICall call(family_, api_depth_);
    LogUnavailable("View::UnregisterFromEvent");
    RequireBinder();
}

IEventHandler* ViewImpl::BindCall(const char*, IEventHandler* handler) {
    APICall call(family_, api_depth_);
    LogUnavailable("View::BindCall");
    RequireBinder();
    delete handler;
    return nullptr;
}

void ViewImpl::UnbindCall(const char*) {
    APICall call(family_, api_depth_);
    LogUnavailable("View::UnbindCall");
    RequireBinder();
}

void ViewImpl::UnregisterAll(void*) {
    APICall call(family_, api_depth_);
    LogUnavailable("View::UnregisterAll");
    RequireBinder();
}

void ViewImpl::SynchronizeModels() {
    APICall call(family_, api_depth_);
    if (RequireDocument()) LogUnavailable("View::SynchronizeModels");
}

void ViewImpl::RegisterTypeBinding(const char*, void (*)(Binder*, void*)) {
    APICall call(family_, api_depth_);
    LogUnavailable("View::RegisterTypeBinding");
}

void ViewImpl::UpdateWholeModel(void*, const char*) {
    APICall call(family_, api_depth_);
    if (RequireDocument()) LogUnavailable("View::UpdateWholeModel");
}

void ViewImpl::UnregisterModel(void*, const char*) {
    APICall call(family_, api_depth_);
    if (RequireDocument()) LogUnavailable("View::UnregisterModel");
}

void ViewImpl::CreateModel(const char* name, void* model, const char*, void (*)(Binder*, void*)) {
    APICall call(family_, api_depth_);
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
    APICall call(family_, api_depth_);
    LogUnavailable("View::RaiseBoundEvent");
}

}  // namespace qorvex
