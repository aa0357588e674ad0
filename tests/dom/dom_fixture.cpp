#include "dom/dom_fixture.h"

#include <functional>

namespace qorvex::dom::test {

using qsl::RefPtr;

namespace {
class TestResource final : public ILoadedResource {
  public:
    explicit TestResource(std::string_view data, bool success) : data_(data), success_(success) {}
    bool Succeeded() const override { return success_; }
    std::span<const uint8_t> GetData() const override {
        return {reinterpret_cast<const uint8_t*>(data_.data()), data_.size()};
    }
    const URL& GetResponseURL() const override { return url_; }

  private:
    std::string_view data_;
    bool success_;
    URL url_;
};
}  // namespace

void TestHost::EvaluateScript(Document&, std::string_view source, std::string_view) {
    journal.push_back("run " + std::string(source));
    if (on_script) on_script(source);
}

void TestStyleEngine::SolveStyles(Document& document) {
    document.GetStyleDirtyNodes().clear();
    for (Node* element : document.GetSelectorDirtyElements())
        element->pendingStyleBits = 0;
    document.GetSelectorDirtyElements().clear();
    document.ClearFullStyleSolve();
}

uint32_t TestLoader::Add(const char* kind, std::string_view what, Element& element, bool deferred) {
    if (!deferred) document->PauseDOMBuilding(element);
    requests.push_back({kind, std::string(what), deferred, RefPtr<Element>(&element)});
    ++pending;
    return static_cast<uint32_t>(requests.size() - 1);
}

uint32_t TestLoader::LoadResource(const URL& url, Element& element, bool deferred) {
    return Add("script", url.GetText(), element, deferred);
}
uint32_t TestLoader::LoadAndParseStylesheet(const URL& url, Element& element, bool deferred) {
    return Add("sheet", url.GetText(), element, deferred);
}
uint32_t TestLoader::ParseStylesheetText(std::string_view text, Element& element) {
    return Add("style", text, element, true);
}
void TestLoader::RequestPrefetch(const URL& url) {
    requests.push_back({"prefetch", std::string(url.GetText()), true, nullptr});
}
void TestLoader::RequestStylesheetPrefetch(const URL& url) {
    requests.push_back({"sheet prefetch", std::string(url.GetText()), true, nullptr});
}

RefPtr<Element> TestLoader::Take(size_t index) {
    --pending;
    RefPtr<Element> element = std::move(requests[index].element);
    document->ResumeDOMBuilding(*element);
    return element;
}

void TestLoader::FinishScript(size_t index, std::string_view source) {
    const TestResource resource(source, true);
    Take(index)->OnResourceLoaded(static_cast<uint32_t>(index), &resource);
}

void TestLoader::FinishSheet(size_t index, bool success) {
    Take(index)->OnStylesheetLoaded(static_cast<uint32_t>(index),
                                    success ? MakeRef<css::Stylesheet>() : css::StylesheetPtr());
}

void TestLoader::Fail(size_t index) {
    Take(index)->OnResourceLoaded(static_cast<uint32_t>(index), nullptr);
}

DomTest::DomTest() {
    css::CreateDefaultStyles();
    owned_host_ = std::make_unique<TestHost>();
    host_ = owned_host_.get();
}

DomTest::~DomTest() {
    DropDocument();
    owned_host_.reset();
    css::DestroyDefaultStyles();
}

void DomTest::DropDocument() {
    if (loader_)
        for (TestLoader::Request& request : loader_->requests)
            request.element = nullptr;
    loader_ = nullptr;
    style_ = nullptr;
    document_ = nullptr;
}

Document& DomTest::Load(std::string_view html, const char* url) {
    DropDocument();
    DocumentParams params;
    params.host = host_;
    params.url.Parse(url);
    auto style = MakeUnique<TestStyleEngine, MemoryTag::DOM>();
    auto loader = MakeUnique<TestLoader, MemoryTag::DOM>();
    style_ = style.get();
    loader_ = loader.get();
    params.style_engine = std::move(style);
    params.loader = std::move(loader);
    document_ = script::MakeHandle<HTMLDocument>(std::move(params));
    loader_->document = document_.get();
    if (document_->BuildRoot(ParseHTML(html))) document_->IterateDOMBuilding();
    return *document_;
}

RefPtr<Element> DomTest::Make(std::string_view name, std::string_view id) {
    RefPtr<Element> element = document_->CreateElement(name);
    if (!id.empty()) element->SetAttribute("id", id);
    return element;
}

Element& DomTest::Find(std::string_view id) {
    return *document_->GetElementById(id);
}

void DomTest::Listen(EventTarget& target, std::string_view type, std::function<void(Event&)> function,
                     bool capture) {
    target.AddEventListener(document_->Intern(type), script::MakeHandle<TestListener>(std::move(function)),
                            capture);
}

std::string DomTest::Shape(const Node& node) {
    if (node.IsText()) return "'" + std::string(static_cast<const Text&>(node).GetData()) + "'";
    std::string shape(node.GetMarkupName().view());
    std::transform(shape.begin(), shape.end(), shape.begin(),
                   [](unsigned char c) { return std::tolower(c); });
    if (node.Is(kHasId)) shape += "#" + std::string(static_cast<const Element&>(node).GetId().view());
    if (!node.HasChildNodes()) return shape;
    shape += "(";
    for (const RefPtr<Node>& child : node.GetChildren()) {
        if (shape.back() != '(') shape += " ";
        shape += Shape(*child);
    }
    return shape + ")";
}

}  // namespace qorvex::dom::test
