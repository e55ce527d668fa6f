#pragma once

#include "host/core/AccountFlags.h"
#include "host/core/AccountPage.h"
#include "host/qt/DrawnViews.h"
#include "host/qt/ShownRows.h"

#include <QObject>
#include <QVariant>
#include <expected>
#include <memory>
#include <optional>
#include <string>

namespace nimbra {
struct Error;
class SettingsListController;
} // namespace nimbra
namespace nimbra::host {
class PaneSession;
struct RowRefusal;
struct ShownAlert;
} // namespace nimbra::host

namespace nimbra::window {

class SessionPump;

/// What a window shows of a session: the page of the account, the pane and the page behind a link,
/// with the sign that the pane is busy, the status of the sync and alerts over them. Main queue.
class PaneModel final : public QObject {
    Q_OBJECT
    Q_PROPERTY(nimbra::window::ShownRows* accountRows READ accountRows CONSTANT)
    Q_PROPERTY(nimbra::window::ShownRows* rows READ rows CONSTANT)
    Q_PROPERTY(nimbra::window::ShownRows* detailRows READ detailRows CONSTANT)
    Q_PROPERTY(nimbra::window::DrawnViews* status READ status CONSTANT)
    Q_PROPERTY(bool isOpen MEMBER _isOpen NOTIFY changed)
    /// Whether the pane's page can be seen: while it is open, and until it has left.
    Q_PROPERTY(bool isPaneShown MEMBER _isPaneShown NOTIFY changed)
    Q_PROPERTY(QString title MEMBER _title NOTIFY changed)
    Q_PROPERTY(bool isDetailShown MEMBER _isDetailShown NOTIFY changed)
    /// Whether pages that have been closed leave by and by: they stay as they were until
    /// `forgetClosed`. Else they are gone at once.
    Q_PROPERTY(bool keepsClosed MEMBER _keepsClosed)
    Q_PROPERTY(bool isDetailOpen MEMBER _isDetailOpen NOTIFY changed)
    Q_PROPERTY(QString detailTitle MEMBER _detailTitle NOTIFY changed)
    /// What the pane is busy with; null while it is not.
    Q_PROPERTY(QVariant activity MEMBER _activity NOTIFY changed)
    Q_PROPERTY(bool isRefreshing MEMBER _isRefreshing NOTIFY changed)
    /// The alert on top, with `title`, `message`, `actions` (each with `title`, `isCancel`); null
    /// for none.
    Q_PROPERTY(QVariant alert MEMBER _alert NOTIFY alertChanged)
    /// In points.
    Q_PROPERTY(qreal statusHeight MEMBER _statusHeight NOTIFY changed)
    /// What the status of the sync says, for those who cannot see it.
    Q_PROPERTY(QString statusText MEMBER _statusText NOTIFY changed)

public:
    /// Opens panes as `entry` says. The session and its pump outlive the model.
    PaneModel(host::PaneSession& session, SessionPump& pump, host::PaneEntry entry,
              DrawnViews::Look look);
    PaneModel(const PaneModel&) = delete;
    PaneModel& operator=(const PaneModel&) = delete;
    ~PaneModel() override;

    /// Shows the page of the account, where no pane is open.
    [[nodiscard]] std::expected<void, Error> showAccount();
    /// Opens the pane from it and shows it.
    [[nodiscard]] std::expected<void, Error> showPane();

    Q_INVOKABLE void open();
    /// Leaves the page on top; nothing on the page of the account, and under what stands over it.
    Q_INVOKABLE void goBack();
    Q_INVOKABLE void refreshPane();
    Q_INVOKABLE void answerAlert(int action);
    Q_INVOKABLE void setListWidth(qreal width);
    /// Whatever has been closed has left.
    Q_INVOKABLE void forgetClosed();
    /// The window has come to the front. A pane whose account has been changed elsewhere is opened
    /// anew then, unless something stands over it or is under way: it asks for its account once.
    void becomeActive();

    [[nodiscard]] ShownRows* accountRows() { return &_accountRows; }
    [[nodiscard]] ShownRows* rows() { return &_rows; }
    [[nodiscard]] ShownRows* detailRows() { return &_detailRows; }
    [[nodiscard]] DrawnViews* status() { return &_status; }
    [[nodiscard]] bool isOpen() const { return _isOpen; }
    [[nodiscard]] const QString& title() const { return _title; }

    /// Shows what the session is like now.
    void update();

Q_SIGNALS:
    void changed();
    void alertChanged();
    /// The pane is about to be opened, and `title` is what it is called.
    void paneOpening(const QString& title);
    void paneOpened();
    /// Also where it could not be opened.
    void paneClosed();
    /// What the user wanted could not be done; `problem` says why.
    void failed(const QString& problem);

private:
    [[nodiscard]] RowsModel::Actions actionsOfPane();
    [[nodiscard]] RowsModel::Actions actionsOfDetail();
    /// Does what an action has set going, and gives back whether the action `isDone`.
    [[nodiscard]] bool ran(bool isDone);
    [[nodiscard]] bool isReplaceable() const;
    void openAnew();
    void updatePages();
    void dropClosed();
    void forgetPane();
    void forgetDetail();
    void updateDetail();
    void updateAlert();
    void updateStatus();

    host::PaneSession& _session;
    SessionPump& _pump;
    host::PaneEntry _entry;
    ShownRows _accountRows;
    ShownRows _rows;
    ShownRows _detailRows;
    DrawnViews _status;
    std::shared_ptr<host::AccountPage> _shownAccount;
    std::shared_ptr<SettingsListController> _shownDetail;
    std::shared_ptr<const host::ShownAlert> _shownAlert;
    /// Of when the pane was opened.
    std::optional<host::AccountFlags> _account;
    bool _isOpen = false;
    bool _isPaneShown = false;
    bool _isDetailShown = false;
    bool _keepsClosed = false;
    QString _title;
    bool _isDetailOpen = false;
    QString _detailTitle;
    QVariant _activity;
    bool _isRefreshing = false;
    QVariant _alert;
    qreal _statusHeight = 0;
    QString _statusText;
};

} // namespace nimbra::window
