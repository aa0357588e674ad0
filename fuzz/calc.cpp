// calc() in a value's text: what it computes does not depend on how it is wrapped, and a result has none
// left.
#include <cstdint>
#include <optional>
#include <string>

#include "css/style/calc.h"
#include "support/engine.h"

namespace qorvex::fuzz {
namespace {

std::optional<std::string> Evaluate(const std::string& text) {
    css::CssString result;
    if (!css::EvaluateCalc(text, result, {12.8f, 7.2f, 20, 16, 0})) return std::nullopt;
    return std::string(result.view());
}

// A unit in front of a letter, as in "1in" "f", is none.
bool HasInfinity(std::string_view text) {
    for (size_t at = text.find("inf"); at != std::string_view::npos; at = text.find("inf", at + 1)) {
        if (at == 0 || text[at - 1] < '0' || text[at - 1] > '9') return true;
    }
    return false;
}

bool IsBalanced(std::string_view text) {
    int depth = 0;
    for (const char c : text) {
        depth += c == '(' ? 1 : c == ')' ? -1 : 0;
        if (depth < 0) return false;
    }
    return depth == 0;
}

void Run(std::string_view text) {
    const std::string inside(text);
    if (text.size() >= 2)
        if (const auto result = Evaluate(inside)) {
            Require(result->find("calc(") == std::string::npos, "a calc() was left");
            Require(!HasInfinity(*result) || inside.find("inf") != std::string::npos,
                    "no number is infinite");
        }
    if (!IsBalanced(text)) return;
    const auto plain = Evaluate("calc(" + inside + ")");
    for (const char* wrapping : {"calc((", "calc(calc(", "calc( ( "}) {
        const auto wrapped = Evaluate(wrapping + inside + "))");
        Require(plain.has_value() == wrapped.has_value(), "wrapping decides whether there is a value");
        if (plain) RequireSame(*plain, *wrapped, "wrapping changes the value");
    }
    if (plain)
        RequireSame(*Evaluate("a calc(" + inside + ") b"), "a " + *plain + " b", "text around a calc()");
}

}  // namespace
}  // namespace qorvex::fuzz

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const qorvex::fuzz::Input input;
    qorvex::fuzz::Run({reinterpret_cast<const char*>(data), size});
    return 0;
}
