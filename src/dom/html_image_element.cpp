#include "dom/html_image_element.h"

#include <charconv>
#include <cmath>

#include "core/memory/atoms.h"
#include "display/display_image.h"
#include "dom/ascii.h"
#include "dom/document.h"
#include "dom/document_host.h"
#include "dom/event.h"
#include "script/make_handle.h"

namespace qorvex::dom {

using qsl::RefPtr;

namespace {

// https://html.spec.whatwg.org/#rules-for-parsing-dimension-values
std::optional<css::Extent> ParseDimension(std::string_view text) {
    while (!text.empty() && IsAsciiSpace(text.front()))
        text.remove_prefix(1);
    if (text.empty() || text.front() < '0' || text.front() > '9') return std::nullopt;
    float value = 0;
    const auto [end, error] =
        std::from_chars(text.data(), text.data() + text.size(), value, std::chars_format::fixed);
    if (error != std::errc() || !std::isfinite(value)) return std::nullopt;
    const bool percent = end != text.data() + text.size() && *end == '%';
    return percent ? css::Extent::Of({css::LengthUnit::Percent, value}) : css::Extent::Pixels(value);
}

uint32_t WholePixels(float value) {
    return value > 0 ? static_cast<uint32_t>(std::min(std::round(value), 4e9f)) : 0;
}

uint32_t RenderedSide(std::optional<float> laid_out, const Atom* attribute, float natural) {
    if (laid_out) return WholePixels(*laid_out);
    if (attribute) {
        const std::optional<css::Extent> side = ParseDimension(attribute->view());
        if (side && side->unit == css::LengthUnit::Px) return WholePixels(side->value);
    }
    return WholePixels(natural);
}

bool HasOpenSide(const Node& node) {
    const css::LayoutStyle& style = *node.GetLaidOutStyle().layout;
    return !style.width.IsLength() || !style.height.IsLength();
}

// As SetAttribute takes it.
struct NumberText {
    explicit NumberText(uint32_t value) {
        length = static_cast<size_t>(std::to_chars(digits, digits + sizeof digits, value).ptr - digits);
    }
    std::string_view view() const { return {digits, length}; }
    char digits[10];
    size_t length;
};

}  // namespace

HTMLImageElement::~HTMLImageElement() {
    SetWaiting(false);
}

uint32_t HTMLImageElement::GetWidth() const {
    std::optional<float> laid_out;
    if (const layout::LayoutResult* box = GetLayoutResult()) {
        const layout::SharedEdges& edges = GetBoxResult()->edges;
        const layout::Edges &border = edges.border(), &padding = edges.padding();
        laid_out = box->width - border.left - border.right - padding.left - padding.right;
    }
    return RenderedSide(laid_out, FindAttribute(atoms::kWidth), GetNaturalSize().width);
}

uint32_t HTMLImageElement::GetHeight() const {
    std::optional<float> laid_out;
    if (const layout::LayoutResult* box = GetLayoutResult()) {
        const layout::SharedEdges& edges = GetBoxResult()->edges;
        const layout::Edges &border = edges.border(), &padding = edges.padding();
        laid_out = box->height - border.top - border.bottom - padding.top - padding.bottom;
    }
    return RenderedSide(laid_out, FindAttribute(atoms::kHeight), GetNaturalSize().height);
}

void HTMLImageElement::SetWidth(uint32_t value) {
    SetAttribute("width", NumberText(value).view());
}

void HTMLImageElement::SetHeight(uint32_t value) {
    SetAttribute("height", NumberText(value).view());
}

void HTMLImageElement::AttributeChanged(AttributeName name, std::optional<Atom> old_value,
                                        std::optional<Atom> new_value) {
    HTMLElement::AttributeChanged(name, old_value, new_value);
    if (name.is_data) return;
    if (name.name == atoms::kSrc) {
        Load(new_value);
    } else if (name.name == atoms::kWidth || name.name == atoms::kHeight) {
        SetSizeHint(name, new_value);
    }
}

// The attributes give way to every rule of the page. https://html.spec.whatwg.org/#dimRendering
void HTMLImageElement::SetSizeHint(AttributeName name, const std::optional<Atom>& value) {
    const bool is_width = name.name == atoms::kWidth;
    const css::PropertyId property = is_width ? css::PropertyId::Width : css::PropertyId::Height;
    const std::optional<css::Extent> side = value ? ParseDimension(value->view()) : std::nullopt;
    bool changed = false;
    if (side) {
        changed = EnsureExtraStyle().Set(is_width ? css::Declaration::Make<css::PropertyId::Width>(*side)
                                                  : css::Declaration::Make<css::PropertyId::Height>(*side));
    } else if (css::StyleDeclarationSet* hints = GetExtraStyle()) {
        changed = hints->Remove(property);
    }
    if (changed) MarkStyleDirty();
}

// --- Loading

void HTMLImageElement::Load(const std::optional<Atom>& source) {
    const RefPtr<Node> self(this);
    ++loads_;
    SetWaiting(false);
    wanted_.Release();
    if (!source || source->empty()) {
        const layout::Size old_size = GetNaturalSize();
        shown_.Release();
        ShowPicture(old_size);
        // An address that leads nowhere is an error, none at all is not.
        if (source) QueueEvent(atoms::kError);
        return;
    }
    SetWaiting(true);
    // States that the picture has reached already come inside this call, in which no other use of the picture
    // may end.
    requesting_ = true;
    wanted_.Request(*this, GetDocument()->ResolveURL(source->view()));
    requesting_ = false;
    if (!wanted_.IsRequested()) SetWaiting(false);  // a document that shows nothing
    Settle();
}

void HTMLImageElement::OnImageLoaded(uint32_t id, const ImageInfoPtr& info, ImageState state) {
    HTMLElement::OnImageLoaded(id, info, state);
    if (!info) return;
    // Both may be the same image, under two names.
    const layout::Size old_size = GetNaturalSize();
    const bool shows = shown_.Update(id, info, state);
    if (shows && state >= ImageState::Decoded) ShowPicture(old_size);
    if (wanted_.Update(id, info, state) && !requesting_) Settle();
}

void HTMLImageElement::Settle() {
    if (!wanted_.IsRequested() || wanted_.GetState() < ImageState::Decoded) return;
    const layout::Size old_size = GetNaturalSize();
    shown_ = std::move(wanted_);
    ShowPicture(old_size);
    QueueEvent(shown_.HasFailed() ? atoms::kError : atoms::kLoad);
}

void HTMLImageElement::ShowPicture(layout::Size old_size) {
    GetDocument()->QueueImageChange(*this);
    const layout::Size size = GetNaturalSize();
    if (size.width == old_size.width && size.height == old_size.height) return;
    // The simple engine goes down from what has changed, so whoever takes its own size from the picture
    // counts as changed too.
    const Element* body = GetDocument()->GetBodyElement();
    const bool is_simple = body && body->GetStyle().layout->display == css::CSSDisplay::Simple;
    for (Node* node = this; node && HasOpenSide(*node); node = is_simple ? node->GetParent() : nullptr)
        node->MarkLayoutDirty();
}

// Never from inside the call that brought the news: script may do anything.
void HTMLImageElement::QueueEvent(Atom type) {
    SetWaiting(true);
    GetDocument()->GetHost().GetTaskFamily().Push(
        TaskChannels::Main,
        MakeTask("FireImageEvent", [link = GetLayoutLink(), type, load = loads_](TaskFamilyHandle) {
            auto* image = static_cast<HTMLImageElement*>(link->GetNode());
            if (image && image->loads_ == load) image->FireEvent(type);
        }));
}

void HTMLImageElement::FireEvent(Atom type) {
    const RefPtr<Node> self(this);
    RefPtr<Event> event = script::MakeHandle<Event>(GetDocument(), type, false, false);
    DispatchEvent(event.get());
    SetWaiting(false);
}

void HTMLImageElement::SetWaiting(bool waiting) {
    if (waiting_ == waiting) return;
    waiting_ = waiting;
    waiting ? GetDocument()->HoldForImage(*this) : GetDocument()->LetGoForImage(*this);
}

// --- Display

void HTMLImageElement::OnInsertedIntoDocument() {
    HTMLElement::OnInsertedIntoDocument();
    GetDocument()->QueueImageChange(*this);
}

layout::HandlePtr HTMLImageElement::CreateLayoutNode(layout::LayoutTree& tree, layout::LayoutHandle& parent) {
    if (!display_element_) display_element_ = CreateDisplayElement();
    return HTMLElement::CreateLayoutNode(tree, parent);
}

dsp::DisplayElementPtr HTMLImageElement::CreateDisplayElement() {
    return MakeRef<dsp::DisplayImage>();
}

void HTMLImageElement::OnImageFrame(uint32_t id, uint32_t frame, bool on_screen) {
    HTMLElement::OnImageFrame(id, frame, on_screen);
    if (!shown_.ShowFrame(id, frame)) return;
    on_screen ? GetDocument()->QueueImageChange(*this) : GetDocument()->QueueImageCommit(*this);
}

void HTMLImageElement::CommitImages() {
    HTMLElement::CommitImages();
    if (display_element_) static_cast<dsp::DisplayImage&>(*display_element_).SetImage(shown_.MakeSlot());
}

}  // namespace qorvex::dom
