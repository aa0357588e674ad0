// What a folder serves, and what it keeps to itself.
#include "host/folder_resource_handler.h"

#include <gtest/gtest.h>

#include <fstream>
#include <string>
#include <vector>

#include <sys/stat.h>
#include <unistd.h>

namespace {

using namespace qorvex;
namespace fs = std::filesystem;

struct Request final : IAsyncResourceRequest {
    explicit Request(std::string wanted) : url(std::move(wanted)) {}
    unsigned GetId() const override { return 1; }
    const char* GetURL() const override { return url.c_str(); }
    const char* GetAbsoluteURL() const override { return url.c_str(); }
    const char* GetMethod() const override { return "GET"; }
    const char* GetUser() const override { return nullptr; }
    const char* GetPassword() const override { return nullptr; }
    const char* GetHeaderValueAt(unsigned) const override { return nullptr; }
    const char* GetHeaderValue(const char*) const override { return nullptr; }
    unsigned GetHeadersCount() const override { return 0; }
    const char* GetHeaderNameAt(unsigned) const override { return nullptr; }
    const char* GetBody() const override { return nullptr; }
    std::size_t GetBodySize() const override { return 0; }
    AlternativeURLs GetAlternativeURLs() const override { return {}; }
    std::string url;
};

struct Response final : IAsyncResourceResponse {
    void* GetSpace(std::size_t size) override {
        body.resize(size);
        return body.data();
    }
    void RecieveUserImage(const UserImageData&) override {}
    void SignalDataReceived() override {}
    void SetStatus(std::uint16_t value) override { status = value; }
    void SetResponseURL(const char*) override {}
    void SetHeader(const char*, const char* value) override { type = value; }
    void Finish(Status value) override { ok = value == Status::Success; }
    std::string body, type;
    int status = 0;
    bool ok = false;
};

class FolderTest : public testing::Test {
  protected:
    FolderTest() {
        base_ = fs::temp_directory_path() / ("qorvex-folder-" + std::to_string(getpid()));
        fs::create_directories(base_ / "page/sub");
        fs::create_directories(base_ / "pages");
        for (const char* file : {"page/a b.html", "page/sub/s.css", "pages/other.html", "secret.txt"})
            std::ofstream(base_ / file) << file;
        std::ofstream(base_ / "page/empty.js");
        fs::create_symlink(base_ / "secret.txt", base_ / "page/link.txt");
        fs::create_symlink("sub/s.css", base_ / "page/near.css");
        mkfifo((base_ / "page/pipe").c_str(), 0600);
    }
    ~FolderTest() override { fs::remove_all(base_); }

    Response Ask(const std::string& url) {
        host::FolderResourceHandler handler(base_ / "page/",
                                            [this](const std::string& line) { reports_.push_back(line); });
        const Request request(url);
        Response response;
        handler.OnResourceRequest(&request, &response);
        return response;
    }
    std::string URLOf(const char* name) const { return "file://" + (base_ / name).string(); }

    fs::path base_;
    std::vector<std::string> reports_;
};

TEST_F(FolderTest, ServesWhatLiesInItWhole) {
    const Response page = Ask(host::FileURL(base_ / "page/a b.html") + "?query#part");
    EXPECT_TRUE(page.ok);
    EXPECT_EQ(page.body, "page/a b.html");
    EXPECT_EQ(page.status, 200);
    EXPECT_EQ(page.type, "text/html");
    EXPECT_EQ(Ask(URLOf("page/sub/../sub/s.css")).body, "page/sub/s.css");
    EXPECT_EQ(Ask(URLOf("page/near.css")).body, "page/sub/s.css");
    const Response empty = Ask(URLOf("page/empty.js"));
    EXPECT_TRUE(empty.ok && empty.body.empty());
    EXPECT_TRUE(reports_.empty());
}

TEST_F(FolderTest, CallsEverythingElseMissingAndSaysWhy) {
    const std::pair<std::string, std::string> cases[] = {
        {URLOf("page/../secret.txt"), "outside of " + fs::canonical(base_).string() + "/page/"},
        {URLOf("page/link.txt"), "outside of "},
        {URLOf("pages/other.html"), "outside of "},
        {URLOf("page/none.html"), "no such file"},
        {URLOf("page/sub"), "not a file"},
        {URLOf("page/pipe"), "not a file"},
        {URLOf("page/a%00b"), "not an absolute path"},
        {"http://host/a.html", "only file:// is served"},
    };
    for (const auto& [url, why] : cases) {
        const Response response = Ask(url);
        EXPECT_EQ(response.status, 404) << url;
        EXPECT_FALSE(response.ok) << url;
        ASSERT_FALSE(reports_.empty()) << url;
        EXPECT_EQ(reports_.back().find("404 " + url + ": " + why), 0u) << reports_.back();
        reports_.clear();
    }
}

}  // namespace
