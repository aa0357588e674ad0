#include "layout/geometry.h"

#include <algorithm>
#include <limits>

namespace qorvex::layout {

bool Near(const Rect& a, const Rect& b) {
    return Near(a.x, b.x) && Near(a.y, b.y) && Near(a.width, b.width) && Near(a.height, b.height);
}

bool IsFinite(const Rect& rect) {
    return std::isfinite(rect.x) && std::isfinite(rect.y) && std::isfinite(rect.width) &&
           std::isfinite(rect.height);
}

Rect Inset(const Rect& rect, const Edges& edges) {
    return {rect.x + edges.left, rect.y + edges.top, rect.z,
            std::max(rect.width - edges.left - edges.right, 0.0f),
            std::max(rect.height - edges.top - edges.bottom, 0.0f)};
}

bool Near(const Matrix& a, const Matrix& b) {
    for (int i = 0; i < 16; ++i) {
        if (!(std::fabs(a.m[i] - b.m[i]) <= kMatrixTolerance)) return false;
    }
    return true;
}

bool IsFlat(const Matrix& m) {
    return m.m[2] == 0 && m.m[3] == 0 && m.m[6] == 0 && m.m[7] == 0 && m.m[8] == 0 && m.m[9] == 0 &&
           m.m[10] == 1 && m.m[11] == 0 && m.m[14] == 0 && m.m[15] == 1;
}

Rect MapBoundsInSpace(const Matrix& m, const Rect& rect) {
    const float corners[4][2] = {
        {rect.x, rect.y}, {Right(rect), rect.y}, {Right(rect), Bottom(rect)}, {rect.x, Bottom(rect)}};
    constexpr float kHuge = 1e9f;
    // Points nearer to the eye than this project so far away that only the direction counts.
    constexpr float kNearEye = 1e-4f;
    float low[2] = {kHuge, kHuge};
    float high[2] = {-kHuge, -kHuge};
    float mapped[4][3];
    bool any = false;
    for (int i = 0; i < 4; ++i) {
        const float x = corners[i][0], y = corners[i][1];
        mapped[i][0] = m.m[0] * x + m.m[4] * y + m.m[8] * rect.z + m.m[12];
        mapped[i][1] = m.m[1] * x + m.m[5] * y + m.m[9] * rect.z + m.m[13];
        mapped[i][2] = m.m[3] * x + m.m[7] * y + m.m[11] * rect.z + m.m[15];
    }
    auto take = [&](float x, float y, float w) {
        const float point[2] = {x / w, y / w};
        for (int axis = 0; axis < 2; ++axis) {
            low[axis] = std::min(low[axis], point[axis]);
            high[axis] = std::max(high[axis], point[axis]);
        }
        any = any || (std::isfinite(point[0]) && std::isfinite(point[1]));
    };
    for (int i = 0; i < 4; ++i) {
        const float* a = mapped[i];
        const float* b = mapped[(i + 1) % 4];
        if (a[2] > kNearEye) take(a[0], a[1], a[2]);
        // An edge through the plane of the eye: take the point just in front of it.
        if ((a[2] > kNearEye) != (b[2] > kNearEye)) {
            const float t = (kNearEye - a[2]) / (b[2] - a[2]);
            take(a[0] + t * (b[0] - a[0]), a[1] + t * (b[1] - a[1]), kNearEye);
        }
    }
    if (!any) return {};
    const Rect bounds{low[0], low[1], 0, high[0] - low[0], high[1] - low[1]};
    return IsFinite(bounds) ? bounds : Rect{};
}

bool Invert(const Matrix& m, Matrix& out) {
    // Gauss-Jordan with partial pivoting; only used where a pointer or a surface goes back through a
    // transform.
    double a[4][8] = {};
    for (int row = 0; row < 4; ++row) {
        for (int column = 0; column < 4; ++column)
            a[row][column] = m.m[column * 4 + row];
        a[row][4 + row] = 1;
    }
    for (int column = 0; column < 4; ++column) {
        int pivot = column;
        for (int row = column + 1; row < 4; ++row) {
            if (std::fabs(a[row][column]) > std::fabs(a[pivot][column])) pivot = row;
        }
        if (!(std::fabs(a[pivot][column]) > 1e-12)) return false;
        std::swap(a[pivot], a[column]);
        const double scale = 1 / a[column][column];
        for (double& value : a[column])
            value *= scale;
        for (int row = 0; row < 4; ++row) {
            const double factor = row == column ? 0 : a[row][column];
            for (int k = 0; k < 8 && factor != 0; ++k)
                a[row][k] -= factor * a[column][k];
        }
    }
    for (int row = 0; row < 4; ++row) {
        for (int column = 0; column < 4; ++column)
            out.m[column * 4 + row] = static_cast<float>(a[row][4 + column]);
    }
    return true;
}

}  // namespace qorvex::layout
