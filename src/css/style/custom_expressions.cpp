#include "css/style/custom_expressions.h"

#include "core/limits.h"
#include "core/logging/log.h"
#include "css/parser/convert.h"
#include "css/style/calc.h"
#include "css/values/value_text.h"

namespace qorvex::css {
namespace {

// Appends the full text of one variable. The references form a tree that the page decides about, so the walk
// keeps its own stack; and since no name is taken twice, it ends.
class VariableResolver {
  public:
    VariableResolver(const CustomPropertyMap* map, CssString& out) : map_(map), out_(out) {}

    [[nodiscard]] bool Append(Atom name) {
        visited_.clear();
        stack_.clear();
        if (!Enter(name)) return false;
        while (!stack_.empty()) {
            Frame& frame = stack_.back();
            const CustomProperty& record = *frame.record;
            const std::string_view text = record.text;
            if (frame.nextReference == record.references.size()) {
                out_.append(text.substr(frame.position));
                stack_.pop_back();
                if (!CheckSize()) return false;
                continue;
            }
            const CustomProperty::Reference& reference = record.references[frame.nextReference++];
            out_.append(text.substr(frame.position, reference.offset - frame.position));
            frame.position = reference.offset + reference.length;
            if (!Enter(reference.name)) return false;  // invalidates `frame`
        }
        return true;
    }

    uint8_t flags() const { return flags_; }

  private:
    struct Frame {
        const CustomProperty* record;
        uint32_t nextReference = 0;
        size_t position = 0;
    };

    bool Enter(Atom name) {
        if (visited_.contains(name)) {
            LogWarning("Cyclic dependency detected in custom expression: '", name.view(), "'");
            return false;
        }
        visited_.insert(name);
        const CustomPropertyPtr* record = map_ ? map_->get(name) : nullptr;
        if (!record) return false;
        flags_ |= (*record)->flags;
        stack_.push_back({record->get(), 0, 0});
        return true;
    }

    bool CheckSize() const {
        if (out_.size() <= limits::kSubstitutedTextBytes) return true;
        LogWarning("The text of a custom expression is longer than ", limits::kSubstitutedTextBytes,
                   " bytes!");
        return false;
    }

    const CustomPropertyMap* map_;
    CssString& out_;
    CssSmallVector<Frame, 8> stack_;
    HashSet<Atom, MemoryTag::CSS> visited_;
    uint8_t flags_ = 0;
};

bool FillTemplate(const CustomExpression& expression, const CustomPropertyMap* map, CssString& text,
                  uint8_t& flags) {
    const std::string_view source = expression.text;
    VariableResolver resolver(map, text);
    size_t position = 0;
    for (const CustomExpression::Reference& reference : expression.references) {
        text.append(source.substr(position, reference.offset - position));
        position = reference.offset;
        if (!resolver.Append(reference.name)) {
            LogWarning("Unable to resolve custom variable: ", reference.name.view());
            return false;
        }
    }
    text.append(source.substr(position));
    flags |= resolver.flags();
    return true;
}

// Values have their operators without spaces. Expressions keep some, because they are printed to be read
// again.
void CloseOperators(CssString& text) {
    char quote = '\0';
    size_t size = 0;
    for (size_t i = 0; i < text.size(); ++i) {
        const char c = text[i];
        if (quote != '\0') {
            if (c == quote) quote = '\0';
            if (c == '\\' && i + 1 < text.size()) text[size++] = text[i++];
        } else if (c == '"' || c == '\'') {
            quote = c;
        } else if (c == ' ' && i + 2 < text.size() && (text[i + 1] == '+' || text[i + 1] == '-') &&
                   text[i + 2] == ' ') {
            text[size++] = text[i + 1];
            i += 2;
            continue;
        }
        text[size++] = text[i];
    }
    text.resize(size);
}

bool ReplaceCalc(CssString& text, const ExpressionContext& context) {
    CssString computed;
    bool done = false;
    if (!context.parent || !context.root) {
        AssertFailure("Calc() expression resolver has insufficient data!");
    } else {
        const LengthContext metrics{context.vw, context.vh, context.parent->text->computedFontSize,
                                    context.root->text->computedFontSize, 0};
        done = EvaluateCalc(text, computed, metrics);
    }
    if (!done) {
        LogWarning("Unable to evaluate calc() expression: ", std::string_view(text));
        return false;
    }
    text = std::move(computed);
    return true;
}

}  // namespace

bool EvaluateCustomExpression(const Declaration& declaration, const LayoutStyleRefs& style,
                              const ExpressionContext& context, Declaration& out) {
    CssString text;
    uint8_t flags = declaration.flags();
    const CustomPropertyMap* map = style.customProperties ? &style.customProperties->map : nullptr;
    if (!FillTemplate(declaration.expression(), map, text, flags)) return false;
    CloseOperators(text);
    if ((flags & kHasCalc) && !ReplaceCalc(text, context)) return false;
    if (!ParseLonghand(declaration.property(), text, out)) {
        LogWarning("Unable to parse declaration: ", std::string_view(text));
        return false;
    }
    if (context.base) ResolveImageUrls(out, *context.base);
    return true;
}

}  // namespace qorvex::css
