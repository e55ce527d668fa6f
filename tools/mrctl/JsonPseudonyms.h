#pragma once

#include <nlohmann/json_fwd.hpp>

namespace nimbra::mrctl {

class Pseudonyms;

/// `value`, of any form, with pseudonyms in its keys and texts, and for everything under a key that
/// names a secret.
[[nodiscard]] nlohmann::ordered_json replacedInJson(const nlohmann::ordered_json& value,
                                                    Pseudonyms& pseudonyms);

/// The same, with a pseudonym for each text that is a sentence: whatever has a blank or is not
/// ASCII.
[[nodiscard]] nlohmann::ordered_json withoutSentences(const nlohmann::ordered_json& value,
                                                      Pseudonyms& pseudonyms);

} // namespace nimbra::mrctl
