// Styles from declarations given as text, for pages that are made of layout handles alone.
#pragma once

#include "css/values/layout_style_refs.h"
#include "css/values/property_traits.h"
#include "css/values/value_text.h"

namespace qorvex::test {

// False when one of them cannot be read; the others are applied.
inline bool ApplyDeclarations(css::LayoutStyleRefs& style, std::string_view text) {
    bool readable = true;
    while (!text.empty()) {
        const size_t end = std::min(text.find(';'), text.size());
        std::string_view declaration = text.substr(0, end);
        text.remove_prefix(std::min(end + 1, text.size()));
        while (!declaration.empty() && declaration.front() == ' ')
            declaration.remove_prefix(1);
        if (declaration.empty()) continue;
        const size_t colon = declaration.find(':');
        const css::PropertyId id = css::FindProperty(declaration.substr(0, colon));
        std::string_view value = declaration.substr(colon + 1);
        while (!value.empty() && value.front() == ' ')
            value.remove_prefix(1);
        css::CssVector<css::Declaration> parsed;
        if (css::IsShorthand(id)) {
            readable &= css::ParseShorthand(id, value, 0, parsed);
        } else {
            css::Declaration single;
            readable &= css::ParseLonghand(id, value, single);
            parsed.push_back(single);
        }
        for (const css::Declaration& one : parsed) {
            auto store = [&]<css::PropertyId property>() {
                using Traits = css::PropertyTraits<property>;
                if (one.property() != property || !one.IsValue()) return;
                style.Mutable<typename Traits::Group>().*Traits::kField = one.Get<property>();
                if constexpr (property == css::PropertyId::FontSize)
                    style.Mutable<css::TextLayoutStyle>().computedFontSize = one.Get<property>().value;
            };
            css::ForEachLonghand(store);
        }
    }
    return readable;
}

}  // namespace qorvex::test
