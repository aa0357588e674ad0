#include "layout/layout_handle.h"

#include <algorithm>
#include <bit>

namespace qorvex::layout {

namespace {

bool Same(const Edges& a, const Edges& b) {
    return a.left == b.left && a.right == b.right && a.top == b.top && a.bottom == b.bottom;
}
bool Same(const BoxEdges& a, const BoxEdges& b) {
    return Same(a.border, b.border) && Same(a.padding, b.padding) && Same(a.margin, b.margin);
}
bool Same(const Matrix& a, const Matrix& b) {
    return std::equal(a.m, a.m + 16, b.m);
}

}  // namespace

void SharedEdges::Set(const BoxEdges& edges, EdgesCache& cache) {
    if (Same(edges, Get())) return;
    if (Same(edges, kNone)) return record_.reset();
    const float sum =
        edges.border.top + 3 * edges.padding.top + 5 * edges.margin.top + 7 * edges.padding.left;
    EdgesPtr& place = cache[std::bit_cast<uint32_t>(sum) * 0x9E3779B1u >> 28];
    if (!place || !Same(place->value, edges)) place = MakeRef<SharedRecord<BoxEdges>>(edges);
    record_ = place;
}

bool WorldMatrix::Share(const WorldMatrix& other) {
    if (record_ == other.record_) return false;
    record_ = other.record_;
    owns_ = false;
    return true;
}

bool WorldMatrix::Set(const Matrix& matrix) {
    if (Same(Get(), matrix)) return false;
    if (owns_) {
        record_->value = matrix;
    } else {
        record_ = MakeRef<SharedRecord<Matrix>>(matrix);
        owns_ = true;
    }
    return true;
}

}  // namespace qorvex::layout
