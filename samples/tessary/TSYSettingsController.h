#pragma once

#include "platform/host/SettingsListController.h"

#include <string>
#include <vector>

namespace nimbra::samples {

/// The page of the cloud database: which groups of applications may look the user up by e-mail
/// address. The row that opens it has the database's account under `AccountKey`. It is a sample:
/// what is switched on it is forgotten when it goes. Main queue only.
class TSYSettingsController final : public SettingsListController {
public:
    explicit TSYSettingsController(const PlatformServices& services);

    [[nodiscard]] const SpecifierArray& specifiers() override;

private:
    [[nodiscard]] std::shared_ptr<Specifier> groupOfAccount() const;
    [[nodiscard]] std::shared_ptr<Specifier> switchOfGroup(std::size_t index);

    /// Which of the groups may, in the order of their rows.
    std::vector<bool> _mayLookUp;
};

} // namespace nimbra::samples
