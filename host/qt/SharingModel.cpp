#include "host/qt/SharingModel.h"

#include "device/DevicePlatform.h"
#include "device/documents/DeviceFileManager.h"
#include "host/core/PaneSession.h"
#include "host/core/Sharing.h"
#include "host/qt/HostTexts.h"
#include "host/qt/SessionPump.h"
#include "host/qt/Strings.h"

#include <QClipboard>
#include <QDir>
#include <QFileInfo>
#include <QGuiApplication>
#include <QStandardPaths>
#include <QVariantMap>
#include <array>
#include <sys/syscall.h>
#include <unistd.h>
#include <utility>

namespace nimbra::window {

namespace {

struct Way {
    ActivityType type;
    const char* title = nullptr;
};

/// All that a pane may ask for, in the order of a sheet that asks for none.
const std::array<Way, 3>& knownWays() {
    static const std::array ways{Way{ActivityTypeMessage, "message"}, Way{ActivityTypeMail, "mail"},
                                 Way{ActivityTypeNearbyTransfer, "nearbyTransfer"}};
    return ways;
}

constexpr int mailWay = 1;

/// Only mail has a program on a desktop that takes a file from another one.
bool isAvailable(const Way& way) {
    return way.type == ActivityTypeMail && host::findMailProgram().has_value();
}

} // namespace

SharingModel::SharingModel(host::PaneSession& session, SessionPump& pump, const HostTexts& texts)
    : _session(session), _pump(pump), _texts(texts) {
    connect(&_pump, &SessionPump::ran, this, &SharingModel::update);
}

QString SharingModel::usualFolder() {
    const QString downloads = QStandardPaths::writableLocation(QStandardPaths::DownloadLocation);
    return downloads.isEmpty() || !QFileInfo(downloads).isDir() ? QDir::homePath() : downloads;
}

void SharingModel::update() {
    const auto sheet = _session.presentations().shareSheet();
    if (std::exchange(_sheet, sheet) == sheet) {
        return;
    }
    _isShown = sheet != nullptr;
    _problem.clear();
    if (sheet) {
        show(*sheet);
    }
    Q_EMIT changed();
}

void SharingModel::show(const ShareSheet& sheet) {
    _file.clear();
    if (!sheet.activityItems().empty()) {
        const FileURL& item = sheet.activityItems().front();
        const auto file = _session.device().fileManager().fileSystemRepresentation(item);
        _file = file.value_or("");
        _fileName = qString(std::filesystem::path(item.path()).filename().string());
    }
    _ways.clear();
    const auto offer = [this](const ActivityType& type) {
        for (std::size_t way = 0; way < knownWays().size(); ++way) {
            const Way& known = knownWays().at(way);
            if (known.type == type) {
                _ways.append(QVariantMap{
                    {QStringLiteral("title"), _texts.text(QString::fromLatin1(known.title))},
                    {QStringLiteral("isAvailable"), isAvailable(known)},
                    {QStringLiteral("way"), static_cast<int>(way)}});
            }
        }
    };
    if (const auto& types = sheet.includedActivityTypes()) {
        for (const ActivityType& type : *types) {
            offer(type);
        }
    } else {
        for (const Way& way : knownWays()) {
            offer(way.type);
        }
    }
}

void SharingModel::share(int way) {
    const auto program = host::findMailProgram();
    if (!_sheet || way != mailWay || !program || _mailEnd) {
        return;
    }
    const auto process = host::beginMail(*program, _file);
    if (!process) {
        fail(_texts.text(QStringLiteral("mailFailed"), qString(process.error())));
        return;
    }
    _mail = *process;
    _mailSheet = _sheet;
    _mailProcess.emplace(static_cast<int>(::syscall(SYS_pidfd_open, _mail, 0U)));
    if (!_mailProcess->isOpen()) {
        // Without a way to be told, the window waits with the mail program.
        mailEnded();
        return;
    }
    _mailEnd = std::make_unique<QSocketNotifier>(_mailProcess->number(), QSocketNotifier::Read);
    connect(_mailEnd.get(), &QSocketNotifier::activated, this, &SharingModel::mailEnded);
}

void SharingModel::mailEnded() {
    if (_mailEnd) {
        // It is asked from its own signal to go.
        _mailEnd->setEnabled(false);
        _mailEnd.release()->deleteLater();
    }
    _mailProcess.reset();
    const auto begun = host::awaitMail(host::findMailProgram().value_or("xdg-email"), _mail);
    if (_mailSheet.expired() || _mailSheet.lock() != _sheet) {
        // The user has left the sheet since, and is asked nothing any more.
        return;
    }
    if (begun) {
        end(ShareOutcome::sent);
    } else {
        fail(_texts.text(QStringLiteral("mailFailed"), qString(begun.error())));
    }
}

void SharingModel::save(const QString& target) {
    if (!_sheet) {
        return;
    }
    const auto copy = host::copyFile(_file, host::withHome(target.trimmed().toStdString()));
    if (!copy) {
        fail(qString(copy.error()));
        return;
    }
    Q_EMIT shared(_texts.text(QStringLiteral("saved"), qString(copy->string())));
    end(ShareOutcome::sent);
}

void SharingModel::copyPath() {
    if (!_sheet) {
        return;
    }
    QGuiApplication::clipboard()->setText(qString(_file));
    Q_EMIT shared(_texts.text(QStringLiteral("copied")));
    end(ShareOutcome::sent);
}

void SharingModel::cancel() {
    if (_sheet) {
        end(ShareOutcome::cancelled);
    }
}

void SharingModel::fail(const QString& problem) {
    _problem = problem;
    Q_EMIT changed();
}

void SharingModel::end(ShareOutcome outcome) {
    const auto sheet = _sheet;
    auto& presentations = _session.presentations();
    if (presentations.shareSheet() == sheet) {
        static_cast<void>(presentations.endSharing(outcome));
    }
    // Where the pane leaves it standing.
    if (presentations.shareSheet() == sheet) {
        presentations.dismissLast();
    }
    _pump.run();
}

} // namespace nimbra::window
