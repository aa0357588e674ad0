// The HTML parser's tree of one text, made on a resource thread and shared read-only: by the cache and by
// every builder that walks it. All memory of the parse lies in one arena that goes as a whole, because the
// parser's own destroy recurses as deep as the page nests. The source is retained: tag names and positions
// point into it.
#pragma once

#include <string_view>

#include "core/memory/containers.h"
#include "dom/parse_arena.h"
#include "qsl/function.h"
#include "qsl/ref_ptr.h"

struct GumboInternalOutput;
struct GumboInternalNode;

namespace qorvex::dom {

class ParsedHTML : public AtomicRefCounted<ParsedHTML, MemoryTag::DOM> {
  public:
    // Runs once when the record dies; gives the source bytes back to who lent them.
    using ReleaseSource = qsl::function<void()>;

    ParsedHTML(std::string_view source, ReleaseSource release);
    ~ParsedHTML();

    GumboInternalNode* GetDocumentNode() const;
    // Null when the parser made no root.
    GumboInternalNode* GetRootNode() const;
    std::string_view GetSource() const { return source_; }
    size_t GetArenaBytes() const { return arena_.GetAllocatedBytes(); }

  private:
    friend RefPtr<ParsedHTML> ParseHTML(std::string_view bytes, ReleaseSource release);

    GumboInternalOutput* output_ = nullptr;
    ParseArena arena_;
    std::string_view source_;
    ReleaseSource release_;
};

// Borrows `bytes` until `release` is called. Any thread. Never null; a failed parse has no root.
RefPtr<ParsedHTML> ParseHTML(std::string_view bytes, ParsedHTML::ReleaseSource release);
// Copies `bytes`.
RefPtr<ParsedHTML> ParseHTML(std::string_view bytes);

}  // namespace qorvex::dom
