#include "support/RSPLocalizedString.h"

#include "platform/system/Bundle.h"
#include "platform/system/Syslog.h"

#include <string>
#include <syslog.h>

namespace nimbra {

namespace {

/// The one object that a failed lookup gives back. It is known by its identity: a table may hold
/// the same words as a text of its own.
const Text& unavailable() {
    static const Text sentinel("RSP_LOCALIZED_STRING_UNAVAILABLE");
    return sentinel;
}

} // namespace

Text RSPLocalizedString(const Text& key, const Text& table, const std::shared_ptr<Bundle>& bundle) {
    if (!bundle) {
        return {};
    }
    Text text = bundle->localizedStringForKeyValueTable(key, unavailable(), table);
    if (text.isSameObjectAs(unavailable())) {
        writeSyslog(LOG_ERR, "Could not find localized string value for key: " + key.string());
    }
    return text;
}

} // namespace nimbra
