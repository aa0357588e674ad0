#include "core/memory/string_pool.h"

#include <string>

#include "core/memory/atoms.h"
#include "support/scoped_library_state.h"

namespace qorvex {
namespace {

using StringPoolTest = test::QorvexTest;

TEST_F(StringPoolTest, GivesOnePointerForOneTextAndConstantsInEveryPool) {
    StringPool first;
    StringPool second;
    EXPECT_EQ(first.Intern(std::string("href")), atoms::kHref);
    EXPECT_EQ(second.Intern("#text"), atoms::kText);
    const Atom own = first.Intern("some-class");
    EXPECT_EQ(first.Intern(std::string("some-class")), own);
    EXPECT_NE(second.Intern("some-class"), own);
    EXPECT_STREQ(own.c_str(), "some-class");
    EXPECT_EQ(first.Intern(""), Atom());
    EXPECT_TRUE(second.Find("never seen").empty());
}

TEST_F(StringPoolTest, HoldsManyAndLargeTexts) {
    StringPool pool;
    const size_t constants = pool.size();
    std::vector<Atom> atoms;
    for (int i = 0; i < 5000; ++i)
        atoms.push_back(pool.Intern("name" + std::to_string(i)));
    const std::string large(100000, 'z');
    const Atom atom = pool.Intern(large);
    EXPECT_EQ(pool.size(), constants + 5001);
    for (int i = 0; i < 5000; ++i)
        EXPECT_EQ(pool.Intern("name" + std::to_string(i)), atoms[i]);
    EXPECT_EQ(atom.view(), large);
}

TEST_F(StringPoolTest, FreesWhatIsNotKept) {
    StringPool pool;
    const Atom kept = pool.Intern("kept");
    pool.KeepSoFar();
    const size_t count = pool.size();
    const size_t blocks = allocator_.LiveBlocks();
    for (int round = 0; round < 3; ++round) {
        for (int i = 0; i < 400; ++i)
            pool.Intern("name" + std::to_string(i));
        pool.ReleaseOthers();
        EXPECT_EQ(pool.size(), count);
        EXPECT_EQ(allocator_.LiveBlocks(), blocks);
    }
    EXPECT_EQ(pool.Intern(std::string("kept")), kept);
    EXPECT_EQ(pool.Intern("href"), atoms::kHref);
    EXPECT_TRUE(pool.Find("name7").empty());
    EXPECT_EQ(pool.Intern("name7").view(), "name7");
}

TEST_F(StringPoolTest, EntersForeignTextWithoutCopying) {
    static const char text[] = "kept elsewhere";
    StringPool pool;
    EXPECT_EQ(pool.Intern(text, false).c_str(), text);
    EXPECT_EQ(pool.Intern(std::string(text)).c_str(), text);
}

}  // namespace
}  // namespace qorvex
