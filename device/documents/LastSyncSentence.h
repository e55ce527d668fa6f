#pragma once

#include "platform/values/Date.h"

#include <expected>
#include <string>

namespace nimbra::device {

/// For whom, and when, the last sync is told of.
struct SentenceReader {
    /// A BCP 47 tag.
    std::string locale;
    /// An IANA name: days begin and end there.
    std::string timeZone;
    Date now;
};

/// The sentence that tells `reader` when the last sync was: how many minutes ago within the hour,
/// how many hours ago on the same day, then yesterday, then the day, with its year where that is
/// another one. What is less than a minute ago, or still to come, was just now. In English where
/// there are no texts in the reader's language. The error says what could not be formatted.
[[nodiscard]] std::expected<std::string, std::string>
lastSyncSentence(Date lastSync, const SentenceReader& reader);

} // namespace nimbra::device
