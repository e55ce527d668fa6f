#pragma once

#include "host/cli/Terminal.h"
#include "host/core/RowDescription.h"

#include <string>
#include <vector>

namespace nimbra::cli {

/// Rows as a person reads them: groups apart from each other, switches with on and off at the
/// right edge, footers below. Of rows that have the same name each shows its identifier, too.
class ListText {
public:
    explicit ListText(Terminal terminal) : _terminal(terminal) {}

    /// A whole page called `title`.
    [[nodiscard]] std::string page(const std::string& title,
                                   const std::vector<host::RowDescription>& rows) const;

    /// What is different in `after` from `before`, a row a line: "+" stands before a row that
    /// came, "-" before one that went, "~" before one that has changed. Headings are left out.
    [[nodiscard]] std::string changes(const std::vector<host::RowDescription>& before,
                                      const std::vector<host::RowDescription>& after) const;

private:
    [[nodiscard]] std::string rowLine(const std::string& name,
                                      const host::RowDescription& row) const;
    [[nodiscard]] std::string footer(const host::RowDescription& group) const;
    [[nodiscard]] std::string styled(const char* style, const std::string& text) const;

    Terminal _terminal;
};

} // namespace nimbra::cli
