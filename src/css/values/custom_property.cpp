#include "css/values/custom_property.h"

#include "core/logging/log.h"

namespace qorvex::css {

namespace {

constexpr std::string_view kOpening = "var(--";

// Calls visit(offset, length, name) for each var(--name) in order. The name runs up to the first ")". False
// when one is empty or not closed.
template <class Visitor>
bool ForEachReference(std::string_view text, Visitor&& visit) {
    for (size_t at = text.find(kOpening); at != std::string_view::npos; at = text.find(kOpening, at)) {
        size_t start = at + kOpening.size();
        size_t close = text.find(')', start);
        if (close == std::string_view::npos || close == start) return false;
        visit(at, close + 1 - at, text.substr(start, close - start));
        at = close + 1;
    }
    return true;
}

}  // namespace

std::optional<CustomExpression> PrepareCustomExpression(std::string_view valueText, StringPool& strings) {
    if (valueText.size() <= kOpening.size()) {
        LogWarning("Expected a custom expression in declaration but declaration is too short!");
        return std::nullopt;
    }
    CustomExpression made;
    size_t copied = 0;
    bool valid = ForEachReference(valueText, [&](size_t offset, size_t length, std::string_view name) {
        made.text.append(valueText.substr(copied, offset - copied));
        made.references.push_back({static_cast<uint32_t>(made.text.size()), strings.Intern(name)});
        copied = offset + length;
    });
    if (!valid) {
        LogWarning("-- is an invalid custom expression!");
        return std::nullopt;
    }
    made.text.append(valueText.substr(copied));
    return made;
}

CustomPropertyPtr MakeCustomProperty(std::string_view valueText, uint8_t flags, StringPool& strings) {
    RefPtr<CustomProperty> made = MakeRef<CustomProperty>();
    made->text = valueText;
    made->flags = flags;
    if (!(flags & kHasVar)) return made;  // a "var(" in quotes is text
    bool valid = ForEachReference(valueText, [&](size_t offset, size_t length, std::string_view name) {
        made->references.push_back(
            {static_cast<uint32_t>(offset), static_cast<uint32_t>(length), strings.Intern(name)});
    });
    if (!valid) {
        LogWarning("-- is an invalid custom expression!");
        return nullptr;
    }
    return made;
}

void CustomExpression::AppendText(CssString& out) const {
    size_t copied = 0;
    for (const Reference& reference : references) {
        out.append(text.view().substr(copied, reference.offset - copied));
        copied = reference.offset;
        out.append(kOpening);
        out.append(reference.name.view());
        out.push_back(')');
    }
    out.append(text.view().substr(copied));
}

}  // namespace qorvex::css
