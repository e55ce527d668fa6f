#include "host/core/CommandLine.h"

#include "device/system/LanguageChain.h"

namespace nimbra::host {

std::string problemOfLanguage(const std::string& tag) {
    return device::isLanguageTag(tag) ? std::string()
                                      : '"' + tag + "\" is not a language tag such as \"de-DE\"";
}

std::string problemOfPath(const std::string& path) {
    return path.empty() ? "is empty" : "";
}

} // namespace nimbra::host
