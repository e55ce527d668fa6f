#pragma once

#include "platform/PlatformServices.h"
#include "platform/host/HeaderFooterView.h"
#include "platform/host/Specifier.h"
#include "platform/views/Window.h"

#include <array>
#include <memory>
#include <string>
#include <vector>

namespace nimbra {
class ClassRegistry;
class SystemLog;
} // namespace nimbra

namespace nimbra::host {

/// The views under the groups of one pane's list: made when a group that names a class of them
/// comes into the list for the first time, and kept while the pane is open. A list that is built
/// anew has other groups, of the same identifiers: their views stay. While the pane is shown, those
/// whose group is in the list are in its window. Main queue.
class GroupFooters {
public:
    /// Looks classes up in `classes` and makes their views over `services`; who names a class that
    /// nobody registered is told to `log`. None is owned; all outlive this and the views.
    GroupFooters(const ClassRegistry& classes, const PlatformServices& services, SystemLog& log);
    GroupFooters(const GroupFooters&) = delete;
    GroupFooters& operator=(const GroupFooters&) = delete;
    /// Takes the views out of the window and lets them go.
    ~GroupFooters();

    /// Makes the views of the groups among `rows` that have none yet, and takes those out of the
    /// window whose group is not among them.
    void update(const SpecifierArray& rows);

    /// Moves the views into the window, or out of it; where they are already, nothing happens.
    void setShown(bool isShown);

    /// Lays out what asks for it, for a list that is `width` points wide.
    void layOut(double width);

    /// The view under `group`; null where it has none.
    [[nodiscard]] std::shared_ptr<HeaderFooterView> footerOf(const Specifier& group) const;
    /// The first view from the top; null where there is none.
    [[nodiscard]] std::shared_ptr<HeaderFooterView> first() const;

    /// Moves the first view into a window, also straight from one into another, or out of it.
    /// There is one.
    void moveFirst(bool intoWindow);

private:
    struct Footer {
        std::shared_ptr<Specifier> group;
        std::string className;
        /// Null where the class is unknown.
        std::shared_ptr<HeaderFooterView> view;

        /// Whether the view is the one for `row`, whose views are of this class.
        [[nodiscard]] bool isFor(const Specifier& row, const std::string& rowClass) const;
    };

    [[nodiscard]] std::shared_ptr<HeaderFooterView> viewFor(const Specifier& group,
                                                            const std::string& className);
    static void move(const Footer& footer, Window* window);

    const ClassRegistry& _classes;
    PlatformServices _services;
    SystemLog& _log;
    bool _isShown = false;
    /// The pane's own, and another one to move straight into.
    std::array<Window, 2> _windows{};
    /// Of the groups in the list, from top to bottom.
    std::vector<Footer> _footers;
    /// Of groups that are not in the list and may come back.
    std::vector<Footer> _absent;
};

} // namespace nimbra::host
