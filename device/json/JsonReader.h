#pragma once

#include "platform/values/Error.h"

#include <cstdint>
#include <expected>
#include <filesystem>
#include <initializer_list>
#include <memory>
#include <nlohmann/json_fwd.hpp>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace nimbra::device {

/// Reads one place of a JSON document, and the places below it.
///
/// The readers of one document share its first problem: a place that is not what was expected is
/// noted with the file, the place as a JSON pointer, what was expected and what stands there; the
/// operation then gives a default and reading goes on. Whoever reads a document asks `problem`
/// once at its end, before using anything of what was read.
///
/// Copies read the same document, which lives as long as one of them. Not thread-safe.
class JsonReader {
public:
    /// A reader at the root of the document in `text`, which messages call `name`. Text that is
    /// not JSON is an error with line and column.
    [[nodiscard]] static std::expected<JsonReader, Error> parse(std::string_view text,
                                                                const std::string& name);
    /// The same for the regular file at `path`, as `readPlainFile` reads it.
    [[nodiscard]] static std::expected<JsonReader, Error>
    readFile(const std::filesystem::path& path);

    /// What was wrong first, in the whole document; nothing while all was as expected.
    [[nodiscard]] std::optional<Error> problem() const;

    /// Whether nothing stands at this place.
    [[nodiscard]] bool isAbsent() const;
    /// Whether null stands at this place, or nothing.
    [[nodiscard]] bool isNull() const;
    [[nodiscard]] bool isObject() const;
    [[nodiscard]] bool isString() const;
    [[nodiscard]] bool isBoolean() const;

    // What stands at this place; `fallback` where nothing stands. Anything else is a problem.

    [[nodiscard]] bool boolean(bool fallback = false) const;
    [[nodiscard]] std::int64_t integer(std::int64_t fallback = 0) const;
    [[nodiscard]] double number(double fallback = 0) const;
    [[nodiscard]] std::string string(const std::string& fallback = {}) const;
    /// The string at this place; nothing for null or nothing.
    [[nodiscard]] std::optional<std::string> stringOrNull() const;

    /// The elements of the array at this place, in order; none where nothing stands.
    [[nodiscard]] std::vector<JsonReader> elements() const;

    /// The member `key` of the object at this place, which may be absent.
    [[nodiscard]] JsonReader member(const std::string& key) const;
    /// The keys of the object at this place, in the order of the file; none where nothing stands.
    [[nodiscard]] std::vector<std::string> keys() const;
    /// Notes the first member of the object at this place that is not in `known` as a problem.
    void allowOnly(std::initializer_list<std::string_view> known) const;

    /// What stands at this place, as it is; null where nothing stands.
    [[nodiscard]] const nlohmann::ordered_json& value() const;

    /// Notes that `expected` was expected at this place, for rules of the caller's own.
    void expected(const std::string& expected) const;
    /// Notes `what` of this place, for rules that say more than what was expected.
    void note(const std::string& what) const;

    /// This place as a JSON pointer; empty for the root.
    [[nodiscard]] const std::string& pointer() const { return _pointer; }

private:
    struct Document;
    JsonReader(std::shared_ptr<Document> document, const nlohmann::ordered_json* value,
               std::string pointer);

    std::shared_ptr<Document> _document;
    const nlohmann::ordered_json* _value;
    std::string _pointer;
};

} // namespace nimbra::device
