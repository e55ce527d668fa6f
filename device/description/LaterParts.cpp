#include "device/description/LaterParts.h"

#include "device/description/DescriptionValues.h"
#include "device/json/JsonReader.h"

#include <cstdint>
#include <string>

namespace nimbra::device {

namespace {

void checkBoolean(const JsonReader& reader) {
    static_cast<void>(reader.boolean());
}

void checkIntegerBetween(const JsonReader& reader, std::int64_t least, std::int64_t most) {
    const std::int64_t value = reader.integer(least);
    if (value < least || value > most) {
        reader.expected("an integer from " + std::to_string(least) + " to " + std::to_string(most));
    }
}

/// Checks a list of outcomes in which null stands for success and `checkFailure` knows the others.
template <class CheckFailure>
void checkOutcomes(const JsonReader& reader, CheckFailure checkFailure) {
    for (const JsonReader& outcome : reader.elements()) {
        if (!outcome.isNull()) {
            checkFailure(outcome);
        }
    }
}

constexpr int highestExit = 255;
constexpr int highestSignal = 64;
constexpr int highestErrno = 4095;

} // namespace

void checkTool(const JsonReader& reader) {
    if (reader.isNull() || (reader.isString() && reader.string() == "real")) {
        return;
    }
    if (!reader.isObject()) {
        reader.expected("an object, null or \"real\"");
        return;
    }
    reader.allowOnly({"exit", "signal", "writesArchive"});
    checkIntegerBetween(reader.member("exit"), 0, highestExit);
    if (const JsonReader signal = reader.member("signal"); !signal.isNull()) {
        checkIntegerBetween(signal, 1, highestSignal);
    }
    checkBoolean(reader.member("writesArchive"));
}

void checkFaults(const JsonReader& reader) {
    reader.allowOnly({"save", "consentSet", "removeItem", "createDirectory", "spawn"});
    for (const char* const key : {"removeItem", "createDirectory"}) {
        checkOutcomes(reader.member(key),
                      [](const JsonReader& outcome) { static_cast<void>(readError(outcome)); });
    }
    checkOutcomes(reader.member("spawn"),
                  [](const JsonReader& outcome) { checkIntegerBetween(outcome, 1, highestErrno); });
}

} // namespace nimbra::device
