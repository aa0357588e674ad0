// One picture of everything, for eyes and for captures.
#include <cmath>

#include <gtest/gtest.h>
#include "canvas.h"

namespace fresco::test {
namespace {

constexpr char kSans[] = "/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf";

void Text(CommandBuffer* b, IFont* font, const char* text, float x, float y, float size, Paint paint) {
    TextPaint t;
    t.font = font->GetId(), t.size = size, t.x = x, t.y = y, t.paint = paint;
    b->FillString(text, std::strlen(text), t);
}

}  // namespace

TEST(Picture, ShowsEveryKindOfDraw) {
    Canvas canvas(640, 480);
    const FontId id = canvas.LoadFont(kSans);
    if (id == kNoId) GTEST_SKIP() << "no DejaVu Sans on this machine";
    IFont* font = canvas.library->GetFontService()->GetFont(id);
    CommandBuffer* b = Library::CreateBuffer(0, 0);
    b->FillRect({0, 0, 0, 640, 480}, Solid(1, 1, 1));
    Text(b, font, "Fresco draws text at 12 px, AVAWA fi.", 10, 20, 12, Solid(0, 0, 0));
    Text(b, font, "Sixteen pixels: Hamburgefonstiv", 10, 44, 16, Solid(0.1f, 0.2f, 0.5f));
    Text(b, font, "Large 40", 10, 90, 40, Solid(0.7f, 0.1f, 0.1f));
    b->FillRoundedRect({20, 110, 0, 120, 60}, {{10, 10}, {30, 30}, {5, 20}, {0, 0}}, Solid(0.2f, 0.6f, 0.3f));
    Paint line = Solid(0, 0, 0);
    line.strokeWidth = 3;
    b->StrokeRoundedRect({160, 110, 0, 100, 60}, {{20, 20}, {20, 20}, {20, 20}, {20, 20}}, line);
    b->FillCircle(310, 140, 0, 30, Solid(0.9f, 0.6f, 0.1f));
    b->StrokeEllipse(390, 140, 0, 40, 25, line);
    const GradientStop stops[] = {{0, {1, 0, 0, 1}}, {0.5f, {1, 1, 0, 1}}, {1, {0, 0, 1, 1}}};
    b->FillLinearGradient({20, 190, 0, 200, 50}, Paint{}, stops, 3, {{0, 0}, {1, 0}});
    b->FillRadialGradient({240, 190, 0, 100, 50}, Paint{}, stops, 3, {{0.5f, 0.25f}, {0.5f, 0.25f}});
    Path* star = Path::Create();
    for (int i = 0; i < 5; ++i) {
        const float a = float(i) * 2.51327f - 1.5708f, x = 400 + 40 * std::cos(a), y = 220 + 40 * std::sin(a);
        i ? star->LineTo(x, y) : star->MoveTo(x, y);
    }
    star->Close();
    star->SetFillRule(kFillEvenOdd);
    b->FillPath(*star, Solid(0.5f, 0, 0.5f));
    b->StrokePath(*star, line, 0);
    star->Release();
    // A blurred card, a group at half opacity, a turned box, and one in perspective.
    FilterRecord blur{uint32_t(FilterKind::DropShadow), {4, 6, 5, 0, 0, 0, 0.6f}};
    Effect* filter = GetEffectFactory()->CreateFilter(&blur, 1);
    CommandBuffer* layer = b->BeginLayerWithEffects(kLayerContent, MakeLayerPaint(1), &filter, 1);
    layer->FillRoundedRect({40, 270, 0, 120, 70}, {{12, 12}, {12, 12}, {12, 12}, {12, 12}}, Solid(1, 1, 1));
    b = layer->EndLayer();
    filter->Release();
    b->BeginLayer(kLayerContent, MakeLayerPaint(0.5f));
    b->FillRect({200, 270, 0, 60, 60}, Solid(1, 0, 0));
    b->FillRect({230, 290, 0, 60, 60}, Solid(0, 0, 1));
    b->EndLayer();
    b->PushState(kStateTransform);
    b->Translate(360, 310);
    b->Rotate(0.4f);
    b->FillRect({-30, -30, 0, 60, 60}, Solid(0, 0.6f, 0.6f));
    Text(b, font, "turned", -24, 4, 14, Solid(1, 1, 1));
    b->PopState();
    b->PushState(kStateTransform);
    Matrix4 perspective, turn;
    perspective.m[11] = -1.0f / 200;
    turn.m[0] = std::cos(0.9f), turn.m[2] = -std::sin(0.9f), turn.m[8] = std::sin(0.9f),
    turn.m[10] = std::cos(0.9f);
    b->Translate(500, 310);
    b->MultiplyTransform(perspective);
    b->MultiplyTransform(turn);
    b->FillLinearGradient({-50, -50, 0, 100, 100}, Paint{}, stops, 3, {{0, 0}, {1, 1}});
    Text(b, font, "depth", -40, 10, 28, Solid(1, 1, 1));
    b->PopState();
    b->PushState(kStateAll);
    b->ClipEllipse(100, 410, 80, 40, kClipIntersect);
    for (int i = 0; i < 20; ++i)
        b->FillRect({float(i) * 10, 360, 0, 5, 100}, Solid(0.2f, 0.2f, 0.9f));
    b->PopState();
    line.strokeWidth = 10, line.lineJoin = kJoinRound, line.lineCap = kCapRound;
    Path* zig = Path::Create();
    zig->MoveTo(220, 440), zig->LineTo(250, 380), zig->LineTo(280, 440),
        zig->BezierCurveTo(300, 340, 340, 480, 360, 380);
    b->StrokePath(*zig, line, 0);
    zig->Release();
    canvas.Draw(b);
    canvas.Save("picture");
    EXPECT_EQ(canvas.At(310, 140), (Pixel{230, 153, 26, 255}));
    EXPECT_EQ(canvas.At(630, 470), (Pixel{255, 255, 255, 255}));
    EXPECT_TRUE(canvas.log.lines.empty()) << canvas.log.lines[0];
}

}  // namespace fresco::test
