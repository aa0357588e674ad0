// Which file extensions a game's build has replaced: a request for ".png" may have to ask for ".dds". The
// table is filled once by the system and only read afterwards, from any thread.
#pragma once

#include <qorvex/system.h>

#include <string_view>

#include "core/memory/containers.h"

namespace qorvex {

class ResourceMappingTable {
  public:
    using Text = TaggedString<MemoryTag::Resources>;

    struct Entry {
        Text extension;
        // The first one replaces the extension, the others are offered as alternatives.
        Vector<Text, MemoryTag::Resources> substitutes;
    };

    void Add(const ResourceMapping& mapping);
    // The entry for what follows the last "." of the URL, compared without case; null when there is none.
    const Entry* Find(std::string_view url) const;

  private:
    Vector<Entry, MemoryTag::Resources> entries_;
};

}  // namespace qorvex
