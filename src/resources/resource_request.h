// A request as the client reads it: a copy of what the caller asked for, with the resource mapping applied.
//
// Invariant: nothing changes after the request has been handed to the client, so any thread may read it.
#pragma once

#include <qorvex/resource_handler.h>

#include <optional>
#include <string_view>

#include "core/memory/containers.h"
#include "core/url/url.h"
#include "resources/resource_mapping.h"

namespace qorvex {

enum class RequestMethod : uint32_t { Post = 0, Get = 1, Head = 2, Put = 3, Patch = 4, Delete = 5 };

struct ResourceRequestDescription {
    using Text = TaggedString<MemoryTag::Resources>;
    struct Header {
        Text name;
        Text value;
    };

    URL url;
    URL absolute_url;
    RequestMethod method = RequestMethod::Get;
    std::optional<Text> user;
    std::optional<Text> password;
    std::optional<Text> body;
    Vector<Header, MemoryTag::Resources> headers;
};

class AsyncResourceRequest : public IAsyncResourceRequest {
  public:
    AsyncResourceRequest(const ResourceRequestDescription& description, uint32_t id)
        : description_(description), id_(id) {}
    ~AsyncResourceRequest() override = default;

    unsigned GetId() const override { return id_; }
    const char* GetURL() const override;
    const char* GetAbsoluteURL() const override;
    const char* GetMethod() const override;
    const char* GetUser() const override;
    const char* GetPassword() const override;
    const char* GetHeaderValueAt(unsigned index) const override;
    const char* GetHeaderValue(const char* name) const override;
    unsigned GetHeadersCount() const override;
    const char* GetHeaderNameAt(unsigned index) const override;
    const char* GetBody() const override;
    size_t GetBodySize() const override;
    AlternativeURLs GetAlternativeURLs() const override;

    const ResourceRequestDescription& GetDescription() const { return description_; }
    // Replaces the extension by the first substitute of the entry that fits, and lists the others. It needs
    // nothing but the table, since it may run on a resource thread.
    void ApplyMapping(const ResourceMappingTable& table);

  private:
    ResourceRequestDescription description_;
    uint32_t id_;
    const ResourceMappingTable::Entry* mapping_ = nullptr;
    // Built with the mapping, not on the first call: calls may come from several threads.
    Vector<ResourceRequestDescription::Text, MemoryTag::Resources> alternatives_;
    Vector<const char*, MemoryTag::Resources> alternative_pointers_;
};

}  // namespace qorvex
