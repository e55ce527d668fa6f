#include "host/qt/PaneModel.h"

#include "host/core/FooterDescription.h"
#include "host/core/PaneSession.h"
#include "host/qt/SessionPump.h"
#include "host/qt/Strings.h"

#include <QVariantMap>
#include <utility>

namespace nimbra::window {

namespace {

QVariant variantOf(const host::ShownAlert& alert) {
    QVariantList actions;
    for (const AlertAction& action : alert.actions) {
        actions.append(
            QVariantMap{{QStringLiteral("title"), qString(action.title)},
                        {QStringLiteral("isCancel"), action.style == AlertActionStyle::cancel}});
    }
    return QVariantMap{{QStringLiteral("title"), qString(alert.title)},
                       {QStringLiteral("message"), qString(alert.message)},
                       {QStringLiteral("actions"), actions}};
}

} // namespace

PaneModel::PaneModel(host::PaneSession& session, SessionPump& pump, host::PaneEntry entry,
                     DrawnViews::Look look)
    : _session(session), _pump(pump), _entry(std::move(entry)),
      _accountRows({.set = [](const auto&, bool) { return false; },
                    .tap =
                        [this](const auto&) {
                            open();
                            return _isOpen;
                        }}),
      _rows(actionsOfPane()), _detailRows(actionsOfDetail()), _status(std::move(look)) {
    _session.setListObserver(&_rows.rows());
    connect(&_rows.rows(), &RowsModel::isBehind, this, [this] {
        if (_session.isPaneOpen()) {
            _rows.rows().show(_session.rows());
        }
    });
    connect(&_pump, &SessionPump::ran, this, &PaneModel::update);
}

PaneModel::~PaneModel() {
    if (_shownAccount) {
        _shownAccount->setObserver(nullptr);
    }
    if (_shownDetail) {
        _shownDetail->setObserver(nullptr);
    }
    _session.setListObserver(nullptr);
}

RowsModel::Actions PaneModel::actionsOfPane() {
    return {.set = [this](const auto& row,
                          bool isOn) { return ran(_session.setRow(row, isOn).has_value()); },
            .tap = [this](const auto& row) { return ran(_session.tapRow(row).has_value()); }};
}

RowsModel::Actions PaneModel::actionsOfDetail() {
    return {.set = [this](const auto& row,
                          bool isOn) { return ran(host::turnSwitch(*row, isOn).has_value()); },
            .tap = [this](const auto& row) { return ran(host::pressButton(*row).has_value()); }};
}

bool PaneModel::ran(bool isDone) {
    _pump.run();
    return isDone;
}

std::expected<void, Error> PaneModel::showAccount() {
    auto opened = _session.openAccountPage(_entry);
    update();
    return opened;
}

std::expected<void, Error> PaneModel::showPane() {
    // What the pane is called, its row says.
    auto opened =
        _session.accountPage() ? std::expected<void, Error>() : _session.openAccountPage(_entry);
    if (opened) {
        Q_EMIT paneOpening(qString(_session.paneTitle()));
        _account = host::AccountFlags::of(_session, _entry);
        opened = _session.openPane(_entry);
    }
    if (opened) {
        update();
        _session.appear();
    } else {
        Q_EMIT paneClosed();
    }
    _pump.run();
    return opened;
}

void PaneModel::open() {
    if (_isOpen) {
        return;
    }
    if (const auto opened = showPane(); !opened) {
        // Whoever could not go on is still where it was; what keeps the page from being made keeps
        // the pane from it, too.
        static_cast<void>(showAccount());
        Q_EMIT failed(qString(opened.error().description));
    }
}

void PaneModel::goBack() {
    if (_session.activity() || _alert.isValid()) {
        return;
    }
    if (_isDetailOpen) {
        _session.detailPage().leave();
    } else if (_isOpen) {
        _session.closePane();
    }
    _pump.run();
}

void PaneModel::refreshPane() {
    if (_isOpen && !_isDetailOpen && !_session.activity()) {
        _session.pullToRefresh();
        _pump.run();
    }
}

void PaneModel::answerAlert(int action) {
    if (_session.presentations().alert()) {
        _session.presentations().answerAlert(static_cast<std::size_t>(action));
        _pump.run();
    }
}

void PaneModel::setListWidth(qreal width) {
    _session.setListWidth(width);
    _pump.run();
}

void PaneModel::becomeActive() {
    if (isReplaceable()) {
        auto account = host::AccountFlags::of(_session, _entry);
        if (account != _account) {
            _account = std::move(account);
            openAnew();
        }
    }
    _session.becomeActive();
    _pump.run();
}

bool PaneModel::isReplaceable() const {
    const host::Presentations& presentations = _session.presentations();
    return _isOpen && !_isDetailOpen && !_session.activity() && !_session.isRefreshing() &&
           !_entry.firstSetup.value_or(false) && !presentations.alert() &&
           !presentations.screen() && !presentations.shareSheet();
}

void PaneModel::openAnew() {
    // Nobody asks the rows of the pane that goes, which are shown until the others come.
    _rows.rows().freeze();
    _session.closePane();
    if (const auto opened = _session.openPane(_entry); !opened) {
        Q_EMIT failed(qString(opened.error().description));
        return;
    }
    _rows.rows().show(_session.rows());
    _session.appear();
}

void PaneModel::update() {
    updatePages();
    updateDetail();
    if (!_keepsClosed) {
        dropClosed();
    }
    updateAlert();
    updateStatus();
    const Text& activity = _session.activity();
    _activity = activity ? QVariant(qString(activity)) : QVariant();
    _isRefreshing = _session.isRefreshing();
    Q_EMIT changed();
}

void PaneModel::updatePages() {
    const bool wasOpen = std::exchange(_isOpen, _session.isPaneOpen());
    if (wasOpen && !_isOpen) {
        // Also where the pane has dismissed itself: the page that it was opened from is below it.
        _rows.rows().freeze();
        if (const auto opened = _session.openAccountPage(_entry); !opened) {
            Q_EMIT failed(qString(opened.error().description));
        }
    }
    if (_isOpen && !wasOpen) {
        // Whoever has opened it: a scenario does so without the user.
        if (_isPaneShown) {
            // An earlier one that is still leaving is another page, and gone at once.
            forgetPane();
            Q_EMIT changed();
        }
        _isPaneShown = true;
        _rows.rows().show(_session.rows());
    }
    const auto& account = _session.accountPage();
    if (account != _shownAccount) {
        _shownAccount = account;
        _accountRows.rows().show(account ? account->specifiers() : SpecifierArray());
    }
    if (account) {
        account->setObserver(&_accountRows.rows());
        _title = qString(_session.paneTitle());
    }
    if (_isOpen && !wasOpen) {
        Q_EMIT paneOpened();
    } else if (wasOpen && !_isOpen) {
        Q_EMIT paneClosed();
    }
}

void PaneModel::updateDetail() {
    const auto& page = _session.detailPage().page();
    if (page != _shownDetail) {
        const auto left = std::exchange(_shownDetail, page);
        if (left) {
            left->setObserver(nullptr);
        }
        if (left && _isOpen) {
            // The row that led there is drawn again, and tells how things are by now.
            _rows.rows().drawLinksAnew();
        }
        if (page && !left && _isDetailShown) {
            forgetDetail();
            Q_EMIT changed();
        }
        if (page) {
            page->setObserver(&_detailRows.rows());
            _detailRows.rows().show(page->specifiers());
        } else {
            _detailRows.rows().freeze();
        }
    }
    _isDetailOpen = page != nullptr;
    if (page) {
        _isDetailShown = true;
        _detailTitle = qString(_session.detailPage().title());
    }
}

void PaneModel::forgetClosed() {
    dropClosed();
    updateStatus();
    Q_EMIT changed();
}

void PaneModel::dropClosed() {
    if (!_isOpen && _isPaneShown) {
        forgetPane();
    }
    if (!_isDetailOpen && _isDetailShown) {
        forgetDetail();
    }
}

void PaneModel::forgetPane() {
    _isPaneShown = false;
    _rows.rows().show({});
    _rows.setSearch({});
}

void PaneModel::forgetDetail() {
    _isDetailShown = false;
    _detailRows.rows().show({});
}

void PaneModel::updateAlert() {
    const auto alert = _session.presentations().alert();
    if (std::exchange(_shownAlert, alert) != alert) {
        _alert = alert ? variantOf(*alert) : QVariant();
        Q_EMIT alertChanged();
    }
}

void PaneModel::updateStatus() {
    if (!_isOpen && _isPaneShown) {
        return;
    }
    const auto footer = _isOpen ? _session.footers().first() : nullptr;
    _status.show(footer.get());
    if (footer) {
        const auto description = host::FooterDescription::of(*footer);
        _statusHeight = description.height;
        _statusText = qString(description.text).trimmed();
    } else {
        _statusHeight = 0;
        _statusText.clear();
    }
}

} // namespace nimbra::window
