#include "device/description/Instant.h"

#include <algorithm>
#include <charconv>
#include <chrono>
#include <cstddef>
#include <string>
#include <string_view>

namespace nimbra::device {

namespace {

/// Reads a text from its beginning. What is not as it has to be ends the reading: all that comes
/// behind it counts as nothing.
class Scanner {
public:
    explicit Scanner(std::string_view text) : _rest(text) {}

    /// All digits that come next.
    std::string_view digits() {
        return taken(std::ranges::find_if_not(_rest, isDigit) - _rest.begin());
    }
    /// The number that the next `count` characters write, digits all of them.
    int number(std::ptrdiff_t count) {
        const std::string_view written = _rest.substr(0, static_cast<std::size_t>(count));
        int number = 0;
        expect(std::ssize(written) == count && std::ranges::all_of(written, isDigit));
        if (_isRead) {
            std::from_chars(written.data(), written.data() + written.size(), number);
            taken(count);
        }
        return number;
    }
    /// The next character where it is one of `choices`, else 0.
    char oneOf(std::string_view choices) {
        if (_rest.empty() || choices.find(_rest.front()) == std::string_view::npos) {
            return 0;
        }
        return taken(1).front();
    }
    void expect(bool isTrue) { _isRead = _isRead && isTrue; }
    /// Whether the text was as it has to be, to its end.
    [[nodiscard]] bool isReadWhole() const { return _isRead && _rest.empty(); }

private:
    static bool isDigit(char character) { return character >= '0' && character <= '9'; }

    std::string_view taken(std::ptrdiff_t count) {
        const std::string_view taken = _rest.substr(0, static_cast<std::size_t>(count));
        _rest.remove_prefix(taken.size());
        return taken;
    }

    std::string_view _rest;
    bool _isRead = true;
};

} // namespace

std::optional<Date> parseInstant(std::string_view text) {
    using namespace std::chrono;
    Scanner scanner(text);
    const auto separated = [&scanner](std::string_view separators, std::ptrdiff_t count) {
        scanner.expect(scanner.oneOf(separators) != 0);
        return scanner.number(count);
    };
    const int yearNumber = scanner.number(4);
    const int monthNumber = separated("-", 2);
    const int dayNumber = separated("-", 2);
    const int hour = separated("Tt", 2);
    const int minute = separated(":", 2);
    const int second = separated(":", 2);
    // ".5" is 500,000 microseconds: six digits behind the point, whatever was written.
    std::string fraction;
    if (scanner.oneOf(".") != 0) {
        fraction = scanner.digits();
        scanner.expect(!fraction.empty());
    }
    fraction.resize(6, '0');
    const char zone = scanner.oneOf("Zz+-");
    scanner.expect(zone != 0);
    const bool isOffset = zone == '+' || zone == '-';
    const int offsetHours = isOffset ? scanner.number(2) : 0;
    const int offsetMinutes = isOffset ? separated(":", 2) : 0;

    const year_month_day date(year(yearNumber), month(static_cast<unsigned>(monthNumber)),
                              day(static_cast<unsigned>(dayNumber)));
    // The sixtieth second is a leap second.
    if (!scanner.isReadWhole() || !date.ok() || hour > 23 || minute > 59 || second > 60 ||
        offsetHours > 23 || offsetMinutes > 59) {
        return std::nullopt;
    }
    const auto local = sys_days(date) + hours(hour) + minutes(minute) + seconds(second) +
                       microseconds(std::stoi(fraction));
    const auto offset = hours(offsetHours) + minutes(offsetMinutes);
    return zone == '-' ? local + offset : local - offset;
}

} // namespace nimbra::device
