#include "display/render_caches.h"

namespace qorvex::dsp {

void DirtyHistory::Push(List&& rects) {
    if (lists_.size() == kFrames) Age();
    lists_.push_back(std::move(rects));
}

void DirtyHistory::Age() {
    if (!lists_.empty()) lists_.erase(lists_.begin());
}

void RenderCaches::ForgetResources() {
    shadows.Forget();
    paths.Clear();
    scratch.Forget();
    highlighted.Clear();
}

}  // namespace qorvex::dsp
