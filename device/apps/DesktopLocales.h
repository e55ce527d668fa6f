#pragma once

#include <string>
#include <vector>

namespace nimbra::device {

/// How desktop entries call the languages of `chain`, BCP 47 tags with the best first: "de-AT" is
/// "de_AT", "sr-Latn" is "sr@latin". A script that the region tells has no other name, so that
/// "zh-Hant" is "zh_TW". In the order of the chain, each name once.
[[nodiscard]] std::vector<std::string> desktopLocaleNames(const std::vector<std::string>& chain);

} // namespace nimbra::device
