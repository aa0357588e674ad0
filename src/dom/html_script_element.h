// <script>: gathers its source, loads it when it has an address, and runs it once.
#pragma once

#include "core/url/url.h"
#include "dom/html_element.h"

namespace qorvex::dom {

class HTMLScriptElement final : public HTMLElement {
    QORVEX_SCRIPT_CLASS(HTMLScriptElement)
  public:
    enum class Kind : uint8_t { Classic = 0, Module = 1, NotScript = 2 };
    enum class State : uint8_t { Idle = 0, Loading = 1, Ready = 2, Failed = 3, Done = 4 };

    HTMLScriptElement(Document& document, css::TagId tag) : HTMLElement(document, tag) {}

    // Where the text of the element starts in the page's source.
    void SetSourcePosition(uint32_t line, uint32_t column) { line_ = line, column_ = column; }
    State GetState() const { return state_; }
    // Runs what is ready and reports with "load" or "error"; a script that still loads is left alone.
    void RunScript();

    qsl::RefPtr<Node> AppendChild(qsl::RefPtr<Node> child) override;
    void AttributeChanged(AttributeName name, std::optional<Atom> old_value,
                          std::optional<Atom> new_value) override;
    void OnSubtreeInserted() override;
    void OnResourceLoaded(uint32_t id, const ILoadedResource* resource) override;

  protected:
    void CopyStateTo(HTMLElement& clone) const override;

  private:
    void ProcessScript();
    void LoadScript();
    // The answer of the loader, null or failed for an error.
    void OnScriptLoaded(const ILoadedResource* resource);
    void Evaluate();

    URL url_;
    NodeText source_;
    uint32_t line_ = 0;
    uint32_t column_ = 0;
    Kind kind_ = Kind::Classic;
    State state_ = State::Idle;
    bool async_ = false;
    bool defer_ = false;
};

}  // namespace qorvex::dom
