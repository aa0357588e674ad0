// css-reference FILE           writes the CSS reference of page authors
// css-reference --check FILE   exit 1, with what to do, when the file is not what would be written
//
// Everything about a property comes from the property table; the prose around it from guide.md.
#include <cstdio>
#include <fstream>
#include <iterator>
#include <string>

#include "core/memory/allocator.h"
#include "css/style/default_sheet.h"
#include "css/values/property_traits.h"
#include "css/values/value_text.h"
#include "host/counting_allocator.h"
#include "notes.h"
#include "value_syntax.h"

namespace qorvex::css {
namespace {

constexpr const char* kGuide = QORVEX_SOURCE_DIR "/tools/css_reference/guide.md";

std::string ReadFile(const std::string& path) {
    std::ifstream stream(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(stream), {}};
}

constexpr const char* kChangeNames[] = {"layout", "visual", "transform", "animation", "transition"};

template <PropertyId id>
std::string InitialText() {
    const auto value = PropertyTraits<id>::Initial();
    CssString text;
    SerialiseValue(id, &value, text);
    return text.empty() ? "empty" : "`" + std::string(text.view()) + "`";
}

template <PropertyId id>
std::string ValuesText() {
    using Traits = PropertyTraits<id>;
    std::string text = SyntaxOf<typename Traits::Type>();
    if (OperationsOf(id).acceptsInitial) text += "; `initial`";
    const std::string_view note = NoteOf(id);
    if (!note.empty()) text += ". " + std::string(note);
    return text;
}

void AppendGroup(StyleGroup group, const char* title, std::string& out) {
    out += std::string("\n### ") + title +
           "\n\n| Property | Values | Initial value | Inherited | Animatable | A change is |\n"
           "|---|---|---|---|---|---|\n";
    ForEachLonghand([&]<PropertyId id>() {
        using Traits = PropertyTraits<id>;
        if (Traits::kGroup != group) return;
        out += "| `" + std::string(Traits::kName) + "` | " + ValuesText<id>() + " | " + InitialText<id>() +
               " | " + (Traits::kInherited ? "yes" : "no") + " | " + (Traits::kAnimatable ? "yes" : "no") +
               " | " + kChangeNames[static_cast<size_t>(Traits::kChange)] + " |\n";
    });
}

void AppendShorthands(std::string& out) {
    out += "\n### Shorthands\n\n| Shorthand | Longhands |\n|---|---|\n";
    for (size_t i = kLonghandCount + 1; i < kPropertyEnd; ++i) {
        const auto id = static_cast<PropertyId>(i);
        out += "| `" + std::string(PropertyName(id)) + "` |";
        for (const PropertyId longhand : LonghandsOf(id))
            out += " `" + std::string(PropertyName(longhand)) + "`";
        out += " |\n";
    }
}

std::string MakeProperties() {
    std::string out;
    AppendGroup(StyleGroup::Layout, "Layout", out);
    AppendGroup(StyleGroup::Visual, "Painting", out);
    AppendGroup(StyleGroup::TextLayout, "Text", out);
    AppendGroup(StyleGroup::Transform, "Transforms and stacking", out);
    AppendGroup(StyleGroup::Animation, "Animations", out);
    AppendGroup(StyleGroup::Transition, "Transitions", out);
    AppendShorthands(out);
    return out;
}

bool Replace(std::string& text, const std::string& place, const std::string& content) {
    const size_t at = text.find(place);
    if (at == std::string::npos) return false;
    text.replace(at, place.size(), content);
    return true;
}

std::string MakeReference() {
    std::string text = ReadFile(kGuide);
    const std::string sheet(DefaultSheetText());
    const bool whole = Replace(text, "{{properties}}\n", MakeProperties()) &&
                       Replace(text, "{{default sheet}}\n", "```css" + sheet + "```\n");
    return whole ? text : std::string();
}

int Run(bool check, const std::string& path) {
    const std::string text = MakeReference();
    if (text.empty()) {
        std::fprintf(stderr, "css-reference: %s lacks a place for the tables\n", kGuide);
        return 2;
    }
    if (check) {
        if (ReadFile(path) == text) return 0;
        std::fprintf(stderr,
                     "%s is stale. Renew it: cmake --build build/<preset> --target css-reference-docs\n",
                     path.c_str());
        return 1;
    }
    std::ofstream(path, std::ios::binary) << text;
    return 0;
}

}  // namespace
}  // namespace qorvex::css

int main(int count, char** arguments) {
    qorvex::host::CountingAllocator allocator;
    qorvex::SetAllocator(&allocator);
    const bool check = count == 3 && std::string(arguments[1]) == "--check";
    if (!check && count != 2) {
        std::fputs("usage: css-reference [--check] FILE\n", stderr);
        return 2;
    }
    return qorvex::css::Run(check, arguments[count - 1]);
}
