#include "css/style/style_fixture.h"

#include "css/parser/convert.h"
#include "css/style/computed_serializer.h"
#include "css/values/value_text.h"
#include "dom/parsed_html.h"
#include "script/make_handle.h"

namespace qorvex::css::test {

StyleTest::StyleTest() {
    CreateDefaultStyles();
    host_ = std::make_unique<StyleHost>();
    defaults_ = MakeRef<DefaultRules>(host_->strings);
}

StyleTest::~StyleTest() {
    Drop();
    defaults_ = nullptr;
    host_.reset();
    DestroyDefaultStyles();
}

void StyleTest::Drop() {
    host_->hovered = host_->active = nullptr;
    engine_ = nullptr;
    document_ = nullptr;
}

dom::Document& StyleTest::Load(std::string_view body, std::string_view sheet) {
    Drop();
    dom::DocumentParams params;
    params.host = host_.get();
    params.url = URL("file:///page.html");
    auto engine = MakeUnique<StyleEngine, MemoryTag::DOM>(host_->strings, defaults_);
    engine_ = engine.get();
    params.style_engine = std::move(engine);
    params.loader = MakeUnique<IdleLoader, MemoryTag::DOM>();
    document_ = script::MakeHandle<dom::HTMLDocument>(std::move(params));
    const std::string html = "<html><head></head><body>" + std::string(body) + "</body></html>";
    if (document_->BuildRoot(dom::ParseHTML(html))) document_->IterateDOMBuilding();
    document_->SetViewSize(800, 600);
    if (!sheet.empty()) AddSheet(sheet);
    return *document_;
}

void StyleTest::AddSheet(std::string_view text, dom::Element* owner, std::string_view media) {
    engine_->AddStyleSheet(*document_, owner, MakeStylesheet(text, {}, host_->strings), media);
}

std::string StyleTest::Computed(const dom::Element& element, std::string_view property) {
    Solve();
    CssString out;
    SerialiseComputed(FindProperty(property), element.GetStyle(), out);
    return std::string(std::string_view(out));
}

std::string StyleTest::Computed(std::string_view id, std::string_view property) {
    return Computed(Find(id), property);
}

std::string StyleTest::DumpAll() {
    CssString out;
    for (dom::Node* node = document_->GetNextInTree(document_.get()); node;
         node = node->GetNextInTree(document_.get())) {
        if (!node->IsElement() && !node->IsText()) continue;
        LayoutStyleRefs style = DefaultStyles();
        if (node->IsElement()) style = static_cast<dom::Element*>(node)->GetStyle();
        static_cast<LaidOutStyle&>(style) = node->GetLaidOutStyle();
        out.append(node->GetNodeName().view());
        out.append("\n");
        for (size_t i = 0; i < kLonghandCount; ++i) {
            const auto id = static_cast<PropertyId>(i);
            SerialiseValue(id, style.Field(id), out);
            out.append("\n");
        }
        const TextLayoutDerived& text = *style.text;
        char line[128];
        std::snprintf(line, sizeof line, "%g %g %g %g %d %d\n", text.computedFontSize,
                      text.computedStrokeWidth, text.computedLetterSpacing, text.computedLineHeight,
                      text.computedFontWeight, style.layout->textKind);
        out.append(line);
    }
    return std::string(std::string_view(out));
}

qsl::RefPtr<dom::Element> StyleTest::Append(dom::Node& parent, std::string_view tag,
                                            std::string_view className) {
    qsl::RefPtr<dom::Element> element = document_->CreateElement(tag);
    if (!className.empty()) element->SetAttribute("class", className);
    parent.AppendChild(element);
    return element;
}

StyleCounters StyleTest::Counted(const std::function<void()>& action) {
    const StyleCounters before = engine_->GetCounters();
    action();
    StyleCounters after = engine_->GetCounters();
    after.elementsMatched -= before.elementsMatched;
    after.elementsSolved -= before.elementsSolved;
    after.stylesShared -= before.stylesShared;
    after.textNodesSolved -= before.textNodesSolved;
    after.propertiesApplied -= before.propertiesApplied;
    after.propertiesChanged -= before.propertiesChanged;
    return after;
}

}  // namespace qorvex::css::test
