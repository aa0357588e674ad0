#include "css/values/style_declaration_set.h"

#include "css/values/value_text.h"

namespace qorvex::css {

bool StyleDeclarationSet::Set(Declaration declaration) {
    for (Declaration& existing : declarations_) {
        if (existing.property() != declaration.property()) continue;
        if (existing == declaration) return false;
        existing = std::move(declaration);
        return true;
    }
    declarations_.push_back(std::move(declaration));
    return true;
}

bool StyleDeclarationSet::Remove(PropertyId id) {
    return declarations_.erase_if(
               [id](const Declaration& declaration) { return declaration.property() == id; }) > 0;
}

void StyleDeclarationSet::SetCustomProperty(Atom name, CustomPropertyPtr record) {
    customProperties_.insert_or_assign(name, std::move(record));
}

bool StyleDeclarationSet::RemoveCustomProperty(Atom name) {
    return customProperties_.erase(name) > 0;
}

void StyleDeclarationSet::Clear() {
    declarations_.clear();
    customProperties_.clear();
}

const Declaration* StyleDeclarationSet::Find(PropertyId id) const {
    for (const Declaration& declaration : declarations_)
        if (declaration.property() == id) return &declaration;
    return nullptr;
}

void StyleDeclarationSet::AppendText(CssString& out) const {
    for (const Declaration& declaration : declarations_) {
        out.append(PropertyName(declaration.property()));
        out.append(": ");
        SerialiseDeclaration(declaration, out);
        if (declaration.important()) out.append(" !important");
        out.append("; ");
    }
    for (const auto& [name, record] : customProperties_) {
        out.append("--");
        out.append(name.view());
        out.append(": ");
        out.append(record->text);
        if (record->flags & kImportant) out.append(" !important");
        out.append("; ");
    }
}

CssString StyleDeclarationSet::ToText() const {
    CssString text;
    AppendText(text);
    return text;
}

CssVector<NamedValue> StyleDeclarationSet::ToNameValueList() const {
    CssVector<NamedValue> list;
    list.reserve(declarations_.size());
    for (const Declaration& declaration : declarations_) {
        NamedValue& entry = list.emplace_back();
        entry.name = PropertyName(declaration.property());
        entry.important = declaration.important();
        SerialiseDeclaration(declaration, entry.value);
    }
    return list;
}

}  // namespace qorvex::css
