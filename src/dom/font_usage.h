// Which characters a document shows in which fonts, so that their shapes are made on a worker before the
// first frame needs them. DOM thread.
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

  private:
    struct Entry {
        Typefaces typefaces;
        HashSet<uint32_t, MemoryTag::DOM> seen;
        Vector<uint32_t, MemoryTag::DOM> fresh;
        uint64_t ascii[2] = {};  // seen ones below 0x80, where nearly all are
        bool IsNew(uint32_t code);
    };
    HashMap<uint32_t, Entry, MemoryTag::DOM> entries_;
    bool has_fresh_ = false;
};

}  // namespace qorvex::dom
