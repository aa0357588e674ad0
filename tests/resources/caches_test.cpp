// Joining of requests in the caches of a system.
#include "resources/html_cache.h"
#include "resources/resource_test_support.h"
#include "resources/stylesheet_cache.h"

namespace qorvex {
namespace {

class CacheTest : public ResourceTest {
  protected:
    CacheTest() {
        files.Put("coui://a/p.html", "<html><body>page</body></html>");
        files.Put("coui://a/s.css", "a{color:red}");
        files.SetDeferred(true);
    }
    HTMLCache::OnLoad CountLoads() {
        return [this](const URL&, RefPtr<dom::ParsedHTML> html) { loads += html ? 1 : 0; };
    }
    HTMLCache::OnError CountErrors() {
        return [this](const URL&) { ++errors; };
    }
    int loads = 0;
    int errors = 0;
};

TEST_F(CacheTest, SubscribersOfOnePageShareOneRequest) {
    HTMLCache cache(family, *context);
    const URL url = MakeURL("coui://a/p.html");
    cache.Request(url, 1, CountLoads(), CountErrors());
    cache.Request(MakeURL("coui://A/P.html"), 2, CountLoads(), CountErrors());
    cache.Preload(url);
    EXPECT_EQ(files.requests.size(), 1u);
    cache.Unsubscribe(2, url);
    files.AnswerAll();
    RunTasks();
    EXPECT_EQ(loads, 1);
    cache.Request(url, 3, CountLoads(), CountErrors());
    EXPECT_EQ(loads, 2) << "the preload keeps the page";
    EXPECT_TRUE(cache.Remove(url));
    EXPECT_FALSE(cache.Remove(url));
}

TEST_F(CacheTest, LastSubscriberThatLeavesAborts) {
    HTMLCache cache(family, *context);
    const URL url = MakeURL("coui://a/p.html");
    cache.Request(url, 1, CountLoads(), CountErrors());
    cache.Unsubscribe(1, url);
    EXPECT_EQ(files.aborted.size(), 1u);
    files.AnswerAll();
    RunTasks();
    EXPECT_EQ(loads + errors, 0);
}

TEST_F(CacheTest, ClearLeavesTheRequestsOfViews) {
    HTMLCache cache(family, *context);
    const URL url = MakeURL("coui://a/p.html");
    cache.Preload(url);
    cache.Request(url, 1, CountLoads(), CountErrors());
    cache.Preload(MakeURL("coui://a/other.html"));
    cache.Clear();
    EXPECT_EQ(files.aborted.size(), 1u) << "only the page that nobody but the cache wanted";
    files.AnswerAll();
    RunTasks();
    EXPECT_EQ(loads, 1);
    cache.Request(url, 2, CountLoads(), CountErrors());
    EXPECT_EQ(files.requests.size(), 3u) << "nothing was kept";
    files.AnswerAll();
    RunTasks();
}

TEST_F(CacheTest, FailedPagesTellEveryone) {
    HTMLCache cache(family, *context);
    cache.Request(MakeURL("coui://a/none.html"), 1, CountLoads(), CountErrors());
    cache.Preload(MakeURL("coui://a/none.html"));
    files.AnswerAll();
    RunTasks();
    EXPECT_EQ(errors, 1);
    EXPECT_TRUE(log.Contains("Could not preload HTML with URL: coui://a/none.html"));
}

TEST_F(CacheTest, SheetsAreJoinedWhileTheyAreOnTheirWay) {
    StringPool strings;
    StylesheetCache cache(family, *context, strings);
    const URL url = MakeURL("coui://a/s.css");
    css::Stylesheet* joined = nullptr;
    EXPECT_FALSE(cache.Join(url, [](RefPtr<css::Stylesheet>) {}));
    cache.Load(url);
    cache.Load(url);
    EXPECT_TRUE(cache.Join(url, [&](RefPtr<css::Stylesheet> sheet) { joined = sheet.get(); }));
    EXPECT_EQ(files.requests.size(), 1u);
    files.AnswerAll();
    RunTasks();
    ASSERT_NE(joined, nullptr);
    EXPECT_EQ(cache.Find(url).get(), joined);
    EXPECT_TRUE(cache.Remove(url));
    cache.Load(MakeURL("coui://a/none.css"));
    files.AnswerAll();
    RunTasks();
    EXPECT_EQ(cache.Find(MakeURL("coui://a/none.css")).get(), nullptr);
}

TEST_F(CacheTest, AbandonedLoadsAreAbortedAndTheirAnswersReachNobody) {
    StringPool strings;
    HTMLCache pages(family, *context);
    StylesheetCache sheets(family, *context, strings);
    bool joined = false;
    sheets.Load(MakeURL("coui://a/s.css"));
    EXPECT_TRUE(sheets.Join(MakeURL("coui://a/s.css"), [&](RefPtr<css::Stylesheet>) { joined = true; }));
    // A view that asked for several pages, one of them together with another view.
    for (const char* url : {"coui://a/p.html", "coui://a/q.html"})
        pages.Request(MakeURL(url), 1, CountLoads(), CountErrors());
    pages.Request(MakeURL("coui://a/p.html"), 2, CountLoads(), CountErrors());
    sheets.AbandonLoads();
    pages.UnsubscribeAll(1);
    EXPECT_EQ(files.aborted.size(), 2u);
    files.AnswerAll();
    RunTasks();
    EXPECT_FALSE(joined);
    EXPECT_EQ(sheets.Find(MakeURL("coui://a/s.css")).get(), nullptr);
    EXPECT_EQ(loads + errors, 1) << "the view that stayed";
}

}  // namespace
}  // namespace qorvex
