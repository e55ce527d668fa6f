#include "device/description/DescriptionParts.h"
#include "device/description/DescriptionValues.h"
#include "device/json/JsonReader.h"

#include <algorithm>
#include <array>
#include <csignal>

namespace nimbra::device {

namespace {

/// A signal that a program can end itself with.
int readSignal(const JsonReader& reader) {
    // A program that got one of these would go on or, worse, stop where nobody lets it go on; and
    // two are the C library's own.
    constexpr std::array others{SIGCHLD, SIGCONT, SIGSTOP,  SIGTSTP, SIGTTIN,
                                SIGTTOU, SIGURG,  SIGWINCH, 32,      33};
    constexpr int highest = 64;
    const auto signal = static_cast<int>(readIntegerBetween(reader, 1, highest));
    if (std::ranges::find(others, signal) != others.end()) {
        reader.expected("a signal that ends a program");
    }
    return signal;
}

} // namespace

void readTool(const JsonReader& reader, DeviceDescription& description) {
    using Kind = DeviceDescription::Tool::Kind;
    description.tool = {};
    if (reader.isNull()) {
        description.tool.kind = Kind::missing;
    } else if (reader.isObject()) {
        constexpr int highestExit = 255;
        reader.allowOnly({"exit", "signal", "writesArchive"});
        description.tool.kind = Kind::standIn;
        description.tool.exitStatus =
            static_cast<int>(readIntegerBetween(reader.member("exit"), 0, highestExit));
        if (const JsonReader signal = reader.member("signal"); !signal.isNull()) {
            description.tool.signal = readSignal(signal);
        }
        description.tool.writesArchive = reader.member("writesArchive").boolean();
    } else if (!reader.isString() || reader.string() != "real") {
        reader.expected("an object, null or \"real\"");
    }
}

} // namespace nimbra::device
