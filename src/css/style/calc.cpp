#include "css/style/calc.h"

#include <array>
#include <cmath>
#include <cstdio>
#include <optional>

#include "core/logging/log.h"
#include "css/values/number_parser.h"

namespace qorvex::css {
namespace {

enum class Category : uint8_t { kNone, kNumber, kPercent, kLength, kAngle, kTime };

struct UnitKind {
    std::string_view suffix;
    Category category;
    LengthUnit unit = LengthUnit::Px;  // only for lengths
};

// Index 0 is unused, so that an index is the kind's number. Suffixes are case-sensitive.
constexpr std::array<UnitKind, 16> kKinds = {{{"", Category::kNone},
                                              {"", Category::kNumber},
                                              {"%", Category::kPercent},
                                              {"px", Category::kLength, LengthUnit::Px},
                                              {"vw", Category::kLength, LengthUnit::Vw},
                                              {"vh", Category::kLength, LengthUnit::Vh},
                                              {"vmin", Category::kLength, LengthUnit::Vmin},
                                              {"vmax", Category::kLength, LengthUnit::Vmax},
                                              {"em", Category::kLength, LengthUnit::Em},
                                              {"rem", Category::kLength, LengthUnit::Rem},
                                              {"in", Category::kLength, LengthUnit::In},
                                              {"pt", Category::kLength, LengthUnit::Pt},
                                              {"deg", Category::kAngle},
                                              {"rad", Category::kAngle},
                                              {"ms", Category::kTime},
                                              {"s", Category::kTime}}};
constexpr uint8_t kNumberKind = 1, kPixelKind = 3, kDegreeKind = 12, kRadianKind = 13, kMillisecondKind = 14,
                  kSecondKind = 15;

struct Quantity {
    float value = 0;
    uint8_t kind = kNumberKind;
};

Category CategoryOf(uint8_t kind) {
    return kKinds[kind].category;
}
bool IsSpace(char c) {
    return c == ' ' || c == '\t' || c == '\n' || c == '\r' || c == '\f';
}
bool IsLetter(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
}
int Precedence(char op) {
    return op == '*' || op == '/' ? 2 : 1;
}

// One step of the postfix program: an operand (op 0) or an operator over the two topmost values.
struct Step {
    char op = 0;
    Quantity operand;
};

// Compiles the inside of one calc() by operator precedence. `pending_` holds operators and open parentheses.
class Compiler {
  public:
    explicit Compiler(std::string_view text) : text_(text) {}

    [[nodiscard]] bool Run() {
        bool expectOperand = true;
        for (SkipSpace(); pos_ < text_.size(); SkipSpace()) {
            if (expectOperand) {
                if (TakeOpening()) continue;
                if (!TakeNumber()) return false;
                expectOperand = false;
            } else if (text_[pos_] == ')') {
                if (!CloseParenthesis()) return false;
            } else {
                if (!TakeOperator()) return false;
                expectOperand = true;
            }
        }
        if (expectOperand) return SyntaxError();
        while (!pending_.empty()) {
            if (pending_.back() == '(') return SyntaxError();
            if (!Reduce()) return false;
        }
        return true;
    }

    const CssSmallVector<Step, 16>& program() const { return program_; }

  private:
    void SkipSpace() {
        while (pos_ < text_.size() && IsSpace(text_[pos_]))
            ++pos_;
    }

    bool SyntaxError() const {
        LogWarning("Calc expression error near: ", text_.substr(pos_));
        return false;
    }

    bool TakeOpening() {
        const std::string_view rest = text_.substr(pos_);
        const size_t length = rest.starts_with('(') ? 1 : rest.starts_with("calc(") ? 5 : 0;
        if (length == 0) return false;
        pending_.push_back('(');
        pos_ += length;
        return true;
    }

    bool TakeNumber() {
        const std::string_view rest = text_.substr(pos_);
        Quantity number;
        const size_t digits = ReadFloat(rest, number.value);
        if (digits == 0 || !std::isfinite(number.value)) return SyntaxError();
        size_t end = digits;
        if (end < rest.size() && rest[end] == '%') {
            ++end;
        } else {
            while (end < rest.size() && IsLetter(rest[end]))
                ++end;
        }
        const std::string_view suffix = rest.substr(digits, end - digits);
        uint8_t kind = kNumberKind;
        while (kind < kKinds.size() && kKinds[kind].suffix != suffix)
            ++kind;
        if (kind == kKinds.size()) return SyntaxError();
        number.kind = kind;
        program_.push_back({0, number});
        types_.push_back(CategoryOf(kind));
        pos_ += end;
        return true;
    }

    bool TakeOperator() {
        const char op = text_[pos_];
        if (op != '+' && op != '-' && op != '*' && op != '/') return SyntaxError();
        while (!pending_.empty() && pending_.back() != '(' && Precedence(pending_.back()) >= Precedence(op)) {
            if (!Reduce()) return false;
        }
        pending_.push_back(op);
        ++pos_;
        return true;
    }

    bool CloseParenthesis() {
        while (!pending_.empty() && pending_.back() != '(') {
            if (!Reduce()) return false;
        }
        if (pending_.empty()) return SyntaxError();
        pending_.pop_back();
        ++pos_;
        return true;
    }

    // Moves the topmost operator to the program and replaces its operand types by its result type.
    bool Reduce() {
        const char op = pending_.back();
        pending_.pop_back();
        const Category right = types_.back();
        types_.pop_back();
        const Category left = types_.back();
        if (!Accepts(op, left, right)) {
            ReportTypes(op, left, right);
            return false;
        }
        types_.back() = left == Category::kNumber ? right : left;
        program_.push_back({op, {}});
        return true;
    }

    static bool Accepts(char op, Category left, Category right) {
        if (op == '*') return left == Category::kNumber || right == Category::kNumber;
        if (op == '/') return right == Category::kNumber;
        return left == right;
    }

    static void ReportTypes(char op, Category left, Category right) {
        const bool isSum = op == '+' || op == '-';
        if (isSum && (left == Category::kPercent || right == Category::kPercent)) {
            LogError("Combining percents in calc() expressions with other types is not supported!");
        }
        LogWarning("Unable to create binary operation for calc() expression (op: ", std::string_view(&op, 1),
                   ", type1: ", static_cast<int>(left), ", type2: ", static_cast<int>(right), ")");
    }

    std::string_view text_;
    size_t pos_ = 0;
    CssSmallVector<Step, 16> program_;
    CssSmallVector<Category, 16> types_;
    CssSmallVector<char, 16> pending_;
};

// Lengths, angles and times are brought to one unit before they are added.
Quantity ToCommonUnit(Quantity q, const LengthContext& metrics) {
    switch (CategoryOf(q.kind)) {
        case Category::kLength:
            return {ResolveLength(Length{kKinds[q.kind].unit, q.value}, metrics), kPixelKind};
        case Category::kAngle:
            return {q.kind == kRadianKind ? q.value * 57.29578f : q.value, kDegreeKind};
        case Category::kTime:
            return {q.kind == kSecondKind ? q.value * 1000.f : q.value, kMillisecondKind};
        default:
            return q;
    }
}

// Result codes of a step: 0 done, 1 sum of unlike types, 2 product without a number, 3 divisor with a unit,
// 4 division by nearly zero.
int Apply(char op, Quantity left, Quantity right, Quantity& result, const LengthContext& metrics) {
    constexpr float kSmallestDivisor = 0.001f;
    if (op == '/') {
        if (right.kind != kNumberKind) return 3;
        if (!(std::fabs(right.value) > kSmallestDivisor)) return 4;
        result = {left.value / right.value, left.kind};
        return 0;
    }
    if (op == '*') {
        if (left.kind != kNumberKind && right.kind != kNumberKind) return 2;
        result = {left.value * right.value, left.kind == kNumberKind ? right.kind : left.kind};
        return 0;
    }
    if (CategoryOf(left.kind) != CategoryOf(right.kind)) return 1;
    left = ToCommonUnit(left, metrics);
    right = ToCommonUnit(right, metrics);
    result = {op == '+' ? left.value + right.value : left.value - right.value, left.kind};
    return 0;
}

std::optional<Quantity> Execute(const CssSmallVector<Step, 16>& program, const LengthContext& metrics) {
    CssSmallVector<Quantity, 16> stack;
    for (const Step& step : program) {
        if (step.op == 0) {
            stack.push_back(step.operand);
            continue;
        }
        const Quantity right = stack.back();
        stack.pop_back();
        if (const int code = Apply(step.op, stack.back(), right, stack.back(), metrics)) {
            LogWarning("Unable to evaluate calc() expression tree, code ", code);
            return std::nullopt;
        }
    }
    return stack.back();
}

[[nodiscard]] bool AppendLiteral(Quantity q, CssString& result) {
    if (!std::isfinite(q.value)) return false;  // an overflow has no literal
    constexpr float kWholeTolerance = 0.001f, kLargestPrintedInt = 2147483520.f;
    const float whole = std::floor(q.value);
    const bool isWhole = !(q.value - whole > kWholeTolerance) && std::fabs(whole) <= kLargestPrintedInt;
    char buffer[64];
    const int length = isWhole ? std::snprintf(buffer, sizeof buffer, "%d", static_cast<int>(whole))
                               : std::snprintf(buffer, sizeof buffer, "%f", static_cast<double>(q.value));
    result.append(std::string_view(buffer, static_cast<size_t>(length)));
    result.append(kKinds[q.kind].suffix);
    return true;
}

// The length of the balanced inside that starts at `from`, without its closing parenthesis, or npos.
size_t FindClosing(std::string_view text, size_t from) {
    size_t depth = 1;
    for (size_t i = from; i < text.size(); ++i) {
        if (text[i] == '(') ++depth;
        if (text[i] == ')' && --depth == 0) return i;
    }
    return std::string_view::npos;
}

}  // namespace

bool EvaluateCalc(std::string_view text, CssString& result, const LengthContext& metrics) {
    if (text.size() < 2) {
        AssertFailure("Invalid calc() expression to evaluate!");
        return false;
    }
    while (!text.empty() && IsSpace(text.front()))
        text.remove_prefix(1);
    constexpr std::string_view kOpening = "calc(";
    for (;;) {
        const size_t start = text.find(kOpening);
        if (start == std::string_view::npos) break;
        const size_t inside = start + kOpening.size();
        const size_t end = FindClosing(text, inside);
        if (end == std::string_view::npos) {
            LogWarning("Calc expression error near: ", text.substr(start));
            return false;
        }
        result.append(text.substr(0, start));
        Compiler compiler(text.substr(inside, end - inside));
        if (!compiler.Run()) return false;
        const std::optional<Quantity> value = Execute(compiler.program(), metrics);
        if (!value || !AppendLiteral(*value, result)) return false;
        text.remove_prefix(end + 1);
    }
    result.append(text);
    return true;
}

}  // namespace qorvex::css
