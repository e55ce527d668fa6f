#pragma once

#include "platform/system/Bundle.h"
#include "platform/values/Identifier.h"

#include <memory>
#include <optional>
#include <vector>

namespace nimbra {

/// Names a service that applications use only with the user's consent.
using PrivacyService = Identifier<struct PrivacyServiceKind>;

/// Cloud-document storage.
inline const PrivacyService kPRVServiceTidewater{"kPRVServiceTidewater"};
/// The cloud database.
inline const PrivacyService kPRVServiceBrackwater{"kPRVServiceBrackwater"};

/// What the store holds of one application's use of one service; its fields go by the names of the
/// store's keys.
struct PrivacyAccessRecord {
    /// The application; never null, but it may lack an identifier.
    std::shared_ptr<Bundle> kPRVInfoBundle;
    /// Whether the user consents; absent where nobody has said so yet.
    std::optional<bool> kPRVInfoGranted;
};

using PrivacyAccessRecords = std::vector<PrivacyAccessRecord>;

/// Which applications may use which services. Any queue; what is written is kept when the
/// operation comes back.
class PrivacyConsentStore {
public:
    virtual ~PrivacyConsentStore() = default;

    /// All records of `service` as they are now, in the order in which they came to be. Absent
    /// while the store cannot be read, which is logged.
    [[nodiscard]] virtual std::optional<PrivacyAccessRecords>
    PRVAccessCopyInformation(const PrivacyService& service) = 0;

    /// Sets whether the application `bundle` may use `service`. `bundle` is not owned and may be
    /// null, for which nothing can be kept. False where the store refuses, or cannot be written,
    /// which is logged; it is then unchanged.
    [[nodiscard]] virtual bool PRVAccessSetForBundle(const PrivacyService& service,
                                                     const Bundle* bundle, bool granted) = 0;
};

} // namespace nimbra
