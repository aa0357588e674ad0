#include "dom/attr.h"
#include "dom/dom_fixture.h"
#include "dom/element_proxy.h"
#include "dom/node_list.h"

namespace qorvex::dom::test {

using qsl::RefPtr;

using AttributeTest = DomTest;

TEST_F(AttributeTest, AttrObjectsAreFreshAndWriteThrough) {
    Load("<p id=a title=t></p>");
    RefPtr<Element> p(&Find("a"));
    RefPtr<NamedNodeMap> map = p->GetAttributes();
    ASSERT_EQ(map->GetLength(), 2u);
    RefPtr<Attr> title(map->GetItem(1));
    EXPECT_NE(p->GetAttributes()->GetItem(1), title.get());
    title->SetValue("new");
    EXPECT_EQ(p->GetAttribute("title")->view(), "new");
    p->SetAttribute("title", "newer");
    EXPECT_EQ(title->GetValue(), "newer");
    Body().RemoveChild(p.get());
    p = nullptr;
    EXPECT_EQ(title->GetOwnerElement(), nullptr);
    EXPECT_EQ(title->GetValue(), "newer");
}

// Atoms stay for good, and a page may write and read another style in each frame.
TEST_F(AttributeTest, ReadingATextThatIsMadeOfPartsInternsNothing) {
    Load("<p id=a class='x y' title=t></p>");
    Element& p = Find("a");
    p.SetAttribute("style", "width: 31px");
    const size_t before = host_->strings.size();
    NodeText room;
    EXPECT_NE(p.GetAttributeText("style", room)->find("31px"), std::string_view::npos);
    EXPECT_EQ(p.GetAttributeText("class", room), "x y");
    EXPECT_EQ(p.GetAttributeText("title", room), "t");
    EXPECT_EQ(p.GetAttributeText("lang", room), std::nullopt);
    EXPECT_TRUE(p.HasAttribute("style"));
    EXPECT_EQ(p.GetAttributeNode("class")->GetValue(), "x y");
    p.RemoveAttribute("style");
    EXPECT_FALSE(p.HasAttribute("style"));
    EXPECT_EQ(host_->strings.size(), before);
}

TEST_F(AttributeTest, MarksOnlyWhatSelectorsLookAt) {
    Load("<p id=a></p><p id=b></p>");
    document_->SolveStyles();
    Element& a = Find("a");
    a.SetAttribute("title", "x");
    a.SetAttribute("data-other", "x");
    EXPECT_TRUE(document_->GetSelectorDirtyElements().empty());
    a.SetAttribute("watched", "x");
    EXPECT_TRUE(document_->GetSelectorDirtyElements().contains(&a));
    document_->SolveStyles();
    a.SetAttribute("data-watched", "x");
    EXPECT_EQ(document_->GetStyleDirtyNodes().size(), 1u);
}

TEST_F(AttributeTest, CombinatorsDirtySubtreesAndLaterSiblings) {
    Load("<div id=a><p id=a1></p></div><div id=b><p id=b1></p></div><div id=c></div>");
    document_->SolveStyles();
    const auto dirty = [&] {
        std::string ids;
        document_->ForEachElement([&](Element& element) {
            if (document_->GetSelectorDirtyElements().contains(&element))
                ids += std::string(element.GetId().view());
        });
        document_->SolveStyles();
        return ids;
    };
    Find("b").AddClass("1");
    EXPECT_EQ(dirty(), "b");
    style_->subtree_rules = 1;
    Find("a").AddClass("1");
    EXPECT_EQ(dirty(), "aa1");
    style_->sibling_rules = 1;
    Find("b").AddClass("2");
    EXPECT_EQ(dirty(), "bb1c");
    // A subtree that arrives is dirty as a whole, one that leaves not at all.
    RefPtr<Node> b(&Find("b"));
    Body().RemoveChild(b.get());
    EXPECT_EQ(document_->GetSelectorDirtyElements().contains(b.get()), false);
    document_->SolveStyles();
    style_->subtree_rules = style_->sibling_rules = 0;
    Body().AppendChild(b);
    EXPECT_EQ(dirty(), "bb1");
    // Whoever stands behind an arrival may be selected by it.
    Body().InsertBefore(Make("div", "n"), &Find("c"));
    EXPECT_EQ(dirty(), "n");
    style_->subtree_rules = style_->sibling_rules = 1;
    Body().InsertBefore(Make("div", "m"), &Find("c"));
    EXPECT_EQ(dirty(), "mcbb1");
}

TEST_F(AttributeTest, TheClientsProxyCutsTextsToItsBuffers) {
    Load("<p id=a class='x y' title=long-text data-k=v>text</p>");
    const ElementProxy proxy(Find("a"));
    char buffer[5] = {};
    EXPECT_EQ(proxy.GetAttribute("title", buffer, sizeof buffer), 9u);
    EXPECT_STREQ(buffer, "long");
    EXPECT_EQ(proxy.GetAttributeAt(3, buffer, sizeof buffer), 1u);
    EXPECT_STREQ(buffer, "v");
    EXPECT_EQ(proxy.GetAttributeAt(4, buffer, sizeof buffer), 0u);
    EXPECT_STREQ(buffer, "");
    EXPECT_EQ(proxy.GetTextContent(nullptr, 0), 4u);
    EXPECT_STREQ(proxy.GetTag(), "P");
    EXPECT_STREQ(proxy.GetClass(1), "y");
    EXPECT_STREQ(proxy.GetClass(2), "");
    EXPECT_EQ(proxy.GetAttributeCount(), 4u);
}

}  // namespace qorvex::dom::test
