// The count protocol of native objects and their wrappers, with the collector called by hand.
#include "script/script_fixture.h"

namespace qorvex::script::test {
namespace {

class WrapperLife : public ScriptTest {};

TEST_F(WrapperLife, AnObjectWithoutScriptLivesByItsHolders) {
    auto node = MakeHandle<TestNode>(counts_);
    EXPECT_EQ(node->reference_count(), 2u);
    auto second = node;
    EXPECT_EQ(node->reference_count(), 4u);
    node.reset();
    EXPECT_EQ(counts_.destroyed, 0);
    second.reset();
    EXPECT_EQ(counts_.destroyed, 1);
    EXPECT_EQ(counts_.notified, 1);
}

TEST_F(WrapperLife, IdentityAndScriptPropertiesStayWhileHeld) {
    auto node = MakeHandle<TestNode>(counts_);
    SetGlobal("a", node.get());
    SetGlobal("b", node.get());
    EXPECT_EQ(node->reference_count(), 3u);
    EXPECT_EQ(Run("a.mine = 7; a === b"), "true");
    Run("delete globalThis.a; delete globalThis.b; 0");
    Collect();
    SetGlobal("c", node.get());
    EXPECT_EQ(Run("c.mine"), "7");
}

TEST_F(WrapperLife, AnUnheldObjectLivesAsLongAsScriptReachesIt) {
    auto node = MakeHandle<TestNode>(counts_);
    SetGlobal("kept", node.get());
    WeakHandle<TestNode> weak(node.get());
    node.reset();
    EXPECT_EQ(weak->reference_count(), 1u);
    Run("kept.mine = 1; 0");
    Collect();
    EXPECT_EQ(counts_.destroyed, 0);
    EXPECT_EQ(Run("kept.mine"), "1");

    // From 1 to 3: protected again.
    node = qsl::RefPtr<TestNode>(weak.get());
    EXPECT_EQ(node->reference_count(), 3u);
    Run("delete globalThis.kept; 0");
    Collect();
    EXPECT_EQ(counts_.destroyed, 0);
    SetGlobal("kept", node.get());
    EXPECT_EQ(Run("kept.mine"), "1");
}

// The collector takes stale words of the stack for pointers, so a test counts many objects and lets a few
// wait for the end of the context.
TEST_F(WrapperLife, TheCollectorEndsUnreachableObjectsOnce) {
    std::vector<WeakHandle<TestNode>> weak;
    for (int i = 0; i < 100; ++i) {
        auto node = MakeHandle<TestNode>(counts_);
        weak.emplace_back(node.get());
        SetGlobal("last", node.get());
    }
    Run("delete globalThis.last; 0");
    Collect();
    EXPECT_GE(counts_.destroyed, 90);
    EXPECT_EQ(counts_.notified, counts_.destroyed);
    EXPECT_EQ(std::count_if(weak.begin(), weak.end(), [](auto& handle) { return !handle.get(); }),
              counts_.destroyed);
    DestroyContext();
    EXPECT_EQ(counts_.destroyed, 100);
    EXPECT_EQ(counts_.notified, 100);
}

// A collection comes to its end in whatever frame it likes, idle ones included.
TEST_F(WrapperLife, TheEndOfWrappersAllocatesNothing) {
    for (int i = 0; i < 500; ++i)
        SetGlobal("last", MakeHandle<TestNode>(counts_).get());
    Run("delete globalThis.last; 0");
    const uint64_t before = allocator_.Allocations();
    CollectGarbageNow(page_.context);
    EXPECT_EQ(allocator_.Allocations(), before);
    EXPECT_GE(counts_.destroyed, 450);
}

TEST_F(WrapperLife, CollectionOfOneWrapperReleasesWhatItsObjectHeld) {
    auto outer = MakeHandle<TestNode>(counts_);
    SetGlobal("outer", outer.get());
    outer.reset();
    Run("(function() { for (let i = 0; i < 50; ++i) outer.hold(outer.make()); })()");
    Collect();
    EXPECT_GE(counts_.destroyed, 45);
    Run("outer.held.hold(outer.make()); outer = null");
    Collect();
    DestroyContext();
    EXPECT_EQ(counts_.destroyed, 52);
    EXPECT_EQ(counts_.notified, 52);
}

TEST_F(WrapperLife, TeardownEndsWrappersAndLeavesHeldObjects) {
    std::vector<qsl::RefPtr<TestNode>> held;
    for (int i = 0; i < 3000; ++i) {
        held.push_back(MakeHandle<TestNode>(counts_));
        SetGlobal("last", held.back().get());
    }
    for (int i = 0; i < 1000; ++i)
        SetGlobal("free", MakeHandle<TestNode>(counts_).get());
    SetGlobal("list", MakeHandle<TestList>(counts_).get());
    DestroyContext();
    EXPECT_EQ(counts_.destroyed, 1001);
    for (const auto& node : held) {
        ASSERT_EQ(node->reference_count(), 2u);
        ASSERT_EQ(node->wrapper(), nullptr);
    }
    held.clear();
    EXPECT_EQ(counts_.destroyed, 4001);
}

// References that a destructor takes and drops must not end the object twice, nor make it a wrapper.
class SelfTouching final : public ScriptingHandleEnabledRefCountedWithWeak {
    QORVEX_SCRIPT_CLASS(Node)

  public:
    SelfTouching(JSContextRef context, int& destroyed) : context_(context), destroyed_(destroyed) {}
    ~SelfTouching() override {
        ++destroyed_;
        qsl::RefPtr<SelfTouching> self(this);
        WeakHandle<SelfTouching> weak(this);
        EXPECT_EQ(weak.get(), nullptr);
        JSValueRef value = nullptr;
        GetOrCreateWrapper(context_, &value);
        EXPECT_EQ(value, nullptr);
    }

  private:
    JSContextRef context_;
    int& destroyed_;
};

TEST_F(WrapperLife, ADestructorMayTouchItsOwnCount) {
    int destroyed = 0;
    MakeHandle<SelfTouching>(page_.context, destroyed).reset();
    EXPECT_EQ(destroyed, 1);
}

TEST_F(WrapperLife, AHolderThatComesBackKeepsTheSameWrapper) {
    auto node = MakeHandle<TestNode>(counts_);
    SetGlobal("node", node.get());
    Run("globalThis.seen = new WeakMap([[node, 'seen']]); node.mine = 3; 0");
    for (int i = 0; i < 3; ++i) {
        WeakHandle<TestNode> weak(node.get());
        node.reset();
        Collect();  // script alone holds it
        node = qsl::RefPtr<TestNode>(weak.get());
        ASSERT_TRUE(node);
        Run("delete globalThis.node; 0");
        Collect();  // native code alone holds it
        SetGlobal("node", node.get());
        EXPECT_EQ(Run("node.mine + seen.get(node)"), "3seen");
    }
    EXPECT_EQ(counts_.destroyed, 0);
}

// Objects in all states while the collector runs as it likes: new, held, let go, taken back, shared by
// script.
TEST_F(WrapperLife, ChurnUnderTheCollectorLosesNothing) {
    std::vector<qsl::RefPtr<TestNode>> held;
    int made = 0;
    Run("globalThis.kept = []; globalThis.churn = function() { let a = [];"
        "for (let i = 0; i < 3000; ++i) a.push({ i }); }; 0");
    for (int round = 0; round < 150; ++round) {
        for (int i = 0; i < 40; ++i, ++made) {
            auto node = MakeHandle<TestNode>(counts_);
            node->SetNumber(made);
            SetGlobal("node", node.get());
            Run("node.copy = node.number; if (node.number % 7 === 0) kept.push(node);");
            if (made % 3 == 0) held.push_back(std::move(node));
        }
        Run("churn()");
        if (round % 5 == 4) held.erase(held.begin(), held.begin() + static_cast<long>(held.size() / 2));
        if (round % 10 == 9) PumpScriptEngine();
    }
    for (const auto& node : held) {
        SetGlobal("node", node.get());
        ASSERT_EQ(Run("node.copy === node.number && node.number"), std::to_string(int(node->GetNumber())));
    }
    EXPECT_EQ(Run("kept.every((node, i) => node.number === i * 7 && node.copy === node.number)"), "true");
    Run("kept = null; delete globalThis.node");
    held.clear();
    Collect();
    EXPECT_GE(counts_.destroyed, made - 50);
    DestroyContext();
    EXPECT_EQ(counts_.destroyed, made);
    EXPECT_EQ(counts_.notified, made);
}

TEST_F(WrapperLife, ScriptThatMakesObjectsWithoutEndKeepsNoneOfThem) {
    SetGlobal("node", MakeHandle<TestNode>(counts_).get());
    RunBody("for (let i = 0; i < 300000; ++i) node.make();");
    EXPECT_GE(counts_.destroyed, 250000);
}

// Where no script can run (the stack is used up) a wrapper still comes, with its class.
TEST_F(WrapperLife, WrappersComeWhereScriptCannotRun) {
    SetGlobal("node", MakeHandle<TestElement>(counts_).get());
    EXPECT_EQ(Run("let made = [];"
                  "(function f() { try { f(); } catch (e) { for (let i = 0; i < 40; ++i) "
                  "made.push(node.make()); } })();"
                  "made.length >= 40 && made.every(m => m instanceof Node && m.make)"),
              "true");
}

TEST_F(WrapperLife, WeakHandlesCopyMoveAndOutlive) {
    auto node = MakeHandle<TestNode>(counts_);
    WeakHandle<TestNode> first(node.get());
    WeakHandle<TestNode> second = first;
    WeakHandle<TestNode> third = std::move(first);
    EXPECT_EQ(second.get(), node.get());
    EXPECT_EQ(third.get(), node.get());
    node.reset();
    EXPECT_FALSE(second);
    EXPECT_FALSE(third);
    second = WeakHandle<TestNode>();
}

}  // namespace
}  // namespace qorvex::script::test
