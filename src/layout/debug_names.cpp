#include "layout/debug_names.h"

namespace qorvex::layout {

std::string_view DebugNames::Find(const LayoutHandle* handle) const {
    const Name* name = names_.get(handle);
    return name != nullptr ? std::string_view(name->view()) : std::string_view();
}

}  // namespace qorvex::layout
