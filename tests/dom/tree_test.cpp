#include "dom/attr.h"
#include "dom/document_fragment.h"
#include "dom/dom_fixture.h"
#include "dom/observer_hooks.h"

namespace qorvex::dom::test {

using qsl::RefPtr;

using TreeTest = DomTest;

// Mutation records as text: "<target> +added -removed <previous >next".
class Recorder final : public IMutationRegistry {
  public:
    void QueueChildList(Node& target, const ChildListChange& change) override {
        std::string text = Name(&target);
        for (const auto& node : change.added)
            text += " +" + Name(node.get());
        for (const auto& node : change.removed)
            text += " -" + Name(node.get());
        if (change.previous_sibling) text += " <" + Name(change.previous_sibling);
        if (change.next_sibling) text += " >" + Name(change.next_sibling);
        records.push_back(text);
    }
    void QueueAttribute(Element& target, Atom name, std::optional<Atom> old_value) override {
        records.push_back(Name(&target) + "." + std::string(name.view()) + " was " +
                          (old_value ? std::string(old_value->view()) : "absent"));
    }
    void QueueCharacterData(CharacterData&, std::string_view old) override {
        records.push_back("text was " + std::string(old));
    }
    void AddTransientObservers(Node&, Node&) override {}

    std::vector<std::string> records;

  private:
    static std::string Name(const Node* node) {
        if (!node->IsElement()) return std::string(node->GetNodeName().view());
        return std::string(static_cast<const Element*>(node)->GetId().view());
    }
};

TEST_F(TreeTest, WhatIsNoChildIsRefused) {
    Load("<div id=a></div>");
    Element& a = Find("a");
    EXPECT_EQ(a.AppendChild(nullptr), nullptr);
    EXPECT_TRUE(log_.Contains("Trying to insert null child on Node!"));
    a.AppendChild(RefPtr<Node>(document_->CreateAttribute("x")));
    EXPECT_TRUE(log_.Contains("Not valid node type."));
    EXPECT_EQ(BodyShape(), "body(div#a)");
}

TEST_F(TreeTest, RecordsTellThePlaceBeforeTheChange) {
    Load("<body id=body><p id=a></p><p id=b></p><p id=c></p>");
    Recorder recorder;
    document_->mutationRegistry = &recorder;
    document_->mutationObserverKinds = kMutationChildList;
    Body().InsertBefore(Make("p", "n"), &Find("b"));
    Body().RemoveChild(&Find("n"));
    // The new child is the old one's own neighbour and ends in its place.
    Body().ReplaceChild(RefPtr<Node>(&Find("c")), &Find("b"));
    EXPECT_EQ(BodyShape(), "body#body(p#a p#c)");
    Body().ReplaceChild(RefPtr<Node>(&Find("a")), &Find("c"));
    EXPECT_EQ(BodyShape(), "body#body(p#a)");
    RefPtr<DocumentFragment> fragment = document_->CreateDocumentFragment();
    fragment->AppendChild(Make("p", "x"));
    fragment->AppendChild(Make("p", "y"));
    recorder.records.erase(recorder.records.end() - 2, recorder.records.end());
    Body().AppendChild(fragment);
    EXPECT_FALSE(fragment->HasChildNodes());
    Body().RemoveAllChildren();
    document_->mutationObserverKinds = 0;
    Body().AppendChild(Make("p"));
    const std::vector<std::string> expected = {
        "body +n <a >b", "body -n <a >b", "body +c -b <a", "body +a -c", "#document-fragment -x -y",
        "body +x +y <a", "body -a -x -y"};
    EXPECT_EQ(recorder.records, expected);
}

TEST_F(TreeTest, AttributeAndTextRecordsCarryTheOldValue) {
    Load("<p id=a class=x>old</p>");
    Recorder recorder;
    document_->mutationRegistry = &recorder;
    document_->mutationObserverKinds = kMutationAttributes | kMutationCharacterData;
    Element& a = Find("a");
    a.SetAttribute("title", "1");
    a.SetAttribute("title", "1");  // no change, no record
    a.SetAttribute("data-k", "v");
    a.AddClass("y");
    static_cast<Text*>(a.GetFirstChild())->SetData("new");
    const std::vector<std::string> expected = {"a.title was absent", "a.data-k was absent", "a.class was x",
                                               "text was old"};
    EXPECT_EQ(recorder.records, expected);
}

TEST_F(TreeTest, ClonesAreEqualAndApart) {
    Load("<div id=a class='x y' title=t data-k=v style='width: 10px'><p>one</p>two</div>");
    Element& a = Find("a");
    Listen(a, "ping", [&](Event&) { host_->journal.push_back("ping"); });
    RefPtr<Node> clone = a.CloneNode(true);
    EXPECT_TRUE(a.IsEqualNode(clone.get()));
    EXPECT_FALSE(clone->IsInDocument());
    auto& element = static_cast<Element&>(*clone);
    EXPECT_EQ(element.GetAttribute("style"), a.GetAttribute("style"));
    EXPECT_EQ(element.GetAttribute("data-k")->view(), "v");
    element.SetAttribute("title", "other");
    EXPECT_EQ(a.GetAttribute("title")->view(), "t");
    RefPtr<Event> event = script::MakeHandle<Event>(document_.get(), document_->Intern("ping"), false, false);
    element.DispatchEvent(event.get());
    EXPECT_EQ(host_->journal.back(), "ping");
    EXPECT_FALSE(a.IsEqualNode(a.CloneNode(false).get()));
    EXPECT_EQ(document_->GetElementById("a"), &a);
}

TEST_F(TreeTest, NormalizeJoinsTexts) {
    LoadEmpty();
    RefPtr<Element> p = Make("p");
    for (const char* text : {"", "a", "", "b"})
        p->AppendChild(document_->CreateTextNode(text));
    RefPtr<Element> inner = Make("b");
    inner->AppendChild(document_->CreateTextNode("c"));
    inner->AppendChild(document_->CreateTextNode("d"));
    p->AppendChild(inner);
    p->AppendChild(document_->CreateTextNode(""));
    p->Normalize();
    EXPECT_EQ(Shape(*p), "p('ab' b('cd'))");
}

TEST_F(TreeTest, CharacterDataCountsBytesAndCodePoints) {
    LoadEmpty();
    RefPtr<Text> text = document_->CreateTextNode("a\xC3\xA4z");
    EXPECT_EQ(text->GetLength(), 3u);
    text->InsertData(1, "-");
    EXPECT_EQ(text->GetData(), "a-\xC3\xA4z");
    text->DeleteData(0, 2);
    text->AppendData(text->GetData());  // a part of itself
    EXPECT_EQ(text->GetData(), "\xC3\xA4z\xC3\xA4z");
    text->ReplaceData(99, 1, "x");
    EXPECT_TRUE(log_.Contains(
        "Failed to execute 'replaceData' on 'CharacterData': The offset is greater than the node's length."));
    EXPECT_EQ(text->SubstringData(2, 99).view(), "z\xC3\xA4z");
    Body().AppendChild(text);
    RefPtr<Text> rest = text->SplitText(3);
    EXPECT_EQ(BodyShape(), "body('\xC3\xA4z' '\xC3\xA4z')");
}

TEST_F(TreeTest, SecondLandmarksStayOrdinary) {
    LoadEmpty();
    Element* body = document_->GetBodyElement();
    RefPtr<Element> second = Make("body");
    EXPECT_TRUE(log_.Contains("Trying to set second BODY element - ignoring it!"));
    document_->GetHtmlElement()->AppendChild(second);
    EXPECT_EQ(document_->GetBodyElement(), body);
    document_->GetHtmlElement()->RemoveChild(body);
    EXPECT_EQ(document_->GetBodyElement(), nullptr);
    EXPECT_TRUE(log_.Contains("Removed BODY element!"));
}

// Takes another node out, or itself, while its own removal is told.
class Leaver final : public INodeLifetimeObserver {
  public:
    void OnNodeRemoved(Node& node) override {
        removed.push_back(std::string(static_cast<Element&>(node).GetId().view()));
        if (removed.back() == "b" && node.GetParent()) node.GetParent()->RemoveChild(&node);
    }
    std::vector<std::string> removed;
};

TEST_F(TreeTest, ANodeThatRemovesItselfSkipsNobody) {
    Load("<div id=a><p id=b></p><p id=c></p><p id=d></p></div>");
    Leaver leaver;
    document_->lifetimeObservers[0] = &leaver;
    RefPtr<Node> a(&Find("a"));
    Body().RemoveChild(a.get());
    document_->lifetimeObservers[0] = nullptr;
    EXPECT_EQ(leaver.removed, (std::vector<std::string>{"a", "b", "c", "d"}));
    EXPECT_EQ(Shape(*a), "div#a(p#c p#d)");
    for (Node* node = a.get(); node; node = node->GetNextInTree(a.get()))
        EXPECT_FALSE(node->IsInDocument());
}

TEST_F(TreeTest, AScriptThatTakesItsSiblingsAwayLeavesNobodyOut) {
    LoadEmpty();
    RefPtr<Element> box = Make("div", "box");
    for (const char* id : {"a", "b", "s", "c", "d"})
        box->AppendChild(Make(std::string_view(id) == "s" ? "script" : "p", id));
    box->GetChildren()[2]->AppendChild(document_->CreateTextNode("take"));
    host_->on_script = [&](std::string_view) {
        box->RemoveChild(box->GetFirstChild());
        box->RemoveChild(box->GetFirstChild());
    };
    Body().AppendChild(box);
    EXPECT_EQ(BodyShape(), "body(div#box(script#s('take') p#c p#d))");
    for (const char* id : {"box", "s", "c", "d"}) {
        Element* element = document_->GetElementById(id);
        ASSERT_NE(element, nullptr) << id;
        EXPECT_TRUE(element->IsInDocument());
        EXPECT_EQ(element->GetDepth(), element->GetParent()->GetDepth() + 1);
    }
}

// Insertions at the front and removals there move everybody away from where they were last seen.
TEST_F(TreeTest, LookingForEachOfManySiblingsSearchesEachOnce) {
    LoadEmpty();
    constexpr size_t kCount = 3000;
    RefPtr<Element> box = Make("div");
    for (size_t i = 0; i < kCount; ++i)
        box->InsertBefore(Make("p"), box->GetFirstChild());
    std::vector<RefPtr<Node>> children(box->GetChildren().begin(), box->GetChildren().end());
    document_->work = {};
    for (size_t i = kCount; i-- > 0;)
        ASSERT_EQ(children[i]->GetIndexInParent(), i);
    EXPECT_LE(document_->work.siblingsSearched, 3 * kCount);
    while (box->GetChildCount() > 1)
        box->RemoveChild(box->GetFirstChild());
    EXPECT_EQ(box->GetFirstChild(), children.back().get());
    EXPECT_LE(document_->work.siblingsSearched, 3 * kCount);
}

TEST_F(TreeTest, DeepTreesAreMadeWalkedAndTakenApart) {
    LoadEmpty();
    constexpr int kDepth = 100000;
    RefPtr<Node> top = Make("div");
    for (int i = 1; i < kDepth; ++i) {
        RefPtr<Node> outer = Make("div");
        outer->AppendChild(top);
        top = outer;
    }
    Body().AppendChild(top);
    document_->RebuildLayoutTree();
    RefPtr<Node> clone = top->CloneNode(true);
    EXPECT_TRUE(top->IsEqualNode(clone.get()));
    Body().RemoveChild(top.get());
    EXPECT_FALSE(top->IsInDocument());
    top = nullptr;
    Body().AppendChild(clone);
}

TEST_F(TreeTest, ANodeMayOutliveItsDocument) {
    Load("<div id=a><p id=b>x</p></div>");
    RefPtr<Node> a(&Find("a"));
    DropDocument();
    EXPECT_FALSE(a->IsInDocument());
    static_cast<Element&>(*a).SetAttribute("class", "late");
    a->AppendChild(a->CloneNode(true));
    EXPECT_EQ(Shape(*a), "div#a(p#b('x') div#a(p#b('x')))");
}

}  // namespace qorvex::dom::test
