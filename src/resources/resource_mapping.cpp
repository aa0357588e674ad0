#include "resources/resource_mapping.h"

#include "resources/url_key.h"

namespace qorvex {

void ResourceMappingTable::Add(const ResourceMapping& mapping) {
    if (!mapping.Name || mapping.TargetCount == 0 || !mapping.Targets) return;
    Entry entry;
    entry.extension = std::string_view(mapping.Name);
    for (uint32_t i = 0; i < mapping.TargetCount; ++i)
        if (mapping.Targets[i]) entry.substitutes.emplace_back(mapping.Targets[i]);
    if (entry.substitutes.empty()) return;
    entries_.push_back(std::move(entry));
}

const ResourceMappingTable::Entry* ResourceMappingTable::Find(std::string_view url) const {
    const size_t dot = url.rfind('.');
    if (dot == std::string_view::npos) return nullptr;
    const std::string_view extension = url.substr(dot + 1);
    for (const Entry& entry : entries_)
        if (EqualsIgnoringCase(entry.extension, extension)) return &entry;
    return nullptr;
}

}  // namespace qorvex
