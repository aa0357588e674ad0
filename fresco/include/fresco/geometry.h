// Plain geometry records. Units are pixels of the buffer before its transform, y grows downward.
#pragma once
#include <cstdint>

namespace fresco {

struct Point {
    float x = 0, y = 0;
};

struct Point3 {
    float x = 0, y = 0, z = 0;
};

struct Size {
    float width = 0, height = 0;
};

// `z` is the depth of the plane in which the rectangle lies; draws in a flat buffer leave it 0.
struct Rect {
    float x = 0, y = 0, z = 0, width = 0, height = 0;
};

// Corner radii, each with its own x and y. They are used as given: the caller shrinks radii that do not fit.
struct CornerRadii {
    Point topLeft, topRight, bottomRight, bottomLeft;
};

struct IntRect {
    int32_t x = 0, y = 0, width = 0, height = 0;
};

// Column vectors, stored by columns: element (row, column) is m[column * 4 + row], which is the argument
// order of CSS `matrix3d()`. A product a * b applies b first.
struct Matrix4 {
    float m[16] = {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1};
};

inline Matrix4 operator*(const Matrix4& a, const Matrix4& b) {
    Matrix4 product;
    for (int column = 0; column < 4; ++column) {
        for (int row = 0; row < 4; ++row) {
            float sum = 0;
            for (int k = 0; k < 4; ++k)
                sum += a.m[k * 4 + row] * b.m[column * 4 + k];
            product.m[column * 4 + row] = sum;
        }
    }
    return product;
}

inline Matrix4 TranslationMatrix(float x, float y, float z = 0) {
    Matrix4 matrix;
    matrix.m[12] = x;
    matrix.m[13] = y;
    matrix.m[14] = z;
    return matrix;
}

inline Matrix4 ScaleMatrix(float x, float y, float z = 1) {
    Matrix4 matrix;
    matrix.m[0] = x;
    matrix.m[5] = y;
    matrix.m[10] = z;
    return matrix;
}

// CSS `matrix(a, b, c, d, e, f)`.
inline Matrix4 AffineMatrix(float a, float b, float c, float d, float e, float f) {
    Matrix4 matrix;
    matrix.m[0] = a;
    matrix.m[1] = b;
    matrix.m[4] = c;
    matrix.m[5] = d;
    matrix.m[12] = e;
    matrix.m[13] = f;
    return matrix;
}

// Drops what concerns depth: the z column and the z row become those of the identity.
inline Matrix4 Flattened(Matrix4 matrix) {
    for (int i = 0; i < 4; ++i)
        matrix.m[8 + i] = matrix.m[i * 4 + 2] = i == 2 ? 1.0f : 0.0f;
    return matrix;
}

}  // namespace fresco
