#include "display/local_transform.h"

#include "css/values/style_groups.h"

#include <cmath>

namespace qorvex::dsp {

using css::LengthContext;
using css::ResolveLength;
using css::TransformKind;
using css::TransformOperation;
using fresco::TranslationMatrix;
using layout::LayoutNode;
using layout::Matrix;
using layout::Rect;

namespace {

constexpr float kRadiansPerDegree = 0.017453292f;

Matrix RotationAround(float x, float y, float z, float degrees) {
    const float length = std::sqrt(x * x + y * y + z * z);
    Matrix result;
    // An axis without direction rotates nothing (CSS Transforms 2, 13.1).
    if (!(length > 0)) return result;
    x /= length, y /= length, z /= length;
    const float s = std::sin(degrees * kRadiansPerDegree);
    const float c = std::cos(degrees * kRadiansPerDegree);
    const float t = 1 - c;
    const float rows[3][3] = {{t * x * x + c, t * x * y - s * z, t * x * z + s * y},
                              {t * x * y + s * z, t * y * y + c, t * y * z - s * x},
                              {t * x * z - s * y, t * y * z + s * x, t * z * z + c}};
    for (int row = 0; row < 3; ++row) {
        for (int column = 0; column < 3; ++column)
            result.m[column * 4 + row] = rows[row][column];
    }
    return result;
}

Matrix StepMatrix(const TransformOperation& step, const Rect& box, const LengthContext& lengths) {
    const float* n = step.numbers;
    auto x = [&](int i) { return ResolveLength(step.lengths[i], lengths, box.width); };
    auto y = [&](int i) { return ResolveLength(step.lengths[i], lengths, box.height); };
    auto z = [&](int i) { return ResolveLength(step.lengths[i], lengths); };
    Matrix result;
    switch (step.kind) {
        case TransformKind::TranslateX:
            return TranslationMatrix(x(0), 0);
        case TransformKind::TranslateY:
            return TranslationMatrix(0, y(0));
        case TransformKind::TranslateZ:
            return TranslationMatrix(0, 0, z(0));
        case TransformKind::Translate3d:
            return TranslationMatrix(x(0), y(1), z(2));
        case TransformKind::RotateX:
            return RotationAround(1, 0, 0, n[0]);
        case TransformKind::RotateY:
            return RotationAround(0, 1, 0, n[0]);
        case TransformKind::RotateZ:
            return RotationAround(0, 0, 1, n[0]);
        case TransformKind::Rotate3d:
            return RotationAround(n[0], n[1], n[2], n[3]);
        case TransformKind::Scale3d:
            return fresco::ScaleMatrix(n[0], n[1], n[2]);
        case TransformKind::SkewX:
            result.m[4] = std::tan(n[0] * kRadiansPerDegree);
            return result;
        case TransformKind::SkewY:
            result.m[1] = std::tan(n[0] * kRadiansPerDegree);
            return result;
        case TransformKind::Matrix:
            std::copy(n, n + 16, result.m);
            return result;
    }
    return result;
}

// Keeps the matrix only while it is wanted; true on any difference.
bool Store(UniquePtr<Matrix, MemoryTag::LayoutNodes>& slot, bool wanted, const Matrix& matrix) {
    if (!wanted) {
        if (!slot) return false;
        slot.reset();
        return true;
    }
    if (slot) {
        if (layout::Near(*slot, matrix)) return false;
        *slot = matrix;
        return true;
    }
    slot = MakeUnique<Matrix, MemoryTag::LayoutNodes>(matrix);
    return true;
}

Matrix PerspectiveMatrix(const css::TransformStyle& style, const Rect& box, const LengthContext& lengths,
                         float distance) {
    const float x = box.x + ResolveLength(style.perspectiveOrigin.x, lengths, box.width);
    const float y = box.y + ResolveLength(style.perspectiveOrigin.y, lengths, box.height);
    Matrix projection;
    projection.m[2 * 4 + 3] = -1 / distance;
    return TranslationMatrix(x, y) * projection * TranslationMatrix(-x, -y);
}

}  // namespace

Matrix TransformMatrix(const css::Transform& transform, const Rect& box, const LengthContext& lengths) {
    Matrix result;
    for (const TransformOperation& step : transform.operations)
        result = result * StepMatrix(step, box, lengths);
    return result;
}

bool UpdateLocalMatrices(LayoutNode& node, const Rect& box, const LengthContext& lengths) {
    if (!node.isBox) return false;
    layout::BoxNode& own = node.AsBox();
    const css::TransformStyle& style = *node.style->transform;
    const bool hasPerspective = style.perspective.kind == css::PerspectiveKind::Length;
    if (style.transform.empty() && !hasPerspective && !own.local && !own.perspective) return false;

    Matrix local;
    if (!style.transform.empty()) {
        const float x = box.x + ResolveLength(style.transformOrigin.x, lengths, box.width);
        const float y = box.y + ResolveLength(style.transformOrigin.y, lengths, box.height);
        const float z = ResolveLength(style.transformOrigin.z, lengths);
        local = TranslationMatrix(x, y, z) * TransformMatrix(style.transform, box, lengths) *
                TranslationMatrix(-x, -y, -z);
    }
    const float distance = hasPerspective ? ResolveLength(style.perspective.length, lengths) : 0;
    const bool projects = distance > 0;
    const Matrix perspective = projects ? PerspectiveMatrix(style, box, lengths, distance) : Matrix();
    const bool localChanged = Store(own.local, !style.transform.empty(), local);
    const bool perspectiveChanged = Store(own.perspective, projects, perspective);
    return localChanged || perspectiveChanged;
}

void UpdateStacking(LayoutNode& node) {
    const css::VisualStyle& visual = *node.style->visual;
    const css::TransformStyle& transform = *node.style->transform;
    const bool flexItem =
        node.parent != nullptr && node.parent->node().style->layout->display == css::CSSDisplay::Flex;
    const bool hasZIndex =
        transform.zIndex.kind == css::ZIndexKind::Value && (node.flags.isPositioned || flexItem);
    if (node.isBox) node.AsBox().zIndex = hasZIndex ? transform.zIndex.value : 0;
    node.establishesStackingContext =
        hasZIndex || !transform.transform.empty() ||
        transform.perspective.kind != css::PerspectiveKind::None || visual.opacity.value < 1 ||
        visual.maskImage.kind > css::ImageKind::Initial || !visual.clipPath.IsNone() ||
        !visual.filter.empty() || visual.isolation == css::IsolationType::Isolate ||
        visual.mixBlendMode != css::BlendModeType::Normal || !visual.compositionId.empty() ||
        !visual.customEffectName.empty();
}

}  // namespace qorvex::dsp
