#include "script/bindings/bindings_fixture.h"

namespace qorvex::script::test {
namespace {

class ConsoleTest : public BindingsTest {
  protected:
    ConsoleTest() { OpenPage("<body></body>"); }
};

TEST_F(ConsoleTest, WritesEachArgumentWithABlankBehindAtItsLevel) {
    Run("console.log('a', 1, null, undefined, { }, [1, 2]); console.info('i'); console.warn('w');"
        "console.error('e'); console.debug('d'); console.log()");
    EXPECT_EQ(Count(Logging::Info, "a 1 null undefined [object Object] 1,2 "), 1u);
    EXPECT_EQ(Count(Logging::Info, "i "), 1u);
    EXPECT_EQ(Count(Logging::Warning, "w "), 1u);
    EXPECT_EQ(Count(Logging::Error, "e "), 1u);
    EXPECT_EQ(Count(Logging::Debug, "d "), 1u);
    EXPECT_EQ(Count(Logging::Info, ""), 1u);
    EXPECT_EQ(Run("console.log({ toString() { throw 'no'; } })"), "throws no");
}

TEST_F(ConsoleTest, AssertsWhatIsFalse) {
    Run("console.assert(true, 'fine'); console.assert(0, 'broken', 2)");
    EXPECT_EQ(Count(Logging::Assert, "broken 2 "), 1u);
    EXPECT_FALSE(log_.Contains("fine"));
}

TEST_F(ConsoleTest, TimesByLabel) {
    Run("console.time('a'); console.time('a'); console.timeEnd('b'); console.timeEnd('a'); "
        "console.timeEnd('a')");
    EXPECT_EQ(Count(Logging::Warning, "Timer \"a\" already exists."), 1u);
    EXPECT_EQ(Count(Logging::Warning, "Timer \"b\" doesn't exists."), 1u);
    EXPECT_EQ(Count(Logging::Warning, "Timer \"a\" doesn't exists."), 1u);
    EXPECT_EQ(log_.Count("a: "), 1u);
    Run("console.time(); console.timeEnd('a', 'b')");
    EXPECT_EQ(Count(Logging::Warning, "console.time() called with more than one argument"), 1u);
    EXPECT_EQ(Count(Logging::Warning, "console.timeEnd() called with more than one argument"), 1u);
}

TEST_F(ConsoleTest, WorksDetached) {
    Run("const { log, time } = console; log('alone'); log.call({}, 'borrowed'); time('a'); "
        "console.time('a')");
    EXPECT_EQ(Count(Logging::Info, "alone "), 1u);
    EXPECT_EQ(Count(Logging::Info, "borrowed "), 1u);
    EXPECT_EQ(Count(Logging::Warning, "Timer \"a\" already exists."), 1u);
    EXPECT_EQ(Run("Object.keys(console).join()"), "assert,debug,error,info,log,time,timeEnd,warn");
}

}  // namespace
}  // namespace qorvex::script::test
