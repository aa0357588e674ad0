#include "core/platform/module_loader.h"

#include "support/scoped_library_state.h"

namespace qorvex {
namespace {

using ModuleLoaderTest = test::QorvexTest;

TEST_F(ModuleLoaderTest, GivesNoneForMissingModulesAndPaths) {
    Module module = LoadModule("QorvexNoSuchModule");
    EXPECT_FALSE(module);
    EXPECT_EQ(module.Get<void (*)()>("CreateTCPServer"), nullptr);
    EXPECT_FALSE(LoadModule("../../lib/evil"));
    EXPECT_FALSE(LoadModule(""));
}

TEST_F(ModuleLoaderTest, TakesFunctionsFromALoadedModule) {
    // Any library of the system will do; this one the tests link anyway.
    Module module = LoadModule("uriparser");
    if (!module) GTEST_SKIP() << "no development link of the library here";
    EXPECT_NE(module.Get<void (*)()>("uriParseSingleUriA"), nullptr);
    EXPECT_EQ(module.Get<void (*)()>("no_such_function"), nullptr);
}

}  // namespace
}  // namespace qorvex
