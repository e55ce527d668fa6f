#include "device/description/DescriptionParts.h"
#include "device/description/DescriptionValues.h"
#include "device/json/JsonReader.h"

#include <optional>
#include <vector>

namespace nimbra::device {

namespace {

/// A list of outcomes in which null stands for a call that is really made and `readFailure` knows
/// the others.
template <class ReadFailure>
auto readOutcomes(const JsonReader& reader, ReadFailure readFailure) {
    std::vector<std::optional<decltype(readFailure(reader))>> outcomes;
    for (const JsonReader& outcome : reader.elements()) {
        if (outcome.isNull()) {
            outcomes.emplace_back(std::nullopt);
        } else {
            outcomes.emplace_back(readFailure(outcome));
        }
    }
    return outcomes;
}

bool readRefusal(const JsonReader& reader) {
    if (!reader.isBoolean() || reader.boolean()) {
        reader.expected("false or null");
    }
    return false;
}

int readErrno(const JsonReader& reader) {
    // The kernel has none above.
    constexpr int highest = 4095;
    return static_cast<int>(readIntegerBetween(reader, 1, highest));
}

} // namespace

void readFaults(const JsonReader& reader, DeviceDescription& description) {
    reader.allowOnly({"save", "consentSet", "removeItem", "createDirectory", "spawn"});
    description.saveFaults = readOutcomes(reader.member("save"), readError);
    description.consentSetFaults = readOutcomes(reader.member("consentSet"), readRefusal);
    description.removeItemFaults = readOutcomes(reader.member("removeItem"), readError);
    description.createDirectoryFaults = readOutcomes(reader.member("createDirectory"), readError);
    description.spawnFaults = readOutcomes(reader.member("spawn"), readErrno);
}

} // namespace nimbra::device
