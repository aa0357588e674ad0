// A script context without a page, natives of three classes, and the log of what happened.
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "script/class_installation.h"
#include "script/engine_seam.h"
#include "script/evaluate.h"
#include "script/make_handle.h"
#include "script/member_callbacks.h"
#include "support/scoped_library_state.h"

namespace qorvex::script::test {

struct Counts {
    int destroyed = 0;
    int notified = 0;
};

// A WithWeak object that script sees as a Node.
class TestNode : public ScriptingHandleEnabledRefCountedWithWeak {
    QORVEX_SCRIPT_CLASS(Node)

  public:
    explicit TestNode(Counts& counts) : counts_(counts) {}
    ~TestNode() override { ++counts_.destroyed; }
    void OnBeforeDestroy() override { ++counts_.notified; }

    double GetNumber() const { return number_; }
    void SetNumber(double value) { number_ = value; }
    std::string_view GetName() const { return name_; }
    void SetName(std::string_view name) { name_ = name; }
    int Sum(int a, uint32_t b) const { return a + static_cast<int>(b); }
    bool Contains(TestNode* other) const { return other == this; }
    qsl::RefPtr<TestNode> Make() { return MakeHandle<TestNode>(counts_); }
    void Hold(qsl::RefPtr<TestNode> other) { held_ = other; }
    TestNode* GetHeld() const { return held_.get(); }
    std::string_view Join(std::string_view a, std::optional<std::string_view> b) {
        joined_ = std::string(a) + "," + (b ? std::string(*b) : "none");
        return joined_;
    }
    std::optional<std::string_view> GetAbsent() const { return std::nullopt; }

  private:
    Counts& counts_;
    double number_ = 0;
    std::string name_, joined_;
    qsl::RefPtr<TestNode> held_;
};

class TestElement final : public TestNode {
    QORVEX_SCRIPT_CLASS(Element)

  public:
    using TestNode::TestNode;
    void Fail(std::string_view message) { RaiseError(GetFirstScriptingContext(), message); }
};

// A plain counted object, in script a NodeList whose items are their own indices.
class TestList final : public ScriptingHandleEnabledRefCounted {
    QORVEX_SCRIPT_CLASS(NodeList)

  public:
    explicit TestList(Counts& counts) : counts_(counts) {}
    ~TestList() override { ++counts_.destroyed; }
    int GetLength() const { return 3; }

  private:
    Counts& counts_;
};

class ScriptTest : public qorvex::test::QorvexTest {
  protected:
    ScriptTest();
    ~ScriptTest() override;

    // The page's context goes; natives of the test stay.
    void DestroyContext();
    // The text of the value, or "throws ..." with the exception's text.
    std::string Run(const char* source);
    // As the body of a function, so that nothing of it stays on a global.
    std::string RunBody(const std::string& body) { return Run(("(function() {" + body + "})()").c_str()); }
    void SetGlobal(const char* name, ScriptingHandleEnabled* object);
    // Collects until nothing of an earlier frame of this stack is taken for a pointer any more.
    void Collect();

    ScriptingContext page_;
    JSContextGroupRef group_ = nullptr;
    Counts counts_;
};

}  // namespace qorvex::script::test
