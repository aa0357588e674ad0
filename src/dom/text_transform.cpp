#include "dom/text_transform.h"

#include <qorvex/text_services.h>

#include <optional>

#include "core/logging/log.h"
#include "dom/document.h"
#include "dom/document_host.h"

namespace qorvex::dom {

namespace {

std::optional<CaseOperation> OperationOf(css::TextTransformType value) {
    switch (value) {
        case css::TextTransformType::Capitalize:
            return CaseOperation::Capitalize;
        case css::TextTransformType::Uppercase:
            return CaseOperation::ToUpper;
        case css::TextTransformType::Lowercase:
            return CaseOperation::ToLower;
        default:
            return std::nullopt;
    }
}

class Result final : public ITransformationResult {
  public:
    explicit Result(NodeText& out) : out_(out) {}
    void Set(const char* utf8, unsigned length) override { out_ = std::string_view(utf8, length); }

  private:
    NodeText& out_;
};

}  // namespace

TextTransformResult TransformText(const css::LaidOutStyle& style, Document& document, std::string_view text,
                                  NodeText& out) {
    const std::optional<CaseOperation> operation = OperationOf(style.text->textTransform);
    if (!operation || text.empty()) return TextTransformResult::NotWanted;
    ITextTransformationManager* manager = document.GetHost().GetTextTransformationManager();
    if (!manager) {
        LogWarning("Text transformation is requested, but ITextTransformationManager is not provided");
        return TextTransformResult::NotWanted;
    }
    const auto length = static_cast<unsigned>(text.size());
    unsigned written = length * 4 + 1;
    out.resize(written);
    if (manager->CaseMapCharacters(*operation, text.data(), length, out.data(), &written)) {
        out.resize(std::min<size_t>(written, out.size()));
        return TextTransformResult::Done;
    }
    Result result(out);
    return manager->CaseMapCharacters(*operation, text.data(), length, &result) ? TextTransformResult::Done
                                                                                : TextTransformResult::Failed;
}

}  // namespace qorvex::dom
