#include "fresco/paths/matrix.h"

namespace fresco {
bool Invert(const Matrix4& matrix, Matrix4* inverse) {
    // Gauss-Jordan with partial pivoting, in double.
    double a[4][8];
    for (int row = 0; row < 4; ++row) {
        for (int column = 0; column < 4; ++column) {
            a[row][column] = matrix.m[column * 4 + row];
            a[row][4 + column] = row == column ? 1 : 0;
        }
    }
    for (int column = 0; column < 4; ++column) {
        int pivot = column;
        for (int row = column + 1; row < 4; ++row) {
            if (std::abs(a[row][column]) > std::abs(a[pivot][column])) pivot = row;
        }
        if (!(std::abs(a[pivot][column]) > 1e-12)) return false;
        for (int k = 0; k < 8; ++k) {
            const double swap = a[column][k];
            a[column][k] = a[pivot][k];
            a[pivot][k] = swap;
        }
        const double scale = 1 / a[column][column];
        for (double& value : a[column])
            value *= scale;
        for (int row = 0; row < 4; ++row) {
            const double factor = a[row][column];
            if (row == column || factor == 0) continue;
            for (int k = 0; k < 8; ++k)
                a[row][k] -= factor * a[column][k];
        }
    }
    for (int row = 0; row < 4; ++row) {
        for (int column = 0; column < 4; ++column) {
            const double value = a[row][4 + column];
            if (!std::isfinite(value)) return false;
            inverse->m[column * 4 + row] = float(value);
        }
    }
    return true;
}

Homography Homography::FromMatrix(const Matrix4& matrix, double z) {
    const float* m = matrix.m;
    Homography h;
    h.xx = m[0], h.xy = m[4], h.x0 = m[12] + z * m[8];
    h.yx = m[1], h.yy = m[5], h.y0 = m[13] + z * m[9];
    h.wx = m[3], h.wy = m[7], h.w0 = m[15] + z * m[11];
    return h;
}

bool Homography::Invert(Homography* inverse) const {
    Homography i;
    i.xx = yy * w0 - y0 * wy, i.xy = x0 * wy - xy * w0, i.x0 = xy * y0 - x0 * yy;
    i.yx = y0 * wx - yx * w0, i.yy = xx * w0 - x0 * wx, i.y0 = x0 * yx - xx * y0;
    i.wx = yx * wy - yy * wx, i.wy = xy * wx - xx * wy, i.w0 = xx * yy - xy * yx;
    const double determinant = xx * i.xx + xy * i.yx + x0 * i.wx;
    if (!std::isfinite(determinant) || std::abs(determinant) < 1e-18) return false;
    const double scale = 1 / determinant;
    for (double* value : {&i.xx, &i.xy, &i.x0, &i.yx, &i.yy, &i.y0, &i.wx, &i.wy, &i.w0})
        *value *= scale;
    if (IsAffine()) i.wx = i.wy = 0, i.w0 = 1;
    *inverse = i;
    return true;
}

Jacobian Homography::At(double x, double y) const {
    if (IsAffine()) return {xx, xy, yx, yy};
    double w = wx * x + wy * y + w0;
    if (std::abs(w) < 1e-6) w = 1e-6;
    const double px = (xx * x + xy * y + x0) / w, py = (yx * x + yy * y + y0) / w;
    return {(xx - px * wx) / w, (xy - px * wy) / w, (yx - py * wx) / w, (yy - py * wy) / w};
}

double Homography::MaxScale(double x, double y) const {
    // The larger singular value of the 2 by 2 derivative.
    const Jacobian j = At(x, y);
    const double e = (j.xx + j.yy) / 2, f = (j.xx - j.yy) / 2, g = (j.yx + j.xy) / 2, h = (j.yx - j.xy) / 2;
    return std::sqrt(e * e + h * h) + std::sqrt(f * f + g * g);
}

Homography operator*(const Homography& a, const Homography& b) {
    Homography p;
    p.xx = a.xx * b.xx + a.xy * b.yx + a.x0 * b.wx;
    p.xy = a.xx * b.xy + a.xy * b.yy + a.x0 * b.wy;
    p.x0 = a.xx * b.x0 + a.xy * b.y0 + a.x0 * b.w0;
    p.yx = a.yx * b.xx + a.yy * b.yx + a.y0 * b.wx;
    p.yy = a.yx * b.xy + a.yy * b.yy + a.y0 * b.wy;
    p.y0 = a.yx * b.x0 + a.yy * b.y0 + a.y0 * b.w0;
    p.wx = a.wx * b.xx + a.wy * b.yx + a.w0 * b.wx;
    p.wy = a.wx * b.xy + a.wy * b.yy + a.w0 * b.wy;
    p.w0 = a.wx * b.x0 + a.wy * b.y0 + a.w0 * b.w0;
    return p;
}

}  // namespace fresco
