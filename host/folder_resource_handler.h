#pragma once

#include <qorvex/resource_handler.h>

#include <cstdint>
#include <filesystem>
#include <functional>
#include <memory>
#include <string>
#include <string_view>

namespace qorvex::host {

class OpenedFile;

// Serves "file://" URLs from one folder and below. What is missing gets status 404 and a line to the report
// callback; what lies outside of the root, by ".." or by a symbolic link, counts as missing. Answers come
// inside the call, on the calling thread; files are read whole, streams piece by piece. Safe to call from any
// thread.
class FolderResourceHandler final : public IAsyncResourceHandler {
  public:
    using Report = std::function<void(const std::string& line)>;

    // root: the folder that pages may read. report: gets one line for each request that fails; may be empty.
    explicit FolderResourceHandler(const std::filesystem::path& root, Report report = {});

    void OnResourceRequest(const IAsyncResourceRequest* request, IAsyncResourceResponse* response) override;
    void OnResourceStreamRequest(const IAsyncResourceRequest* request,
                                 IAsyncResourceStreamResponse* response) override;

  private:
    // The file that a URL names; null, reported, when there is none to be served.
    [[nodiscard]] std::unique_ptr<OpenedFile> Find(std::string_view url) const;

    std::string root_;  // real, with a slash behind it
    Report report_;
};

// "file://" URL of a path, percent-encoded.
[[nodiscard]] std::string FileURL(const std::filesystem::path& path);

// The MIME type of a file name or path by its extension; "application/octet-stream" when unknown.
[[nodiscard]] const char* MimeType(std::string_view file_name);

}  // namespace qorvex::host
