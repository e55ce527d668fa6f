#include "device/documents/ProgressFile.h"

#include "device/DeviceError.h"
#include "device/json/JsonReader.h"

namespace nimbra::device {

namespace {

Text textOrNull(const JsonReader& reader) {
    const auto text = reader.stringOrNull();
    return text ? Text(*text) : Text();
}

double readFraction(const JsonReader& reader) {
    const double fraction = reader.number();
    if (fraction < 0 || fraction > 1) {
        reader.expected("a number from 0 to 1");
    }
    return fraction;
}

ProgressValues readProgress(const JsonReader& reader) {
    if (!reader.isObject()) {
        reader.expected("an object");
        return {};
    }
    reader.allowOnly(
        {"fraction", "indeterminate", "description", "additional", "fileOperationKind"});
    return {.fileOperationKind = textOrNull(reader.member("fileOperationKind")),
            .fraction = readFraction(reader.member("fraction")),
            .indeterminate = reader.member("indeterminate").boolean(),
            .description = textOrNull(reader.member("description")),
            .additional = textOrNull(reader.member("additional"))};
}

std::unexpected<Error> inOneLine(Error error) {
    error.description = oneLine(error.description);
    return std::unexpected(std::move(error));
}

} // namespace

bool isProgressFileName(std::string_view name) {
    constexpr std::string_view suffix = ".json";
    return name.size() > suffix.size() && name.ends_with(suffix) && !name.starts_with('.') &&
           oneLine(name) == name;
}

std::expected<ProgressValues, Error> parseProgressFile(std::string_view text,
                                                       const std::string& name) {
    const auto reader = JsonReader::parse(text, name);
    if (!reader) {
        return inOneLine(reader.error());
    }
    ProgressValues values = readProgress(*reader);
    if (const auto problem = reader->problem()) {
        return inOneLine(*problem);
    }
    return values;
}

} // namespace nimbra::device
