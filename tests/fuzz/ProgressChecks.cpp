#include "tests/fuzz/ProgressChecks.h"

#include "device/documents/ProgressFile.h"

#include <algorithm>
#include <unicode/unistr.h>

namespace nimbra::test {

namespace {

bool isUtf8(const std::string& text) {
    std::string again;
    icu::UnicodeString::fromUTF8(text).toUTF8String(again);
    return again == text;
}

} // namespace

std::string faultInProgressFile(std::string_view text) {
    const auto values = device::parseProgressFile(text, "a\nfile");
    if (!values) {
        const std::string& message = values.error().description;
        const auto isControl = [](unsigned char byte) { return byte < 0x20; };
        return !message.empty() && isUtf8(message) && std::ranges::none_of(message, isControl)
                   ? ""
                   : "an error is not told in one line";
    }
    if (!(values->fraction >= 0 && values->fraction <= 1)) {
        return "the fraction is not from 0 to 1";
    }
    for (const Text& told : {values->description, values->additional, values->fileOperationKind}) {
        if (!isUtf8(told.string())) {
            return "a text is not UTF-8";
        }
    }
    return "";
}

} // namespace nimbra::test
