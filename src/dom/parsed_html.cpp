#include "dom/parsed_html.h"

#include <gumbo.h>

#include "core/limits.h"
#include "core/logging/log.h"
#include "dom/nesting_guard.h"

namespace qorvex::dom {

namespace {

constexpr size_t kArenaPerSourceByte = 32;
// Small pages leave a block behind that the rest of their making can use.
constexpr size_t kMinArenaBytes = 0x4000;
constexpr size_t kMaxFirstChunkBytes = size_t{64} << 20;

void* AllocateInArena(void* arena, size_t size) {
    return static_cast<ParseArena*>(arena)->Allocate(size);
}
void FreeNothing(void*, void*) {}

size_t FirstChunkBytes(size_t source_bytes) {
    return std::clamp(source_bytes * kArenaPerSourceByte, kMinArenaBytes, kMaxFirstChunkBytes);
}

}  // namespace

ParsedHTML::ParsedHTML(std::string_view source, ReleaseSource release)
    : arena_(FirstChunkBytes(source.size())), source_(source), release_(std::move(release)) {}

ParsedHTML::~ParsedHTML() {
    if (release_) release_();
}

const GumboInternalNode* ParsedHTML::GetDocumentNode() const {
    return output_ ? output_->document : nullptr;
}
const GumboInternalNode* ParsedHTML::GetRootNode() const {
    return output_ ? output_->root : nullptr;
}

RefPtr<ParsedHTML> ParseHTML(std::string_view bytes, ParsedHTML::ReleaseSource release) {
    LogTrace("Parsing HTML with size ", bytes.size());
    RefPtr<ParsedHTML> parsed = MakeRef<ParsedHTML>(bytes, std::move(release));
    std::string_view text = bytes;
    if (text.starts_with("\xEF\xBB\xBF")) text.remove_prefix(3);
    const TamedSource tamed = TameSource(text, parsed->rewritten_);
    if (tamed.IsRewritten()) text = parsed->rewritten_;
    parsed->nesting_cut_ = tamed.nesting;
    if (tamed.attributes)
        LogWarning("HTML has a tag of more than ", limits::kMaxSourceAttributes,
                   " attributes; the others are left out");
    if (tamed.formatting)
        LogWarning("HTML leaves too much formatting unclosed; the tags behind it are left out");

    GumboOptions options = kGumboDefaultOptions;
    options.allocator = AllocateInArena;
    options.deallocator = FreeNothing;
    options.userdata = &parsed->arena_;
    options.tab_stop = 8;
    options.stop_on_first_error = false;
    // Nothing reads the errors, and each keeps a copy of the stack of open elements: memory would grow with
    // the square of the nesting.
    options.max_errors = 0;
    options.fragment_context = GUMBO_TAG_LAST;
    options.fragment_namespace = GUMBO_NAMESPACE_HTML;
    parsed->output_ = gumbo_parse_with_options(&options, text.data(), text.size());
    if (!parsed->GetRootNode()) LogError("Unable to parse HTML!");
    return parsed;
}

RefPtr<ParsedHTML> ParseHTML(std::string_view bytes) {
    auto copy = MakeUnique<TaggedString<MemoryTag::DOM>, MemoryTag::DOM>(bytes);
    const std::string_view text = *copy;
    return ParseHTML(text, [copy = std::move(copy)] {});
}

}  // namespace qorvex::dom
