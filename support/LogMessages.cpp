#include "support/LogMessages.h"

namespace nimbra {

void writeLogMessage(SystemLog& log, const LogMessage& message, std::string_view argument) {
    if (!log.isEnabled(message.level)) {
        return;
    }
    constexpr std::string_view placeholder = "%@";
    std::string line(message.text);
    if (const auto place = line.find(placeholder); place != std::string::npos) {
        line.replace(place, placeholder.size(), argument);
    }
    log.write(message.level, line);
}

} // namespace nimbra
