#include "layout/layout_handle.h"

#include <algorithm>

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

void SharedEdges::Set(const BoxEdges& edges) {
    if (Same(edges, Get())) return;
    record_ = Same(edges, kNone) ? nullptr : MakeRef<SharedRecord<BoxEdges>>(edges);
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
