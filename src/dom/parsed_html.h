// The HTML parser's tree of one text, made on a resource thread and shared read-only: by the cache and by
// every builder that walks it. All memory of the parse lies in one arena that goes as a whole, because the
// parser's own destroy recurses as deep as the page nests. The source is retained: tag names and positions
// point into it.
#pragma once

#include <string_view>

#include "core/memory/containers.h"
#include "dom/parse_arena.h"
#include "qsl/ref_ptr.h"

struct GumboInternalOutput;
struct GumboInternalNode;

namespace qorvex::dom {

class ParsedHTML : public AtomicRefCounted<ParsedHTML, MemoryTag::DOM> {
  public:
    // Runs once when the record dies; gives the source bytes back to who lent them.
    using ReleaseSource = Function<void(), MemoryTag::DOM>;

    ParsedHTML(std::string_view source, ReleaseSource release);
    ~ParsedHTML();
    ParsedHTML(const ParsedHTML&) = delete;
    ParsedHTML& operator=(const ParsedHTML&) = delete;

    // Null when the parser made nothing.
    const GumboInternalNode* GetDocumentNode() const;
    const GumboInternalNode* GetRootNode() const;
    // The source nests so deep that tags were left out before the parser saw it.
    bool IsNestingCut() const { return nesting_cut_; }
    size_t GetArenaBytes() const { return arena_.GetAllocatedBytes(); }

  private:
    friend RefPtr<ParsedHTML> ParseHTML(std::string_view bytes, ReleaseSource release);

    GumboInternalOutput* output_ = nullptr;
    ParseArena arena_;
    std::string_view source_;
    ReleaseSource release_;
    bool nesting_cut_ = false;
    TaggedString<MemoryTag::DOM> rewritten_;  // what was parsed instead of a source that nests without end
};

// Borrows `bytes` until `release` is called. Any thread. Never null; a failed parse has no root.
RefPtr<ParsedHTML> ParseHTML(std::string_view bytes, ParsedHTML::ReleaseSource release);
// Copies `bytes`.
RefPtr<ParsedHTML> ParseHTML(std::string_view bytes);

}  // namespace qorvex::dom
