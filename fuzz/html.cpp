// A page's bytes through the HTML parser and the builder to nodes: once as it stands, and once with scripts
// that change the tree under the builder's feet.
#include <cstdint>

#include "dom/character_data.h"
#include "support/engine.h"
#include "support/page.h"

namespace qorvex::fuzz {
namespace {

using dom::Document;
using dom::Element;
using dom::Node;
using qsl::RefPtr;

constexpr uint32_t kMaxOperations = 64;

/// A script here is a row of letters, each an operation on two nodes that the letter's place picks.
class Scripts {
  public:
    static void Run(Document& document, std::string_view source, void* user) {
        // A copy, as a script engine makes one: the script may change its own element.
        static_cast<Scripts*>(user)->Run(document, String(source).view());
    }

  private:
    static Node& Pick(Document& document, uint32_t number) {
        uint32_t count = 0;
        for (Node* node = &document; node; node = node->GetNextInTree(&document))
            ++count;
        number %= count;
        Node* node = &document;
        while (number-- > 0)
            node = node->GetNextInTree(&document);
        return *node;
    }

    void Run(Document& document, std::string_view source) {
        for (size_t i = 0; i < source.size() && operations_ < kMaxOperations; ++i) {
            ++operations_;
            const auto letter = static_cast<uint8_t>(source[i]);
            // Both nodes may leave the tree, and with it their last owner, in the middle of the operation.
            const RefPtr<Node> one(&Pick(document, letter * 7 + operations_));
            const RefPtr<Node> other(&Pick(document, letter * 13 + operations_ * 3));
            ChangeTree(document, letter, *one, *other);
            if (one->IsElement()) ChangeElement(letter, static_cast<Element&>(*one), source.substr(i + 1));
        }
    }

    static void ChangeTree(Document& document, uint8_t letter, Node& one, Node& other) {
        switch (letter % 16) {
            case 0:
                one.AppendChild(RefPtr<Node>(&other));
                break;
            case 1:
                if (Node* parent = one.GetParent()) parent->RemoveChild(&one);
                break;
            case 2:
                if (Node* parent = other.GetParent()) parent->InsertBefore(RefPtr<Node>(&one), &other);
                break;
            case 3:
                if (Node* parent = other.GetParent()) parent->ReplaceChild(RefPtr<Node>(&one), &other);
                break;
            case 4:
                one.AppendChild(other.CloneNode(document.GetChildCount() < 4));
                break;
            case 5:
                one.Normalize();
                break;
            case 6:
                one.AppendChild(document.CreateTextNode(other.GetNodeName().view()));
                break;
            case 7:
                if (letter == 'W') document.Unload();
                break;
            default:
                break;
        }
    }

    static void ChangeElement(uint8_t letter, Element& element, std::string_view rest) {
        switch (letter % 16) {
            case 8:
                element.SetInnerHTML(rest);
                break;
            case 9:
                element.InsertAdjacentHTML("beforeend", rest);
                break;
            case 10:
                element.GetDocument()->Write(rest);
                break;
            case 11:
                element.SetTextContent(rest);
                break;
            case 12:
                element.SetAttribute(rest.substr(0, 2), rest);
                break;
            case 13:
                element.SetAttribute(letter & 16 ? "src" : letter & 32 ? "id" : "class", rest);
                break;
            case 14:
                element.RemoveAttribute(letter & 16 ? "src" : letter & 32 ? "id" : "class");
                break;
            case 15:
                element.SetAttribute(letter & 16 ? "style" : "href", rest);
                break;
            default:
                break;
        }
    }

    uint32_t operations_ = 0;
};

void Read(Document& document) {
    (void)document.DumpDOM();
    if (Element* body = document.GetBodyElement()) {
        (void)body->GetTextContent();
        const RefPtr<Node> copy = body->CloneNode(true);
        Require(copy->IsEqualNode(body), "a copy equals its original");
    }
}

void Load(std::string_view html, bool with_scripts) {
    PageHost host;
    Scripts scripts;
    if (with_scripts) {
        host.on_script = Scripts::Run;
        host.user = &scripts;
    }
    Page page(host);
    Document& document = page.Load(html, with_scripts ? "http://host/page.html" : "ui://page",
                                   MakeUnique<IdleStyleEngine, MemoryTag::DOM>());
    CheckTree(document);
    Read(document);
}

}  // namespace
}  // namespace qorvex::fuzz

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    using namespace qorvex;
    const fuzz::Input input;
    css::CreateDefaultStyles();
    const std::string_view html(reinterpret_cast<const char*>(data), size);
    fuzz::Load(html, false);
    fuzz::Load(html, true);
    css::DestroyDefaultStyles();
    return 0;
}
