// Which characters a document shows in which fonts, and which texts of letters that take other shapes beside
// each other, so that all shapes are made on a worker before the first frame needs them. DOM thread.
#pragma once

#include <string_view>

#include "core/memory/containers.h"
#include "core/tasks/task.h"
#include "css/values/style_groups.h"

namespace fresco {
class IFontService;
}

namespace qorvex::dom {

class FontUsage {
  public:
    using Typefaces = css::CssSmallVector<uint32_t, 4>;

    // A character counts as new once for each list of typefaces, which goes by its first loaded one.
    void Add(const Typefaces& typefaces, std::string_view utf8);
    // The body of the task PreloadFontData; null when nothing is new.
    TaskPtr TakeTask(fresco::IFontService& service);

    // A text that has to be shaped, with the letter that shows it: the first font that has it has the rest.
    struct ShapedText {
        TaggedString<MemoryTag::DOM> text;
        uint32_t letter = 0;
    };
    using ShapedTexts = Vector<ShapedText, MemoryTag::DOM>;

  private:
    struct Entry {
        Typefaces typefaces;
        HashSet<uint32_t, MemoryTag::DOM> seen;
        Vector<uint32_t, MemoryTag::DOM> fresh;
        HashSet<uint64_t, MemoryTag::DOM> seenTexts;  // hashes
        ShapedTexts freshTexts;
        uint64_t ascii[2] = {};  // seen ones below 0x80, where nearly all are
        bool IsNew(uint32_t code);
        bool IsNewText(std::string_view utf8);
    };
    HashMap<uint32_t, Entry, MemoryTag::DOM> entries_;
    bool has_fresh_ = false;
};

}  // namespace qorvex::dom
