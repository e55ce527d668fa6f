#pragma once

#include "platform/host/SettingsListController.h"

#include <memory>
#include <string>

namespace nimbra::host {

/// The page that a link row of a pane has opened on top of it, one at a time. Main queue.
class DetailPage {
public:
    /// Shows the page of the class that `row` names, over `services`, in the place of the one
    /// before; nothing where the row names none, or one that makes no pages. `parent` is the page
    /// of the row.
    void open(const std::shared_ptr<Specifier>& row, const PlatformServices& services,
              const std::shared_ptr<SettingsListController>& parent);

    /// Takes the page away; nothing when there is none.
    void leave();

    /// The page; null for none.
    [[nodiscard]] const std::shared_ptr<SettingsListController>& page() const { return _page; }
    /// What the page calls itself, or else what its row is called. There is a page.
    [[nodiscard]] std::string title() const;

private:
    std::shared_ptr<SettingsListController> _page;
};

} // namespace nimbra::host
