#include "device/description/Instant.h"

#include <chrono>
#include <regex>

namespace nimbra::device {

std::optional<Date> parseInstant(const std::string& text) {
    using namespace std::chrono;
    static const std::regex form(R"((\d{4})-(\d\d)-(\d\d)[Tt](\d\d):(\d\d):(\d\d)(\.\d+)?)"
                                 R"(([Zz]|([+-])(\d\d):(\d\d)))");
    std::smatch match;
    if (!std::regex_match(text, match, form)) {
        return std::nullopt;
    }
    const auto number = [&match](std::size_t group) {
        return match[group].matched ? std::stoi(match[group].str()) : 0;
    };
    const year_month_day day(year(number(1)), month(static_cast<unsigned>(number(2))),
                             std::chrono::day(static_cast<unsigned>(number(3))));
    // The sixtieth second is a leap second.
    if (!day.ok() || number(4) > 23 || number(5) > 59 || number(6) > 60 || number(10) > 23 ||
        number(11) > 59) {
        return std::nullopt;
    }
    // ".5" is 500,000 microseconds: six digits behind the point, whatever was written.
    std::string fraction = match[7].matched ? match[7].str().substr(1) : "";
    fraction.resize(6, '0');
    const auto offset = hours(number(10)) + minutes(number(11));
    const auto local = sys_days(day) + hours(number(4)) + minutes(number(5)) + seconds(number(6)) +
                       microseconds(std::stoi(fraction));
    return match[9].str() == "-" ? local + offset : local - offset;
}

} // namespace nimbra::device
