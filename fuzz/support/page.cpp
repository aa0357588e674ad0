#include "support/page.h"

#include "core/limits.h"
#include "css/parser/convert.h"
#include "dom/parsed_html.h"
#include "script/make_handle.h"
#include "support/engine.h"

namespace qorvex::fuzz {

namespace {

class AddressAsContent final : public dom::ILoadedResource {
  public:
    AddressAsContent(const String& address, bool success)
        : address_(address), success_(success), url_(address.view()) {}
    bool Succeeded() const override { return success_; }
    std::span<const uint8_t> GetData() const override {
        return {reinterpret_cast<const uint8_t*>(address_.data()), address_.size()};
    }
    const URL& GetResponseURL() const override { return url_; }

  private:
    const String& address_;
    bool success_;
    URL url_;
};

}  // namespace

uint32_t PageLoader::Add(Kind kind, std::string_view text, dom::Element& element, bool deferred) {
    Request request{kind, ++next_id_, String(text), script::WeakHandle<dom::Element>(&element), nullptr};
    dom::Document& document = *element.GetDocument();
    if (kind == Kind::SheetText || (!deferred && document.GetBuildState() == dom::BuildState::Building)) {
        document.PauseDOMBuilding(element);
        request.blocker = qsl::RefPtr<dom::Element>(&element);
    }
    requests_.push_back(std::move(request));
    return next_id_;
}

uint32_t PageLoader::LoadResource(const URL& url, dom::Element& element, bool deferred) {
    return Add(Kind::Resource, url.GetText().view(), element, deferred);
}
uint32_t PageLoader::LoadAndParseStylesheet(const URL& url, dom::Element& element, bool deferred) {
    return Add(Kind::Sheet, url.GetText().view(), element, deferred);
}
uint32_t PageLoader::ParseStylesheetText(std::string_view text, dom::Element& element) {
    return Add(Kind::SheetText, text, element, true);
}

bool PageLoader::Answer(dom::Document& document) {
    if (requests_.empty()) return false;
    const Request request = requests_.take_back();
    if (request.blocker) document.ResumeDOMBuilding(*request.blocker);
    const bool success = request.id % 3 != 0;
    const qsl::RefPtr<dom::Element> element(request.element.get());
    if (!element) return true;
    if (request.kind == Kind::Resource) {
        const AddressAsContent resource(request.text, success);
        element->OnResourceLoaded(request.id, &resource);
    } else {
        element->OnStylesheetLoaded(
            request.id,
            success ? css::MakeStylesheet(request.text.view(), document.GetURLText(), document.GetStrings())
                    : css::StylesheetPtr());
    }
    if (!document.IsUnloaded()) document.MaybeFinishLoad();
    return true;
}

dom::Document& Page::Load(std::string_view html, std::string_view url,
                          UniquePtr<dom::IStyleEngine, MemoryTag::DOM> style) {
    dom::DocumentParams params;
    params.host = &host_;
    params.url = URL(url);
    params.style_engine = std::move(style);
    auto loader = MakeUnique<PageLoader, MemoryTag::DOM>();
    PageLoader& answers = *loader;
    params.loader = std::move(loader);
    document_ = script::MakeHandle<dom::HTMLDocument>(std::move(params));
    document_->SetViewSize(800, 600);
    if (!document_->BuildRoot(dom::ParseHTML(html))) return *document_;
    do {
        (void)document_->IterateDOMBuilding();
        host_.RunTasks();
    } while (answers.Answer(*document_));
    Require(document_->IsUnloaded() || document_->GetBuildState() == dom::BuildState::Built,
            "a page whose loads are all answered is built");
    return *document_;
}

void CheckTree(dom::Document& document) {
    for (dom::Node* node = document.GetNextInTree(&document); node; node = node->GetNextInTree(&document)) {
        Require(node->GetParent() && node->GetDocument() == &document, "a node of the tree has its parent");
        Require(node->IsInDocument(), "a node below the document is in it");
        Require(node->GetDepth() == node->GetParent()->GetDepth() + 1, "depth counts the parents");
        Require(node->GetParent()->GetChildren()[node->GetIndexInParent()].get() == node,
                "a child stands where it says");
    }
    // Lookups answer as a walk does: the first in document order.
    uint32_t checked = 0;
    document.ForEachElement([&](dom::Element& element) {
        if (element.GetId().empty() || ++checked > 32) return;
        dom::Element* first = nullptr;
        document.ForEachElement([&](dom::Element& other) {
            if (!first && other.GetId() == element.GetId()) first = &other;
        });
        Require(document.GetElementById(element.GetId().view()) == first, "the first element of an id");
    });
}

}  // namespace qorvex::fuzz
