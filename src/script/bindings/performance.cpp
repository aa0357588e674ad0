#include "script/bindings/performance.h"

#include "core/logging/log.h"
#include "script/bindings/bound_classes.h"
#include "script/bindings/window.h"
#include "script/bindings/window_host.h"
#include "script/member_callbacks.h"

namespace qorvex::dom {

double Performance::Now() const {
    if (window_) return window_->host().GetTime();
    AssertFailure("Unable to retrieve time for performance.now()!");
    return 0;
}

Document* Performance::GetEventTargetDocument() const {
    return window_ ? window_->GetEventTargetDocument() : nullptr;
}

}  // namespace qorvex::dom

namespace qorvex::script {

namespace {
constexpr MethodDescription kMethods[] = {Binding<dom::Performance>::Method<"now", &dom::Performance::Now>()};
}
const ClassDescription kPerformanceClass = {.script_class = ScriptClass::Performance, .methods = kMethods};

}  // namespace qorvex::script
