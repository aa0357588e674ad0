// The document's side of the layout tree.
#include "dom/dom_fixture.h"
#include "layout/layout_update.h"

namespace qorvex::dom::test {

using layout::LayoutWork;
using qsl::RefPtr;

class LayoutMarksTest : public DomTest {
  protected:
    static void SetDisplay(Element& element, css::CSSDisplay display) {
        element.GetStyle().Mutable<css::LayoutStyle>().display = display;
    }
    // Ids and texts of the layout tree below a handle.
    static std::string Boxes(const layout::LayoutHandle& handle) {
        std::string text(handle.data().node->DebugName());
        if (handle.data().Children().empty()) return text;
        text += "(";
        for (const auto& child : handle.data().Children()) {
            if (text.back() != '(') text += " ";
            text += Boxes(*child);
        }
        return text + ")";
    }
    std::string BodyBoxes() { return Boxes(*Body().GetLayoutHandle()); }
    LayoutWork Update() { return document_->UpdateLayoutStyles(false); }
    void Attach(Node& top) {
        for (Node* node = &top; node; node = node->GetNextInTree(&top))
            document_->AttachLayoutNode(*node);
    }
};

TEST_F(LayoutMarksTest, TheFirstQueryBuildsTheTree) {
    Load("<div id=a>x</div><p id=b><i>y</i></p>");
    SetDisplay(Find("b"), css::CSSDisplay::None);
    Body().AppendChild(document_->CreateComment("none"));
    EXPECT_EQ(Update(), LayoutWork::Layout);
    EXPECT_EQ(BodyBoxes(), "BODY(DIV(#text))");
    EXPECT_EQ(Update(), LayoutWork::None);
    EXPECT_TRUE(Find("a").Is(kInLayoutTree));
    EXPECT_FALSE(Find("b").Is(kInLayoutTree));
    EXPECT_EQ(Find("b").GetLayoutResult(), nullptr);
}

TEST_F(LayoutMarksTest, NodesTakeTheirPlaceAmongThoseWithBoxes) {
    Load("<i id=a></i><b id=none></b><u id=c></u>");
    SetDisplay(Find("none"), css::CSSDisplay::None);
    Update();
    RefPtr<Element> p = Make("p");
    Body().InsertBefore(p, &Find("c"));
    Attach(*p);
    RefPtr<Element> q = Make("q");
    Body().InsertBefore(q, Body().GetFirstChild());
    Attach(*q);
    EXPECT_EQ(BodyBoxes(), "BODY(Q I P U)");
    Body().RemoveChild(p.get());
    EXPECT_EQ(BodyBoxes(), "BODY(Q I U)");
    EXPECT_EQ(p->GetLayoutHandle(), nullptr);
    // Off and on again, with what is below.
    Find("c").AppendChild(Make("s"));
    Attach(Find("c"));
    document_->DetachLayoutNode(Find("c"));
    EXPECT_EQ(BodyBoxes(), "BODY(Q I)");
    EXPECT_FALSE(document_->AttachLayoutNode(*Find("c").GetFirstChild()));
    Attach(Find("c"));
    EXPECT_EQ(BodyBoxes(), "BODY(Q I U(S))");
}

TEST_F(LayoutMarksTest, TheLowestCodeWins) {
    Load("<p id=a>x</p><p id=b></p>");
    Update();
    document_->QueueVisualChange(Find("a"));
    EXPECT_EQ(Update(), LayoutWork::VisualStyle);
    document_->QueueVisualChange(Find("a"));
    document_->QueueTransformChange(Find("b"));
    EXPECT_EQ(Update(), LayoutWork::Transforms);
    document_->NoteStyleChange(Find("a"), kChangeSolved | kChangeLayout | kChangeTransform | kChangeVisual);
    EXPECT_EQ(Update(), LayoutWork::Layout);
    EXPECT_EQ(document_->UpdateLayoutStyles(true), LayoutWork::Layout);
    // A changed node that leaves is forgotten.
    RefPtr<Node> a(&Find("a"));
    document_->QueueLayoutChange(*a);
    Body().RemoveChild(a.get());
    a = nullptr;
    EXPECT_EQ(Update(), LayoutWork::Layout);  // of the body, which lost a child
    EXPECT_EQ(Update(), LayoutWork::None);
}

TEST_F(LayoutMarksTest, CommitCarriesWhatChangedAndNoMore) {
    Load("<p id=a>x</p><p id=b></p>");
    document_->SolveStyles();
    Update();
    auto first = MakeRef<layout::LayoutUpdateData>();
    document_->CommitLayout(*first, nullptr, nullptr);
    EXPECT_EQ(first->changed.Size(), 6u);  // html, head, body, two paragraphs, one text
    static_cast<Text*>(Find("a").GetFirstChild())->SetData("y");
    EXPECT_EQ(Update(), LayoutWork::Layout);
    auto second = MakeRef<layout::LayoutUpdateData>();
    document_->CommitLayout(*second, nullptr, nullptr);
    EXPECT_EQ(second->changed.Size(), 1u);
}

TEST_F(LayoutMarksTest, ScrollPositionsAreClamped) {
    Load("<p id=a>x</p>");
    Update();
    Find("a").SetScrollTop(50);
    EXPECT_EQ(Find("a").GetScrollTop(), 0);  // nothing to scroll
    Find("a").SetScrollTop(NAN);
    EXPECT_EQ(Find("a").GetScrollTop(), 0);
    RefPtr<Element> detached = Make("p");
    detached->SetScrollLeft(7);
    EXPECT_EQ(detached->GetScrollLeft(), 7);
}

}  // namespace qorvex::dom::test
