#pragma once

#include <nlohmann/json_fwd.hpp>

namespace nimbra::mrctl {

class Pseudonyms;

/// `value`, of any form, with pseudonyms in its keys and texts, and for everything under a key that
/// names a secret.
[[nodiscard]] nlohmann::ordered_json replacedInJson(const nlohmann::ordered_json& value,
                                                    Pseudonyms& pseudonyms);

} // namespace nimbra::mrctl
