#pragma once

#include "device/files/Descriptor.h"
#include "platform/host/ShareSheet.h"

#include <QObject>
#include <QSocketNotifier>
#include <QString>
#include <QVariantList>
#include <memory>
#include <optional>
#include <sys/types.h>

namespace nimbra::host {
class PaneSession;
}

namespace nimbra::window {

class HostTexts;
class SessionPump;

/// The share sheet that a pane has presented: the ways of sending that it allows, in its order, and
/// what this host offers with any file, which sends it nowhere: a copy, and its path. Main queue.
class SharingModel final : public QObject {
    Q_OBJECT
    Q_PROPERTY(bool isShown MEMBER _isShown NOTIFY changed)
    Q_PROPERTY(QString fileName MEMBER _fileName NOTIFY changed)
    /// Each with `title`, `isAvailable` and `way`, the number to share with.
    Q_PROPERTY(QVariantList ways MEMBER _ways NOTIFY changed)
    /// Where a copy is put when the user says nothing else.
    Q_PROPERTY(QString usualFolder READ usualFolder CONSTANT)
    /// What went wrong with what the user tried last; empty for nothing.
    Q_PROPERTY(QString problem MEMBER _problem NOTIFY changed)

public:
    /// None is owned; all outlive the model.
    SharingModel(host::PaneSession& session, SessionPump& pump, const HostTexts& texts);

    /// Hands the file to one of the ways.
    Q_INVOKABLE void share(int way);
    /// Copies the file to `target`, a folder or the name of what is no file yet; "~" is the user's
    /// own folder.
    Q_INVOKABLE void save(const QString& target);
    Q_INVOKABLE void copyPath();
    /// The user does not want to share.
    Q_INVOKABLE void cancel();

    [[nodiscard]] static QString usualFolder();

Q_SIGNALS:
    void changed();
    /// Something has been done with the file, which `notice` tells.
    void shared(const QString& notice);

private:
    void update();
    void show(const ShareSheet& sheet);
    void end(ShareOutcome outcome);
    void fail(const QString& problem);
    void mailEnded();

    host::PaneSession& _session;
    SessionPump& _pump;
    const HostTexts& _texts;
    std::shared_ptr<ShareSheet> _sheet;
    bool _isShown = false;
    std::string _file;
    QString _fileName;
    QVariantList _ways;
    QString _problem;
    /// The mail program while it begins a mail, and the sheet that it was asked for on.
    pid_t _mail = 0;
    std::weak_ptr<ShareSheet> _mailSheet;
    std::optional<device::Descriptor> _mailProcess;
    std::unique_ptr<QSocketNotifier> _mailEnd;
};

} // namespace nimbra::window
