// How handles come to life: with one native reference, which the returned pointer owns.
#pragma once

#include <utility>

#include "qsl/ref_ptr.h"

namespace qorvex::script {

template <class T, class... Arguments>
[[nodiscard]] qsl::RefPtr<T> MakeHandle(Arguments&&... arguments) {
    return qsl::AdoptRef(new T(std::forward<Arguments>(arguments)...));
}

}  // namespace qorvex::script
