#include "resources/resource_request.h"

namespace qorvex {

namespace {

const char* OptionalText(const std::optional<ResourceRequestDescription::Text>& text) {
    return text ? text->c_str() : nullptr;
}

std::string_view UpToDot(std::string_view url) {
    const size_t dot = url.rfind('.');
    return dot == std::string_view::npos ? std::string_view() : url.substr(0, dot + 1);
}

URL WithExtension(std::string_view stem, std::string_view extension) {
    ResourceRequestDescription::Text text(stem);
    text.append(extension);
    return URL(text.view());
}

}  // namespace

const char* AsyncResourceRequest::GetURL() const {
    return description_.url.GetText().c_str();
}

const char* AsyncResourceRequest::GetAbsoluteURL() const {
    return description_.absolute_url.GetText().c_str();
}

const char* AsyncResourceRequest::GetMethod() const {
    static constexpr const char* kNames[] = {"POST", "GET", "HEAD", "PUT", "PATCH", "DELETE"};
    const auto index = static_cast<size_t>(description_.method);
    return index < std::size(kNames) ? kNames[index] : "";
}

const char* AsyncResourceRequest::GetUser() const {
    return OptionalText(description_.user);
}

const char* AsyncResourceRequest::GetPassword() const {
    return OptionalText(description_.password);
}

const char* AsyncResourceRequest::GetHeaderValueAt(unsigned index) const {
    return index < description_.headers.size() ? description_.headers[index].value.c_str() : nullptr;
}

const char* AsyncResourceRequest::GetHeaderValue(const char* name) const {
    if (!name) return nullptr;
    for (const auto& header : description_.headers)
        if (header.name == std::string_view(name)) return header.value.c_str();
    return nullptr;
}

unsigned AsyncResourceRequest::GetHeadersCount() const {
    return static_cast<unsigned>(description_.headers.size());
}

const char* AsyncResourceRequest::GetHeaderNameAt(unsigned index) const {
    return index < description_.headers.size() ? description_.headers[index].name.c_str() : nullptr;
}

const char* AsyncResourceRequest::GetBody() const {
    return OptionalText(description_.body);
}

size_t AsyncResourceRequest::GetBodySize() const {
    return description_.body ? description_.body->size() : 0;
}

IAsyncResourceRequest::AlternativeURLs AsyncResourceRequest::GetAlternativeURLs() const {
    if (alternative_pointers_.empty()) return {};
    return {const_cast<const char**>(alternative_pointers_.data()),
            static_cast<unsigned>(alternative_pointers_.size())};
}

void AsyncResourceRequest::ApplyMapping(const ResourceMappingTable& table) {
    const std::string_view absolute = description_.absolute_url.GetText();
    mapping_ = table.Find(absolute);
    if (!mapping_) return;
    const std::string_view stem = UpToDot(absolute);
    for (size_t i = 1; i < mapping_->substitutes.size(); ++i) {
        ResourceRequestDescription::Text alternative(stem);
        alternatives_.push_back(std::move(alternative.append(mapping_->substitutes[i])));
    }
    for (const auto& alternative : alternatives_)
        alternative_pointers_.push_back(alternative.c_str());

    description_.absolute_url = WithExtension(stem, mapping_->substitutes[0]);
    // A relative URL without a dot of its own names nothing that could be replaced.
    if (const std::string_view own = UpToDot(description_.url.GetText()); !own.empty())
        description_.url = WithExtension(own, mapping_->substitutes[0]);
}

}  // namespace qorvex
