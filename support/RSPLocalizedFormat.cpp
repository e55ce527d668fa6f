#include "support/RSPLocalizedFormat.h"

#include "support/RSPLocalizedString.h"

namespace nimbra {

Text RSPLocalizedFormat(const Text& key, const Text& table, const std::shared_ptr<Bundle>& bundle,
                        const Localization& localization,
                        std::initializer_list<FormatArgument> arguments) {
    const Text format = RSPLocalizedString(key, table, bundle);
    if (!format) {
        return {};
    }
    return localization.stringWithFormatLocaleArguments(format, localization.currentLocale(),
                                                        arguments);
}

} // namespace nimbra
