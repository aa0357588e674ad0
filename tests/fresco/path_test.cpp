// Path commands against known geometry, and the recorder's bookkeeping.
#include <cmath>

#include <gtest/gtest.h>
#include "canvas.h"

namespace fresco::test {

TEST(Path, ArcsEndWhereTheyShould) {
    Path* path = Path::Create();
    path->MoveTo(0, 0);
    path->ArcTo(10, 0, 10, 10, 4);
    const Point* end = path->GetPoints() + path->GetPointCount() - 1;
    EXPECT_NEAR(end->x, 10, 1e-4);
    EXPECT_NEAR(end->y, 4, 1e-4);
    path->Reset();
    path->MoveTo(0, 0);
    path->SvgArcTo(5, 5, 0, false, true, 10, 0);
    // A half circle over the top: y grows downward, so sweep 1 goes through (5, -5).
    float top = 0;
    for (size_t i = 0; i < path->GetPointCount(); ++i)
        top = std::min(top, path->GetPoints()[i].y);
    EXPECT_NEAR(top, -5, 0.01);
    path->Reset();
    path->Arc(50, 50, 10, 0, 6.2831853f, false);
    const Rect bounds = path->GetBounds();
    EXPECT_NEAR(bounds.width, 20, 0.2);
    EXPECT_NEAR(bounds.x, 40, 0.1);
    path->Release();
}

TEST(Path, EqualPathsHashAlikeAndBadNumbersAreIgnored) {
    Path *a = Path::Create(), *b = Path::Create();
    for (Path* p : {a, b})
        p->MoveTo(1, 2), p->LineTo(3, 4), p->Close();
    EXPECT_TRUE(a->Equals(*b));
    EXPECT_EQ(a->GetHash(), b->GetHash());
    b->LineTo(NAN, 1);
    b->BezierCurveTo(0, 0, INFINITY, 0, 0, 0);
    EXPECT_TRUE(a->Equals(*b));
    b->SetFillRule(kFillEvenOdd);
    EXPECT_FALSE(a->Equals(*b));
    EXPECT_NE(a->GetHash(), b->GetHash());
    a->LineTo(5, 5);  // after a Close the next contour begins at the old start
    EXPECT_EQ(a->GetVerbs()[3], PathVerb::Move);
    EXPECT_EQ(a->GetPoints()[2].x, 1);
    AnimatedPath* animated = AnimatedPath::Create();
    animated->SetPath(*b);
    const Point moved{7, 7};
    EXPECT_TRUE(animated->SetPoints(1, &moved, 1));
    EXPECT_FALSE(animated->SetPoints(2, &moved, 1));
    EXPECT_EQ(animated->GetPath().GetPoints()[1].x, 7);
    animated->Release();
    a->Release();
    b->Release();
}

TEST(Recorder, FollowsTransformsAndForgivesUnevenStates) {
    Canvas canvas;
    CommandBuffer* b = Library::CreateBuffer(0, 0);
    b->Translate(10, 20);
    b->PushState(kStateTransform);
    b->Scale(2, 2);
    b->PushState(kStateClip);
    b->Rotate(1);
    b->PopState();
    Matrix4 m;
    b->GetTransform(&m);
    EXPECT_NE(m.m[1], 0);  // a clip state leaves the transform alone
    b->PopState();
    b->GetTransform(&m);
    EXPECT_EQ(m.m[0], 1);
    b->BeginLayer(kLayerContent, MakeLayerPaint(1));
    b->PushState(kStateAll);
    b->Translate(5, 5);
    EXPECT_EQ(static_cast<const Matrix4*>(b->Query(kQueryLocalMatrix))->m[12], 5);
    b->EndLayer();  // the state inside goes with it
    b->PopState();
    b->EndLayer();
    EXPECT_EQ(canvas.log.lines.size(), 2u);  // one state too many, one layer too many
    const float scale[2] = {2, 3};
    b->Annotate(kAnnotateScale, scale);
    EXPECT_EQ(static_cast<const float*>(b->Query(kQueryRenderScale))[1], 3);
    canvas.Draw(b);
}

TEST(Recorder, SteadyStateTakesNoMemory) {
    Canvas canvas;
    const auto frame = [&] {
        CommandBuffer* b = Library::CreateBuffer(0x3000, 0);
        for (int i = 0; i < 100; ++i) {
            b->PushState(kStateAll);
            b->FillRoundedRect({float(i), 0, 0, 10, 10}, {{2, 2}, {2, 2}, {2, 2}, {2, 2}}, Solid(1, 0, 0));
            b->BeginLayer(kLayerContent, MakeLayerPaint(0.5f));
            b->FillRect({0, 0, 0, 5, 5}, Solid(0, 1, 0));
            b->EndLayer();
            b->PopState();
        }
        canvas.Draw(b);
    };
    frame();
    frame();
    const long before = canvas.allocator.total;
    frame();
    EXPECT_EQ(canvas.allocator.total, before);
}

}  // namespace fresco::test
