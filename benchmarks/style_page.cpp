#include "benchmarks/style_page.h"

#include "core/memory/allocator.h"
#include "css/parser/convert.h"
#include "dom/parsed_html.h"
#include "host/counting_allocator.h"
#include "script/make_handle.h"

namespace qorvex::bench {
namespace {

// Writes `text` with every "NAME" replaced by the panel's name and every "N" by its number.
void AppendFor(int panel, std::string_view text, std::string& out) {
    static constexpr std::string_view kNames[] = {"shop",  "slot", "quest", "map",    "chat",
                                                  "skill", "card", "badge", "dialog", "menu"};
    const std::string number = std::to_string(panel);
    for (size_t i = 0; i < text.size(); ++i) {
        if (text.substr(i, 4) == "NAME") {
            out += kNames[panel % std::size(kNames)];
            out += number;
            i += 3;
        } else if (text[i] == 'N') {
            out += number;
        } else {
            out += text[i];
        }
    }
}

constexpr std::string_view kPanelRules = R"(
/* NAME */
.NAME {
    display: flex;
    flex-direction: column;
    position: relative;
    width: 24vw;
    min-height: 12rem;
    margin: 4px 8px;
    padding: 0.5em 1em;
    border: 1px solid rgba(255, 255, 255, 0.2N);
    border-radius: 6px;
    background-color: #1d2430;
}
.NAME-head {
    display: flex;
    flex-direction: row;
    align-items: center;
    justify-content: space-between;
    height: 2.5rem;
    padding-left: Npx;
    border-bottom: 2px solid #394867;
}
.NAME-title {
    color: #e8c36a;
    font-size: 1.25rem;
    font-weight: bold;
    letter-spacing: 0.5px;
    text-transform: uppercase;
}
.NAME-icon {
    width: 32px;
    height: 32px;
    background-image: url("icons/NAME.png");
    background-size: contain;
    background-repeat: no-repeat;
    opacity: 0.9;
}
.NAME-label {
    color: #c5cbd8;
    line-height: 1.4em;
    white-space: nowrap;
}
.NAME-bar {
    flex: 1 0 auto;
    height: 6px;
    background-color: rgba(46, 160, 67, 0.8);
    transition: width 200ms ease-out;
}
.NAME:hover { background-color: #27303f; border-top-color: #e8c36a }
.NAME.active { transform: translateY(-2px); box-shadow: 0 4px 12px rgba(0, 0, 0, 0.5) }
.NAME .NAME-label.warn { color: #ff6b5e }
.NAME-head > .NAME-icon { margin-right: Npx }
)";

constexpr std::string_view kPanelMarkup =
    "<div class='NAME'><div class='NAME-head'><span class='NAME-title'>Title N</span>"
    "<div class='NAME-icon'></div></div><p class='NAME-label'>Some words of this panel</p>"
    "<div class='NAME-bar'></div></div>";
constexpr std::string_view kActivePanelMarkup =
    "<div class='NAME active' data-kind='NAME'><div class='NAME-head'><span class='NAME-title'>Title N</span>"
    "<div class='NAME-icon'></div></div><p class='NAME-label warn'>Some words of this panel</p>"
    "<div class='NAME-bar' style='width: N%'></div></div>";
constexpr int kElementsOfPanel = 6;

}  // namespace

std::string PanelSheet(int panels) {
    std::string sheet;
    for (int panel = 0; panel < panels; ++panel)
        AppendFor(panel, kPanelRules, sheet);
    return sheet;
}

std::string PanelMarkup(int elements, int panels) {
    constexpr int kPanelsOfSection = 12, kActiveEvery = 9;
    std::string body;
    for (int i = 0; i * kElementsOfPanel < elements; ++i) {
        if (i % kPanelsOfSection == 0) body += i == 0 ? "<section>" : "</section><section>";
        AppendFor(i % panels, i % kActiveEvery == 0 ? kActivePanelMarkup : kPanelMarkup, body);
    }
    return body + "</section>";
}

StylePage::StylePage(std::string_view body, std::string_view sheet) {
    css::CreateDefaultStyles();
    host_ = std::make_unique<test::IdleHost>(dom::HostSize{1920, 1080});
    auto engine = MakeUnique<css::StyleEngine, MemoryTag::DOM>(host_->strings,
                                                               MakeRef<css::DefaultRules>(host_->strings));
    engine_ = engine.get();
    dom::DocumentParams params;
    params.host = host_.get();
    params.url = URL("file:///page.html");
    params.style_engine = std::move(engine);
    params.loader = MakeUnique<test::IdleLoader, MemoryTag::DOM>();
    document_ = script::MakeHandle<dom::HTMLDocument>(std::move(params));
    const std::string html = "<html><head></head><body>" + std::string(body) + "</body></html>";
    if (document_->BuildRoot(dom::ParseHTML(html))) document_->IterateDOMBuilding();
    document_->SetViewSize(1920, 1080);
    engine_->AddStyleSheet(*document_, nullptr, css::MakeStylesheet(sheet, {}, host_->strings), {});
    Solve();
}

StylePage::~StylePage() {
    document_ = nullptr;
    host_.reset();
    css::DestroyDefaultStyles();
}

void StylePage::Solve() {
    document_->SolveStyles();
}

StringPool& StylePage::strings() {
    return host_->strings;
}

size_t StylePage::CountElements() const {
    size_t count = 0;
    for (dom::Node* node = document_->GetNextInTree(document_.get()); node;
         node = node->GetNextInTree(document_.get()))
        count += node->IsElement();
    return count;
}

uint64_t CountAllocations() {
    return static_cast<host::CountingAllocator*>(GetAllocator())->Total().allocations;
}

}  // namespace qorvex::bench
