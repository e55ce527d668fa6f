#include "device/apps/ProcessRecord.h"

#include <charconv>
#include <system_error>

namespace nimbra::device {

namespace {

/// Takes the number at the start of `text` away from it; nothing where none is, or one that is too
/// large. Numbers have no sign.
template <class Number>
std::optional<Number> takeNumber(std::string_view& text) {
    if (text.starts_with('-')) {
        return std::nullopt;
    }
    Number number = 0;
    const auto [end, failure] = std::from_chars(text.data(), text.data() + text.size(), number);
    if (failure != std::errc()) {
        return std::nullopt;
    }
    text.remove_prefix(static_cast<std::size_t>(end - text.data()));
    return number;
}

} // namespace

std::optional<ProcessRecord> ProcessRecord::parse(std::string_view content) {
    if (content.ends_with('\n')) {
        content.remove_suffix(1);
    }
    const auto process = takeNumber<pid_t>(content);
    if (!process) {
        return std::nullopt;
    }
    ProcessRecord record{.process = *process, .startTime = std::nullopt};
    if (content.empty()) {
        return record;
    }
    if (!content.starts_with(' ')) {
        return std::nullopt;
    }
    content.remove_prefix(1);
    record.startTime = takeNumber<std::uint64_t>(content);
    return record.startTime && content.empty() ? std::optional(record) : std::nullopt;
}

std::string ProcessRecord::text() const {
    return std::to_string(process) + (startTime ? ' ' + std::to_string(*startTime) : "") + '\n';
}

} // namespace nimbra::device
