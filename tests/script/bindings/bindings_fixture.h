// A page with a script context, without a view: the document of the DOM tests and a clock set by hand.
#pragma once

#include <string>

#include "dom/dom_fixture.h"
#include "script/bindings/bound_classes.h"
#include "script/bindings/context_lifecycle.h"
#include "script/bindings/window.h"
#include "script/bindings/window_host.h"

namespace qorvex::script::test {

class TestWindowHost final : public dom::IWindowHost {
  public:
    double GetTime() const override { return time; }
    const char* GetUserAgent() const override { return "test"; }
    double time = 1000;
};

class BindingsTest : public dom::test::DomTest {
  protected:
    BindingsTest();
    ~BindingsTest() override;

    // Loads the page and makes its context, in which the document's scripts then run.
    void OpenPage(std::string_view html);
    void ClosePage();
    // The text of the value, or "throws ..." with the exception's text.
    std::string Run(const std::string& source);
    // One frame that ends this many milliseconds after the last.
    void Advance(double milliseconds);
    void Collect();
    // How often the log has this text at this severity.
    size_t Count(Logging::Severity severity, const std::string& text) const;

    TestWindowHost window_host_;
    ScriptingContextPtr page_;
};

}  // namespace qorvex::script::test
