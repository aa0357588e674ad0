#include <random>

#include "dom/dom_fixture.h"
#include "dom/node_list.h"

namespace qorvex::dom::test {

using qsl::RefPtr;

class LookupTest : public DomTest {
  protected:
    // Plain recursion over the tree, which every cached answer has to equal.
    void Walk(Node& node, std::vector<Element*>& out) {
        for (const RefPtr<Node>& child : node.GetChildren()) {
            if (child->IsElement()) out.push_back(static_cast<Element*>(child.get()));
            Walk(*child, out);
        }
    }
    Element* SlowById(std::string_view id) {
        std::vector<Element*> all;
        Walk(*document_, all);
        for (Element* element : all)
            if (element->GetId().view() == id) return element;
        return nullptr;
    }
    void ExpectSame(const HTMLCollection& list, const std::vector<Element*>& expected) {
        ASSERT_EQ(list.GetLength(), expected.size());
        for (size_t i = 0; i < expected.size(); ++i)
            EXPECT_EQ(list.GetElement(i), expected[i]);
    }
};

TEST_F(LookupTest, CachesNeverShow) {
    LoadEmpty();
    std::mt19937 random(20251124);
    const auto pick = [&](size_t below) {
        return std::uniform_int_distribution<size_t>(0, below - 1)(random);
    };
    const std::vector<std::string> ids = {"a", "b", "c", ""};
    const std::vector<std::string> tags = {"div", "p", "my-tag"};
    std::vector<RefPtr<Element>> elements;
    for (int i = 0; i < 40; ++i)
        elements.push_back(Make(tags[pick(tags.size())]));
    for (int step = 0; step < 4000; ++step) {
        Element& element = *elements[pick(elements.size())];
        Element& other = *elements[pick(elements.size())];
        switch (pick(6)) {
            case 0:
                element.SetAttribute("id", ids[pick(ids.size())]);
                break;
            case 1:
                element.SetAttribute("class", pick(2) ? "x y" : "y");
                break;
            case 2:
                element.AddClass("x");
                break;
            case 3:
                element.RemoveClass("x");
                break;
            case 4: {
                Node& parent = pick(3) ? static_cast<Node&>(other) : Body();
                Node* reference = parent.HasChildNodes() && pick(2) ? parent.GetChildren()[0].get() : nullptr;
                if (reference != &element) parent.InsertBefore(RefPtr<Node>(&element), reference);
                break;
            }
            default:
                if (Node* parent = element.GetParent()) parent->RemoveChild(&element);
        }
        if (step % 3) continue;
        for (const std::string& id : ids) {
            if (!id.empty()) {
                ASSERT_EQ(document_->GetElementById(id), SlowById(id)) << step << " " << id;
            }
        }
        Node& root = pick(2) ? static_cast<Node&>(*document_) : other;
        std::vector<Element*> all, by_tag, by_class;
        Walk(root, all);
        for (Element* candidate : all) {
            if (candidate->GetTag() == css::TagId::P) by_tag.push_back(candidate);
            if (candidate->HasClassNamed("x")) by_class.push_back(candidate);
        }
        ExpectSame(*document_->GetElementsByTagName(root, "p"), by_tag);
        ExpectSame(*document_->GetElementsByClassName(root, "x"), by_class);
        ExpectSame(*document_->GetElementsByTagName(root, "*"), all);
        if (HasFailure()) return;
    }
}

// Siblings have no links: walking them must still not search.
TEST_F(LookupTest, SiblingWalksAndIdLookupsDoNotWalkTheTree) {
    LoadEmpty();
    constexpr int kCount = 5000;
    for (int i = 0; i < kCount; ++i)
        Body().AppendChild(Make("p", "n" + std::to_string(i)));
    int seen = 0;
    for (Node* node = Body().GetFirstChild(); node; node = node->GetNextSibling())
        ++seen;
    for (Node* node = Body().GetLastChild(); node; node = node->GetPreviousSibling())
        ++seen;
    EXPECT_EQ(seen, 2 * kCount);
    for (int i = 0; i < kCount; ++i)
        ASSERT_NE(document_->GetElementById("n" + std::to_string(i)), nullptr);
    while (Body().HasChildNodes())
        Body().RemoveChild(Body().GetFirstChild());
}

}  // namespace qorvex::dom::test
