#include "folder_resource_handler.h"

#include <algorithm>
#include <cctype>

#include "file_stream_reader.h"
#include "opened_file.h"

namespace qorvex::host {
namespace fs = std::filesystem;
namespace {

constexpr std::uint16_t kOk = 200;
constexpr std::uint16_t kNotFound = 404;
// A page has no use for a file beyond this, and a handler must not take all memory for a wrong link.
constexpr std::uintmax_t kLargestFile = std::uintmax_t{1} << 30;

struct MimeRow {
    std::string_view extension;
    const char* type;
};

constexpr MimeRow kMimeTypes[] = {
    {"html", "text/html"},     {"htm", "text/html"},       {"css", "text/css"},
    {"js", "text/javascript"}, {"mjs", "text/javascript"}, {"json", "application/json"},
    {"txt", "text/plain"},     {"xml", "application/xml"}, {"svg", "image/svg+xml"},
    {"png", "image/png"},      {"jpg", "image/jpeg"},      {"jpeg", "image/jpeg"},
    {"gif", "image/gif"},      {"webp", "image/webp"},     {"ttf", "font/ttf"},
    {"otf", "font/otf"},       {"ttc", "font/collection"}, {"otc", "font/collection"},
    {"woff", "font/woff"},     {"woff2", "font/woff2"},    {"webm", "video/webm"},
    {"mp4", "video/mp4"},      {"ogg", "audio/ogg"},       {"wav", "audio/wav"},
};

int HexDigit(char c) {
    if (c >= '0' && c <= '9') return c - '0';
    if (c >= 'a' && c <= 'f') return c - 'a' + 10;
    if (c >= 'A' && c <= 'F') return c - 'A' + 10;
    return -1;
}

std::string PercentDecode(std::string_view text) {
    std::string out;
    for (size_t i = 0; i < text.size(); ++i) {
        if (text[i] == '%' && i + 2 < text.size() && HexDigit(text[i + 1]) >= 0 &&
            HexDigit(text[i + 2]) >= 0) {
            out += static_cast<char>(HexDigit(text[i + 1]) * 16 + HexDigit(text[i + 2]));
            i += 2;
        } else {
            out += text[i];
        }
    }
    return out;
}

// The path of a file URL, or an empty string with the reason in `why`.
std::string PathOf(std::string_view url, std::string& why) {
    constexpr std::string_view kScheme = "file://";
    if (url.substr(0, kScheme.size()) != kScheme) {
        why = "only file:// is served";
        return {};
    }
    url.remove_prefix(kScheme.size());
    url = url.substr(0, url.find_first_of("?#"));
    std::string name = PercentDecode(url);
    if (!name.empty() && name[0] == '/' && name.find('\0') == std::string::npos) return name;
    why = "not an absolute path";
    return {};
}

}  // namespace

FolderResourceHandler::FolderResourceHandler(const fs::path& root, Report report)
    : report_(std::move(report)) {
    std::error_code fault;
    const fs::path real = fs::weakly_canonical(root, fault);
    root_ = fault ? root.string() : real.string();
    // What begins like this lies below it: "/page/" and not "/pages".
    if (root_.empty() || root_.back() != '/') root_ += '/';
}

std::unique_ptr<OpenedFile> FolderResourceHandler::Find(std::string_view url) const {
    std::string why;
    const std::string name = PathOf(url, why);
    auto file = name.empty() ? nullptr : std::make_unique<OpenedFile>(name);
    if (file && !*file)
        why = file->GetFault();
    else if (file && file->GetPath().compare(0, root_.size(), root_) != 0)
        why = "outside of " + root_;
    else if (file && file->GetSize() > kLargestFile)
        why = "too large";
    if (why.empty()) return file;
    if (report_) report_("404 " + std::string(url) + ": " + why);
    return nullptr;
}

void FolderResourceHandler::OnResourceRequest(const IAsyncResourceRequest* request,
                                              IAsyncResourceResponse* response) {
    using Status = IAsyncResourceResponse::Status;
    const std::unique_ptr<OpenedFile> file = Find(request->GetAbsoluteURL());
    if (!file) {
        response->SetStatus(kNotFound);
        response->Finish(Status::Failure);
        return;
    }
    const auto size = static_cast<std::size_t>(file->GetSize());
    void* space = response->GetSpace(size);
    const bool whole = size == 0 || (space && file->ReadAll(space, size));
    response->SetHeader("Content-Type", MimeType(file->GetPath()));
    response->SetStatus(kOk);
    response->Finish(whole ? Status::Success : Status::Failure);
}

void FolderResourceHandler::OnResourceStreamRequest(const IAsyncResourceRequest* request,
                                                    IAsyncResourceStreamResponse* response) {
    using Status = IAsyncResourceStreamResponse::Status;
    const std::unique_ptr<OpenedFile> file = Find(request->GetAbsoluteURL());
    ISyncStreamReader* reader = file ? FileStreamReader::Open(file->GetPath()) : nullptr;
    if (reader) response->SetStreamReader(reader);
    response->Finish(reader ? Status::Success : Status::Failure);
}

std::string FileURL(const fs::path& path) {
    static constexpr char kHex[] = "0123456789ABCDEF";
    std::error_code fault;
    std::string url = "file://";
    for (const unsigned char c : fs::absolute(path, fault).lexically_normal().string()) {
        if (std::isalnum(c) ||
            std::string_view("/-_.~!$&'()*+,;=:@").find(static_cast<char>(c)) != std::string_view::npos) {
            url += static_cast<char>(c);
        } else {
            url += '%';
            url += kHex[c >> 4];
            url += kHex[c & 15];
        }
    }
    return url;
}

const char* MimeType(std::string_view file_name) {
    file_name.remove_prefix(file_name.rfind('/') + 1);
    const size_t dot = file_name.rfind('.');
    if (dot != std::string_view::npos) {
        std::string extension(file_name.substr(dot + 1));
        std::transform(extension.begin(), extension.end(), extension.begin(),
                       [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
        for (const MimeRow& row : kMimeTypes) {
            if (row.extension == extension) return row.type;
        }
    }
    return "application/octet-stream";
}

}  // namespace qorvex::host
