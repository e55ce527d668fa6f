#pragma once

#include "platform/values/Text.h"

namespace nimbra {
class HeaderFooterView;
}

namespace nimbra::host {

/// What there is to say of a status footer at one moment, for a reader as for a program. Main
/// queue.
struct FooterDescription {
    /// Whether a progress of the whole sync is published.
    bool syncing = false;
    bool barHidden = true;
    /// From 0 to 1.
    float barProgress = 0;
    /// What stands under the bar; blanks where there is nothing to say.
    Text text;
    /// In points.
    double height = 0;
    double lineHeight = 0;
    double barHeight = 0;
    /// Whether the sentence of the last sync is kept fresh.
    bool timerRunning = false;
    /// Whether progress that is published comes to the footer.
    bool subscribed = false;

    /// Of a view with a bar and a label right in it; of another one what can be said.
    [[nodiscard]] static FooterDescription of(const HeaderFooterView& footer);

    friend bool operator==(const FooterDescription&, const FooterDescription&) = default;
};

} // namespace nimbra::host
