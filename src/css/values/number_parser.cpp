#include "css/values/number_parser.h"

#include <charconv>

#include "css/values/text_reader.h"

namespace qorvex::css {

size_t ReadFloat(std::string_view text, float& out) {
    size_t sign = !text.empty() && (text[0] == '+' || text[0] == '-') ? 1 : 0;
    std::string_view digits = text.substr(sign);
    // Keeps out what the standard conversion takes beyond CSS: "inf", "nan" and a second sign.
    if (digits.empty() ||
        !(IsDigit(digits[0]) || (digits[0] == '.' && digits.size() > 1 && IsDigit(digits[1]))))
        return 0;
    size_t end = 0;
    while (end < digits.size() && IsDigit(digits[end]))
        ++end;
    if (end + 1 < digits.size() && digits[end] == '.' && IsDigit(digits[end + 1])) {
        ++end;
        while (end < digits.size() && IsDigit(digits[end]))
            ++end;
    }
    float value = 0;
    auto [last, error] = std::from_chars(digits.data(), digits.data() + end, value, std::chars_format::fixed);
    if (error == std::errc::result_out_of_range && digits.find_first_of("123456789") < end) {
        // Out of range upward is refused; a number too small for a float is 0.
        size_t integer = digits.find_first_not_of('0');
        if (integer < end && IsDigit(digits[integer])) return 0;
        value = 0;
        last = digits.data() + end;
    } else if (error != std::errc()) {
        return 0;
    }
    out = sign && text[0] == '-' ? -value : value;
    return sign + static_cast<size_t>(last - digits.data());
}

bool ParseFloat(std::string_view text, float& out) {
    size_t length = ReadFloat(text, out);
    return length != 0 && length == text.size();
}

bool ParseInt(std::string_view text, int32_t& out) {
    if (!text.empty() && text[0] == '+') {
        text.remove_prefix(1);
        if (text.empty() || !IsDigit(text[0])) return false;
    }
    auto [last, error] = std::from_chars(text.data(), text.data() + text.size(), out);
    return error == std::errc() && !text.empty() && last == text.data() + text.size();
}

bool ParseLength(std::string_view text, Length& out) {
    float value;
    size_t length = ReadFloat(text, value);
    if (length == 0) return false;
    std::string_view suffix = text.substr(length);
    if (suffix.empty()) {
        if (value != 0) return false;
        out = Length::Pixels(0);
        return true;
    }
    struct Unit {
        std::string_view suffix;
        LengthUnit unit;
    };
    static constexpr Unit kUnits[] = {
        {"px", LengthUnit::Px},     {"%", LengthUnit::Percent}, {"em", LengthUnit::Em},
        {"rem", LengthUnit::Rem},   {"vw", LengthUnit::Vw},     {"vh", LengthUnit::Vh},
        {"vmin", LengthUnit::Vmin}, {"vmax", LengthUnit::Vmax}, {"in", LengthUnit::In},
        {"pt", LengthUnit::Pt},
    };
    for (const Unit& unit : kUnits) {
        if (unit.suffix != suffix) continue;
        out = {unit.unit, value};
        return true;
    }
    return false;
}

bool ParseAngle(std::string_view text, float& degrees) {
    size_t length = ReadFloat(text, degrees);
    if (length == 0) return false;
    return text.substr(length) == "deg" || (length == text.size() && degrees == 0);
}

bool ParseTime(std::string_view text, float& seconds) {
    size_t length = ReadFloat(text, seconds);
    if (length == 0) return false;
    if (text.substr(length) == "s") return true;
    seconds /= 1000;
    return text.substr(length) == "ms";
}

}  // namespace qorvex::css
