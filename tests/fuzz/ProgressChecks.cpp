#include "tests/fuzz/ProgressChecks.h"

#include "device/documents/ProgressFile.h"
#include "tests/fuzz/OneLine.h"

namespace nimbra::test {

std::string faultInProgressFile(std::string_view text) {
    const auto values = device::parseProgressFile(text, "a\nfile");
    if (!values) {
        const std::string& message = values.error().description;
        return !message.empty() && isOneLine(message) ? "" : "an error is not told in one line";
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
