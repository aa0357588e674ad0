// Input of a view. Routing comes with a later build; until then each operation says so.
#include "core/api_call.h"
#include "core/unavailable.h"
#include "core/view_impl.h"

namespace qorvex {

namespace {

void WarnAboutHandled(const bool* handled) {
    if (handled)
        LogWarning(
            "The 'handled' parameter is deprecated! Read the documentation for more details on how to use "
            "the "
            "'userData' parameter for event handling information.");
}

}  // namespace

void ViewImpl::TouchEvent(const TouchEventData*, unsigned, bool* handled, void*) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    WarnAboutHandled(handled);
    LogUnavailable("View::TouchEvent");
}

void ViewImpl::GestureEvent(const GestureEventData&, bool* handled) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    WarnAboutHandled(handled);
    LogUnavailable("View::GestureEvent");
}

void ViewImpl::MouseEvent(const MouseEventData&, bool* handled, void*) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    WarnAboutHandled(handled);
    LogUnavailable("View::MouseEvent");
}

void ViewImpl::KeyEvent(const KeyEventData&, bool* handled, void*) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    WarnAboutHandled(handled);
    LogUnavailable("View::KeyEvent");
}

bool ViewImpl::IMESetComposition(const char*) {
    const APICall call(family_, api_depth_);
    if (!call) return false;
    LogUnavailable("View::IMESetComposition");
    return false;
}

bool ViewImpl::IMEConfirmComposition(const char*) {
    const APICall call(family_, api_depth_);
    if (!call) return false;
    LogUnavailable("View::IMEConfirmComposition");
    return false;
}

bool ViewImpl::IMECancelComposition() {
    const APICall call(family_, api_depth_);
    if (!call) return false;
    LogUnavailable("View::IMECancelComposition");
    return false;
}

}  // namespace qorvex
