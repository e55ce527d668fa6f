#pragma once

#include <string>
#include <vector>

namespace nimbra::device {

/// The languages in which texts for a user of `locale`, a BCP 47 tag, are looked for, the best
/// first, without the language to fall back to in the end: "de-AT" gives "de-AT" and later "de",
/// "zh-TW" gives "zh-Hant" but not "zh", whose script another user reads.
[[nodiscard]] std::vector<std::string> languageChain(const std::string& locale);

/// Whether `tag` is a BCP 47 tag, from its beginning to its end.
[[nodiscard]] bool isLanguageTag(const std::string& tag);

} // namespace nimbra::device
