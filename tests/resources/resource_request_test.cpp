// The objects that a client's resource handler sees.
#include <map>
#include <mutex>
#include <set>
#include <thread>

#include "core/limits.h"
#include "resources/resource_test_support.h"

namespace qorvex {
namespace {

using Status = IAsyncResourceResponse::Status;

class ResourceRequestTest : public ResourceTest {
  protected:
    // A request that waits for the test's answer.
    client::Files::Waiting Request(const char* url, bool binary = false) {
        files.SetDeferred(true);
        TaskPtr task = context->MakeResourceRequest(
            DescribeGet(MakeURL(url)),
            [this](ResourceRequestJob& job) { finished.push_back(job.GetStatus()); },
            [this](ResourceRequestJob&) { ++progress; }, binary, nullptr);
        client::Files::Waiting entry = files.waiting.back();
        files.waiting.pop_back();
        return entry;
    }
    static ResourceRequestJob& JobOf(const client::Files::Waiting& entry) {
        return const_cast<ResourceRequestJob&>(static_cast<const ResourceRequestJob&>(*entry.request));
    }
    std::vector<Status> finished;
    int progress = 0;
};

TEST_F(ResourceRequestTest, MappingChangesTheURLAndOffersAlternatives) {
    const char* targets[] = {"dds", nullptr, "ktx", "png"};
    ResourceMapping mapping;
    mapping.Name = "PNG";
    mapping.Targets = targets;
    mapping.TargetCount = 4;
    context->GetMappings().Add(mapping);
    context->SetBaseURL(MakeURL("coui://ui/index.html"));
    auto entry = Request("images/hero.png");
    EXPECT_EQ(entry.url, "coui://ui/images/hero.dds");
    EXPECT_STREQ(entry.request->GetURL(), "images/hero.dds");
    const auto alternatives = entry.request->GetAlternativeURLs();
    ASSERT_EQ(alternatives.Count, 2u);
    EXPECT_STREQ(alternatives.URLs[0], "coui://ui/images/hero.ktx");
    EXPECT_STREQ(alternatives.URLs[1], "coui://ui/images/hero.png");
    entry.response->Finish(Status::Success);
    auto plain = Request("coui://ui/a.txt");
    EXPECT_EQ(plain.request->GetAlternativeURLs().Count, 0u);
    plain.response->Finish(Status::Success);
}

// As on a client with requests on workers, while pages come and go on the main thread.
TEST_F(ResourceRequestTest, WorkersFinishMappedRequestsWhileTheBaseURLChanges) {
    constexpr int kRequests = 400;
    const char* targets[] = {"dds", "png"};
    ResourceMapping mapping;
    mapping.Name = "PNG";
    mapping.Targets = targets;
    mapping.TargetCount = 2;
    files.SetDeferred(false);
    context = MakeRef<ResourceContext>(&files, *responses, true);
    context->GetMappings().Add(mapping);
    std::mutex mutex;
    std::map<std::string, int> answered;
    std::vector<std::thread> workers;
    for (int i = 0; i < 2; ++i)
        workers.emplace_back([&] { tasks->Run(TaskChannels::Resources, true, nullptr, 1); });
    for (int i = 0; i < kRequests; ++i) {
        context->SetBaseURL(MakeURL(("coui://page" + std::to_string(i) + "/index.html").c_str()));
        auto count = [&](ResourceRequestJob& job) {
            std::lock_guard<std::mutex> lock(mutex);
            ++answered[job.GetAbsoluteURL()];
        };
        family.Push(TaskChannels::Resources, context->MakeResourceRequest(
                                                 DescribeGet(MakeURL("images/hero.png")), count,
                                                 [](ResourceRequestJob&) {}, true, nullptr));
    }
    while (context->GetOpenRequests() > 0)
        std::this_thread::yield();
    tasks->Stop();
    for (std::thread& worker : workers)
        worker.join();
    EXPECT_EQ(answered.size(), size_t(kRequests)) << "each by the page that asked for it";
    EXPECT_EQ(answered["coui://page7/images/hero.dds"], 1);
}

TEST_F(ResourceRequestTest, SpaceGrowsShrinksAndEndsWithAZeroForText) {
    auto entry = Request("coui://a/b.txt");
    auto* space = static_cast<char*>(entry.response->GetSpace(3));
    std::memcpy(space, "abc", 3);
    space = static_cast<char*>(entry.response->GetSpace(6));
    std::memcpy(space + 3, "def", 3);
    space = static_cast<char*>(entry.response->GetSpace(4));
    EXPECT_STREQ(space, "abcd");
    entry.response->SignalDataReceived();
    EXPECT_EQ(progress, 1);
    EXPECT_EQ(JobOf(entry).GetData().size(), 4u);
    UserImageData image;
    entry.response->RecieveUserImage(image);
    EXPECT_TRUE(log.Contains("GetSpace already called."));
    entry.response->Finish(Status::Success);

    auto binary = Request("coui://a/b.bin", true);
    EXPECT_NE(binary.response->GetSpace(8), nullptr);
    EXPECT_EQ(binary.response->GetSpace(0), nullptr);
    binary.response->Finish(Status::Success);

    auto user = Request("coui://a/c.png", true);
    user.response->RecieveUserImage(image);
    EXPECT_EQ(user.response->GetSpace(8), nullptr);
    EXPECT_TRUE(log.Contains("RecieveUserImage already called."));
    user.response->Finish(Status::Success);
}

TEST_F(ResourceRequestTest, FinishActsOnceAndCountsTheOpenRequest) {
    auto entry = Request("coui://a/b.txt");
    EXPECT_EQ(context->GetOpenRequests(), 1u);
    entry.response->Finish(Status::Failure);
    entry.response->Finish(Status::Success);
    EXPECT_TRUE(log.Contains("ResourceRequestJob | Finished more than once"));
    EXPECT_EQ(entry.response->GetSpace(8), nullptr);
    entry.response->SetHeader("a", "b");
    entry.response->SignalDataReceived();
    EXPECT_TRUE(log.Contains("ResourceRequestJob | SignalDataReceived after Finish does nothing"));
    EXPECT_EQ(finished, std::vector<Status>{Status::Failure});
    EXPECT_EQ(context->GetOpenRequests(), 0u);
    EXPECT_TRUE(log.Contains("ResourceRequestJob | Failed loading resource: coui://a/b.txt"));
    EXPECT_FALSE(log.Contains("ResourceRequestJob | Loaded resource"));
}

TEST_F(ResourceRequestTest, FinishedResponsesStayLongAndThenServeOthers) {
    auto first = Request("coui://a/first.txt");
    first.response->Finish(Status::Success);
    std::set<IAsyncResourceResponse*> seen;
    for (size_t i = 0; i < 4 * limits::kFinishedResponses; ++i) {
        auto entry = Request("coui://a/b.txt");
        if (i < limits::kFinishedResponses) {
            EXPECT_NE(entry.response, first.response);
        }
        seen.insert(entry.response);
        entry.response->Finish(Status::Success);
    }
    EXPECT_EQ(seen.size(), limits::kFinishedResponses + 1) << "the oldest comes back, and no more are made";
    first.response->Finish(Status::Success);
    EXPECT_EQ(log.Count("Finished more than once"), 1u);
}

TEST_F(ResourceRequestTest, UnfinishedRequestsGoWithTheLibrary) {
    const auto entry = Request("coui://a/never.txt");
    EXPECT_EQ(JobOf(entry).RefCount(), 1u) << "the client's";
    EXPECT_NE(entry.response->GetSpace(100), nullptr);
}

// A block for the answer in one-byte pieces is not made anew for each; a length beyond reason is refused.
TEST_F(ResourceRequestTest, PiecesAndWrongLengths) {
    auto entry = Request("coui://a/b.txt");
    constexpr size_t kBytes = 4096;
    const uint64_t before = allocator.requests();
    for (size_t i = 1; i <= kBytes; ++i)
        static_cast<char*>(entry.response->GetSpace(i))[i - 1] = static_cast<char>('a' + i % 26);
    EXPECT_LT(allocator.requests() - before, 40u);
    EXPECT_EQ(entry.response->GetSpace(SIZE_MAX), nullptr);
    EXPECT_EQ(entry.response->GetSpace(limits::kMaxResourceBytes + 1), nullptr);
    EXPECT_EQ(log.Count("ResourceRequestJob | Refused "), 2u);
    const auto data = JobOf(entry).GetData();
    ASSERT_EQ(data.size(), kBytes);
    EXPECT_EQ(data[kBytes - 1], 'a' + kBytes % 26);
    EXPECT_EQ(data.data()[kBytes], 0);
    entry.response->Finish(Status::Success);
}

TEST_F(ResourceRequestTest, RequestAnswersAsItWasDescribed) {
    ResourceRequestDescription description = DescribeGet(MakeURL("coui://a/b"));
    using Text = ResourceRequestDescription::Text;
    description.method = RequestMethod::Patch;
    description.body = Text("body");
    description.headers.push_back({Text("A"), Text("1")});
    description.headers.push_back({Text("a"), Text("2")});
    description.headers.push_back({Text("A"), Text("3")});
    const AsyncResourceRequest request(description, 7);
    EXPECT_STREQ(request.GetMethod(), "PATCH");
    EXPECT_STREQ(request.GetHeaderValue("A"), "1");
    EXPECT_STREQ(request.GetHeaderValue("a"), "2");
    EXPECT_EQ(request.GetHeaderValue("b"), nullptr);
    EXPECT_EQ(request.GetHeaderNameAt(3), nullptr);
    EXPECT_EQ(request.GetUser(), nullptr);
    EXPECT_EQ(request.GetBodySize(), 4u);
}

TEST_F(ResourceRequestTest, RelativeURLWithoutABaseGoesOutAsItIs) {
    auto entry = Request("page.html");
    EXPECT_TRUE(log.Contains("Unable to generate absolute URL for resource load!"));
    EXPECT_EQ(entry.url, "page.html");
    entry.response->Finish(Status::Failure);
}

}  // namespace
}  // namespace qorvex
