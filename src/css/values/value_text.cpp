#include "css/values/value_text.h"

#include <array>

#include "core/logging/log.h"
#include "css/values/shorthands.h"
#include "css/values/value_parsers.h"

namespace qorvex::css {

namespace {

// Which value types take the word "initial". The keyword enums tell by having the word.
template <class T>
inline constexpr bool kTakesInitial = false;
template <class T>
requires requires {
    T::Initial;
}
inline constexpr bool kTakesInitial<T> = true;
#define QORVEX_TAKES_INITIAL(type) \
    template <>                    \
    inline constexpr bool kTakesInitial<type> = true;
QORVEX_TAKES_INITIAL(Extent)
QORVEX_TAKES_INITIAL(BorderWidth)
QORVEX_TAKES_INITIAL(LetterSpacing)
QORVEX_TAKES_INITIAL(LineHeight)
QORVEX_TAKES_INITIAL(BorderColor)
QORVEX_TAKES_INITIAL(ImageValue)
QORVEX_TAKES_INITIAL(ImageValueList)
QORVEX_TAKES_INITIAL(BackgroundSize)
QORVEX_TAKES_INITIAL(BackgroundSizeListType)
QORVEX_TAKES_INITIAL(BackgroundPosition)
QORVEX_TAKES_INITIAL(BackgroundPositionList)
QORVEX_TAKES_INITIAL(CursorProperty)
QORVEX_TAKES_INITIAL(TransitionProperty)
#undef QORVEX_TAKES_INITIAL

template <class T>
void SerialiseAs(const void* value, CssString& out) {
    Serialise(*static_cast<const T*>(value), out);
}

template <class T>
bool EqualAs(const void* a, const void* b) {
    return *static_cast<const T*>(a) == *static_cast<const T*>(b);
}

template <class T>
void* CloneAs(const void* value) {
    return New<T, MemoryTag::CSS>(*static_cast<const T*>(value));
}

template <class T>
void DestroyAs(void* value) {
    Delete<MemoryTag::CSS>(static_cast<T*>(value));
}

template <PropertyId id>
void SetInitial(Declaration& out) {
    out.SetValue<id>(PropertyTraits<id>::Initial());
}

template <PropertyId id>
constexpr ValueOperations MakeOperations(bool (*parse)(std::string_view, Declaration&)) {
    using T = typename PropertyTraits<id>::Type;
    return {parse,
            SerialiseAs<T>,
            EqualAs<T>,
            kInlineValue<T> ? nullptr : CloneAs<T>,
            kInlineValue<T> ? nullptr : DestroyAs<T>,
            SetInitial<id>,
            kTakesInitial<T>};
}

constexpr std::array<ValueOperations, kLonghandCount> kOperations = {
#define QORVEX_ROW(id, name, type, parser, ...)                                  \
    MakeOperations<PropertyId::id>([](std::string_view text, Declaration& out) { \
        PropertyTraits<PropertyId::id>::Type value{};                            \
        if (!parser(text, value)) return false;                                  \
        out.SetValue<PropertyId::id>(std::move(value));                          \
        return true;                                                             \
    }),
    QORVEX_CSS_LONGHANDS(QORVEX_ROW)
#undef QORVEX_ROW
};

using Expander = bool (*)(std::string_view, ShorthandOutput&);
constexpr Expander kExpanders[] = {
#define QORVEX_ROW(id, name, expander) expander,
    QORVEX_CSS_SHORTHANDS(QORVEX_ROW)
#undef QORVEX_ROW
};

}  // namespace

const ValueOperations& OperationsOf(PropertyId longhand) {
    return kOperations[IndexOf(longhand)];
}

bool ParseLonghand(PropertyId id, std::string_view text, Declaration& out) {
    if (!IsLonghand(id)) return false;
    text = Trim(text);
    const ValueOperations& operations = OperationsOf(id);
    // The parent decides what "auto" means here (CSS Basic User Interface Module Level 4, 6.1).
    bool autoInherits = id == PropertyId::UserSelect && EqualsIgnoreCase(text, "auto");
    if (EqualsIgnoreCase(text, "inherit") || autoInherits) {
        out = Declaration::Inherit(id, out.flags());
        return true;
    }
    if (operations.acceptsInitial && EqualsIgnoreCase(text, "initial")) {
        operations.setInitial(out);
        return true;
    }
    return operations.parse(text, out);
}

bool ParseShorthand(PropertyId id, std::string_view text, uint8_t flags, CssVector<Declaration>& out) {
    if (!IsShorthand(id)) return false;
    text = Trim(text);
    size_t before = out.size();
    ShorthandOutput output{out, flags};
    Expander expand = kExpanders[IndexOf(id) - kLonghandCount - 1];
    if (!text.empty() && expand(text, output)) return true;
    out.truncate(before);
    // These words alone mean it for each longhand.
    bool inherit = EqualsIgnoreCase(text, "inherit");
    if (!inherit && !EqualsIgnoreCase(text, "initial")) return false;
    for (PropertyId longhand : LonghandsOf(id)) {
        if (inherit)
            output.Add(Declaration::Inherit(longhand));
        else
            output.AddInitial(longhand);
    }
    return true;
}

void SerialiseValue(PropertyId id, const void* value, CssString& out) {
    if (IsLonghand(id)) OperationsOf(id).serialise(value, out);
}

void SerialiseDeclaration(const Declaration& declaration, CssString& out) {
    switch (declaration.kind()) {
        case DeclarationKind::Inherit:
            out.append("inherit");
            return;
        case DeclarationKind::CustomExpression:
            declaration.expression().AppendText(out);
            return;
        case DeclarationKind::Value:
            return SerialiseValue(declaration.property(), declaration.value(), out);
    }
}

}  // namespace qorvex::css
