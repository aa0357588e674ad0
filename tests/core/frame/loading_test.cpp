// Pages on their way into a view, and what goes wrong there.
#include <gtest/gtest.h>

#include <algorithm>

#include "core/frame/client.h"

namespace {

using client::Client;
using client::Options;

TEST(Loading, ScriptsAndSheetsBlockInOrder) {
    Client client;
    client.files.Put("coui://page/a.css", "body{background-color:#00ff00;margin:0}");
    client.files.Put("coui://page/a.js", "console.log('external ' + (typeof inline_ran))");
    client.Load(
        "<html><head><link rel=\"stylesheet\" href=\"a.css\"><script>var inline_ran = 1; "
        "console.log('inline')"
        "</script><script "
        "src=\"a.js\"></script></head><body>x<script>console.log('last')</script></body></html>");
    EXPECT_EQ(client.log.Matching({"inline ", "external number ", "last "}),
              (std::vector<std::string>{"inline ", "external number ", "last "}));
    EXPECT_EQ(client.Pixel(40, 40), 0x00ff00u);
}

TEST(Loading, MissingScriptsAndSheetsLetThePageGoOn) {
    for (bool workers : {false, true}) {
        Options options;
        options.requests_on_workers = workers;
        options.resource_threads = workers ? 2 : 0;
        Client client(options);
        client.Load(
            "<html><head><link rel=\"stylesheet\" href=\"missing.css\"><script "
            "src=\"missing.js\"></script></head>"
            "<body><script>console.log('still here')</script></body></html>");
        EXPECT_TRUE(client.log.Contains("still here"));
        EXPECT_TRUE(
            client.log.Contains("DocumentLoader | Failed loading stylesheet: coui://page/missing.css"));
        EXPECT_TRUE(client.log.Contains(
            "DocumentLoader | Got resource load result for: coui://page/missing.js with status: Failure"));
    }
}

TEST(Loading, BadURLsAndMissingPagesKeepTheOldDocument) {
    Client client;
    client.Load("<html><body>old</body></html>");
    client.view->LoadURL("relative/page.html");
    EXPECT_TRUE(client.log.Contains("LoadURL invoked with invalid URL: relative/page.html"));
    client.view->LoadURL("coui://page/missing.html");
    for (int i = 0; i < 4; ++i)
        client.Frame();
    EXPECT_EQ(client.listener.events.back(), "failed coui://page/missing.html: Failed to load HTML resource");
    qorvex::DebugDump* dump = client.view->DumpDOM(0);
    ASSERT_NE(dump, nullptr);
    EXPECT_NE(std::string(dump->GetText()).find("old"), std::string::npos);
    dump->Destroy();
}

TEST(Loading, ListenerMayRefuse) {
    Client client;
    client.listener.allow = false;
    client.view->LoadURL("coui://page/index.html");
    client.Frame();
    EXPECT_TRUE(client.files.requests.empty());
}

TEST(Loading, LateAnswersFindNobody) {
    auto* client = new Client;
    client->files.Put("coui://page/index.html",
                      "<html><head><script src=\"late.js\"></script></head><body></body></html>");
    client->files.Put("coui://page/late.js", "console.log('too late')");
    client->files.SetDeferred(true);
    client->view->LoadURL("coui://page/index.html");
    client->files.AnswerAll();
    for (int i = 0; i < 3; ++i)
        client->Frame();
    ASSERT_EQ(client->files.waiting.size(), 1u) << "the script";
    client->DestroyView();
    EXPECT_EQ(client->files.aborted.size(), 1u);
    client->files.AnswerAll();
    client->ServeResources();
    EXPECT_FALSE(client->log.Contains("too late "));
    delete client;
}

TEST(Loading, ASecondPageReplacesTheFirstBeforeItHasArrived) {
    Client client;
    client.files.Put("coui://page/one.html", "<html><body><script>console.log('one')</script></body></html>");
    client.files.Put("coui://page/two.html", "<html><body><script>console.log('two')</script></body></html>");
    client.files.SetDeferred(true);
    client.view->LoadURL("coui://page/one.html");
    client.view->LoadURL("coui://page/two.html");
    EXPECT_EQ(client.files.aborted.size(), 1u);
    client.files.AnswerAll();
    client.files.SetDeferred(false);
    client.RunUntilLoaded();
    EXPECT_FALSE(client.log.Contains("one "));
    EXPECT_TRUE(client.log.Contains("two "));
}

TEST(Loading, PreloadedPagesNeedNoFurtherRequest) {
    Client client;
    client.files.Put("coui://page/index.html",
                     "<html><body><script>console.log('hi')</script></body></html>");
    client.system->PreloadAndCacheHTML("coui://page/index.html");
    client.system->PreloadAndCacheHTML("coui://page/index.html");
    client.Frame();
    client.Frame();
    EXPECT_EQ(client.files.requests.size(), 1u);
    client.system->PreloadAndCacheHTML("coui://page/index.html");
    EXPECT_TRUE(client.log.Contains("Trying to preload already cached HTML: coui://page/index.html"));
    client.view->LoadURL("coui://page/index.html");
    client.RunUntilLoaded();
    EXPECT_EQ(client.files.requests.size(), 1u);
    EXPECT_TRUE(client.log.Contains("hi "));
    EXPECT_TRUE(client.system->RemoveHTMLCacheEntry("coui://page/index.html"));
    EXPECT_FALSE(client.system->RemoveHTMLCacheEntry("coui://page/index.html"));
}

TEST(Loading, EmptyBinaryAndCutPagesDoNoHarm) {
    const std::string pages[] = {"", std::string("\0\1\2\xff\xfe<\0body>", 12), "<html><body><div class=\"a",
                                 "<"};
    for (const std::string& page : pages) {
        Client client;
        client.Load(page);
        EXPECT_EQ(client.listener.events.back(), "loaded coui://page/index.html");
    }
}

TEST(Loading, OneSheetAskedForTwiceIsOneRequest) {
    Client client;
    client.files.Put("coui://page/s.css", "body{background-color:#00ff00;margin:0}");
    client.files.Put("coui://page/index.html",
                     "<html><head><script async src=\"a.js\"></script></head><body></body></html>");
    client.files.Put("coui://page/a.js",
                     "for (const n of [1, 2]) { const link = document.createElement('link');"
                     "link.addEventListener('load', () => console.log('sheet'));"
                     "link.setAttribute('rel', 'stylesheet'); link.setAttribute('href', 's.css');"
                     "document.head.appendChild(link); }");
    client.view->LoadURL("coui://page/index.html");
    client.RunUntilLoaded();
    const auto& requests = client.files.requests;
    EXPECT_EQ(std::count(requests.begin(), requests.end(), "coui://page/s.css"), 1);
    EXPECT_EQ(client.log.Matching({"sheet "}).size(), 2u);
    EXPECT_EQ(client.Pixel(40, 40), 0x00ff00u);
}

TEST(Loading, AsyncScriptsDoNotHoldTheBuildingUp) {
    Client client;
    client.files.Put("coui://page/a.js", "console.log('async')");
    client.files.Put("coui://page/index.html",
                     "<html><head><script async src=\"a.js\"></script></head>"
                     "<body><script>console.log('inline')</script></body></html>");
    client.files.SetDeferred(true);
    client.view->LoadURL("coui://page/index.html");
    client.files.AnswerAll();
    for (int i = 0; i < 3; ++i)
        client.Frame();
    EXPECT_TRUE(client.log.Contains("inline "));
    EXPECT_FALSE(client.log.Contains("Paused DOM building"));
    EXPECT_EQ(client.listener.events.back(), "built") << "the load waits for the script";
    client.files.AnswerAll();
    client.files.SetDeferred(false);
    client.RunUntilLoaded();
    EXPECT_TRUE(client.log.Contains("async "));
}

TEST(Loading, ScriptsThatLoadScriptsNestOnlySoDeep) {
    Client client;
    for (int i = 0; i < 100; ++i) {
        const std::string next = std::to_string(i + 1);
        client.files.Put("coui://page/" + std::to_string(i) + ".js",
                         "{ const s = document.createElement('script'); s.setAttribute('src', '" + next +
                             ".js'); document.body.appendChild(s); }");
    }
    client.files.Put("coui://page/100.js", "console.log('the end')");
    client.Load("<html><body><script src=\"0.js\"></script></body></html>");
    EXPECT_TRUE(client.log.Contains("the end "));
}

}  // namespace
