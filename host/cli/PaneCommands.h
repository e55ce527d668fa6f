#pragma once

#include "host/cli/Dialog.h"
#include "host/cli/Failure.h"
#include "host/cli/ListText.h"
#include "host/core/RowDescription.h"

#include <expected>
#include <iosfwd>
#include <string>
#include <string_view>
#include <vector>

namespace nimbra::host {
class PaneSession;
}

namespace nimbra::cli {

/// What the user can do with the open pane of a session, the same from the command line and from
/// the shell's prompt. Main queue.
class PaneCommands {
public:
    /// Neither is owned; both outlive the commands. The session's pane is open.
    PaneCommands(host::PaneSession& session, std::ostream& out);

    using Outcome = std::expected<void, Failure>;

    [[nodiscard]] Outcome list() const;
    [[nodiscard]] Outcome listAsJson() const;
    [[nodiscard]] Outcome get(std::string_view row) const;
    [[nodiscard]] Outcome set(std::string_view row, std::string_view value);
    /// Taps the row. A link's page is printed; through what a button opens over the page the user
    /// is led, with the answers of `ask`.
    [[nodiscard]] Outcome tap(std::string_view row, const Ask& ask);

    /// How the rows differ now from how they were when the commands were made, or when this was
    /// asked last: a row a line, empty where nothing is different. The page may have closed.
    [[nodiscard]] std::string takeChanges();

    /// What each row can be called by, headings left out: its name, or its identifier where
    /// another row has the same name. Names that cannot be typed are left out.
    [[nodiscard]] std::vector<std::string> rowNames() const;
    /// The identifiers of the rows that have one, headings left out.
    [[nodiscard]] std::vector<std::string> rowIdentifiers() const;

private:
    void showDetail();
    [[nodiscard]] std::vector<host::RowDescription> rows() const;

    host::PaneSession& _session;
    std::ostream& _out;
    ListText _text;
    std::vector<host::RowDescription> _shown;
};

} // namespace nimbra::cli
