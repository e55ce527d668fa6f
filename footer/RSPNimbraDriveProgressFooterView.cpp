#include "footer/RSPNimbraDriveProgressFooterView.h"

#include "footer/LastSyncTimer.h"
#include "platform/documents/DaemonConnection.h"
#include "platform/documents/LastSync.h"
#include "platform/documents/ProgressReports.h"
#include "platform/system/Clock.h"
#include "platform/system/DistributedNotificationCenter.h"
#include "platform/system/WorkQueues.h"
#include "platform/views/Label.h"
#include "platform/views/LayoutConstraint.h"
#include "platform/views/ProgressView.h"
#include "platform/views/ViewMetrics.h"
#include "support/LogMessages.h"

#include <array>
#include <chrono>
#include <map>
#include <string>
#include <string_view>
#include <utility>
#include <variant>
#include <vector>

namespace nimbra {

namespace {

/// Between the bar and the text, in points; the vertical format says the same.
constexpr double gap = 5.0;

/// The values of a progress that the view follows, in the order in which it registers.
const std::array<KeyPath, 3>& observedKeyPaths() {
    static const std::array<KeyPath, 3> keyPaths{localizedDescriptionKeyPath,
                                                 localizedAdditionalDescriptionKeyPath,
                                                 fractionCompletedKeyPath};
    return keyPaths;
}

/// The date that a notification carries; nothing when it carries none.
std::optional<Date> dateIn(const UserInfo& userInfo) {
    const auto entry = userInfo.find(MRSyncStatusLastSyncDateKey);
    if (entry == userInfo.end()) {
        return std::nullopt;
    }
    const Date* date = std::get_if<Date>(&entry->second);
    return date != nullptr ? std::optional(*date) : std::nullopt;
}

/// Both descriptions, or the first alone; the second never stands alone.
Text textOf(const ProgressReport& progress) {
    Text description = progress.localizedDescription();
    const Text additional = progress.localizedAdditionalDescription();
    if (description.string().empty() || additional.string().empty()) {
        return description;
    }
    return {description.string() + " (" + additional.string() + ')'};
}

} // namespace

// Construction

std::shared_ptr<RSPNimbraDriveProgressFooterView>
RSPNimbraDriveProgressFooterView::initWithFrame(const Rect& frame,
                                                const PlatformServices& services) {
    auto view = std::make_shared<RSPNimbraDriveProgressFooterView>(Key(), frame, services);
    view->createTimer();
    view->createSubviews();
    view->createConstraints();
    view->_statusLabel->setContentCompressionResistancePriorityForAxis(highLayoutPriority,
                                                                       LayoutAxis::vertical);
    return view;
}

std::shared_ptr<RSPNimbraDriveProgressFooterView>
RSPNimbraDriveProgressFooterView::initWithSpecifier(const Specifier& /*group*/,
                                                    const PlatformServices& services) {
    return initWithFrame({}, services);
}

RSPNimbraDriveProgressFooterView::RSPNimbraDriveProgressFooterView(Key /*key*/, const Rect& frame,
                                                                   const PlatformServices& services)
    : HeaderFooterView(services, frame) {}

RSPNimbraDriveProgressFooterView::~RSPNimbraDriveProgressFooterView() {
    // A suspended timer is let go as it is: it calls nothing that would have to be stopped.
    if (_lastSyncAutoUpdate) {
        _lastSyncSource->cancel();
        _lastSyncAutoUpdate = false;
    }
}

void RSPNimbraDriveProgressFooterView::createTimer() {
    _lastSyncSource = services().workQueues->timerSourceOnQueue(services().workQueues->mainQueue());
    // The handler holds the view, and the view its timer: the platform lets go of the handler when
    // it shuts down.
    _lastSyncSource->setEventHandler([view = sharedFromThis()] {
        if (!view->isSyncing()) {
            view->_updateLocalizedLastSync();
        }
    });
}

void RSPNimbraDriveProgressFooterView::createSubviews() {
    _progressBar = std::make_shared<ProgressView>(services(), ProgressViewStyle::standard);
    _progressBar->setHidden(true);
    _progressBar->setTranslatesAutoresizingMaskIntoConstraints(false);
    addSubview(_progressBar);

    _statusLabel = std::make_shared<Label>(services(), Rect());
    // Four blanks keep the place of a line until there is something to say.
    _statusLabel->setText("    ");
    _statusLabel->setTextColor(Color::gray);
    _statusLabel->setFont(services().viewMetrics->preferredFontForTextStyle(FontTextStyleCaption1));
    _statusLabel->setNumberOfLines(0);
    _statusLabel->setTextAlignment(TextAlignment::center);
    _statusLabel->setTranslatesAutoresizingMaskIntoConstraints(false);
    addSubview(_statusLabel);
}

void RSPNimbraDriveProgressFooterView::createConstraints() {
    const std::map<std::string, View*> views{{"_statusLabel", _statusLabel.get()},
                                             {"_progressBar", _progressBar.get()}};
    const auto add = [&](std::string_view format, std::map<std::string, double> metrics) {
        // The formats stand here and nowhere else: one that cannot be read is a fault of this file,
        // which its tests find, and nothing that whoever reads a log could mend.
        addConstraints(LayoutConstraint::constraintsWithVisualFormat(
                           format, {.metrics = std::move(metrics), .views = views})
                           .value_or(std::vector<LayoutConstraint>()));
    };
    add("H:|-[_statusLabel]-|", {});
    add("H:|-(progressMargin)-[_progressBar]-(progressMargin)-|", {{"progressMargin", 50.0}});
    add("V:|[_progressBar]-(5)-[_statusLabel]|", {});
}

// In and out of windows

void RSPNimbraDriveProgressFooterView::willMoveToWindow(Window* window) {
    // The base class has nothing to do here and is not asked.
    if (const auto subscriber = globalProgressSubscriber()) {
        services().progressReports->_removeSubscriber(subscriber);
        setGlobalProgressSubscriber(nullptr);
        _updateLocalizedLastSync();
    }
    if (window == nullptr) {
        // The timer goes on as it is, and the registration for the last sync stays.
        return;
    }
    readLastSyncDate();
    observeLastSync();
    subscribeToProgress();
}

void RSPNimbraDriveProgressFooterView::readLastSyncDate() {
    const auto date = services().lastSync->MRGetLastSyncDateWithError();
    if (!date) {
        writeLogMessage(services().systemLog, log_messages::noLastSyncDate, date.error().line());
        return;
    }
    if (*date) {
        _updateLocalizedLastSyncAndScheduleAutoUpdateWithDate(*date);
    }
}

void RSPNimbraDriveProgressFooterView::observeLastSync() {
    // Each entry into a window adds a registration, and none is ever taken back: that is meant.
    // All of them act, and the last one's token is kept.
    setLastSyncDateSubscriber(services().distributedNotificationCenter->addObserverForName(
        MRDidUpdateLastSyncStatusDistributedNotification,
        {.queue = &services().workQueues->mainQueue(),
         .usingBlock = [view = sharedFromThis()](const Notification& notification) {
             if (!view->isSyncing()) {
                 view->_updateLocalizedLastSyncAndScheduleAutoUpdateWithDate(
                     dateIn(notification.userInfo));
             }
         }}));
}

void RSPNimbraDriveProgressFooterView::subscribeToProgress() {
    setGlobalProgressSubscriber(
        services().progressReports->_addSubscriberForFileURLWithPublishingHandler(
            services().daemonConnection->mobileDocumentsURL(),
            [view = sharedFromThis()](const std::shared_ptr<ProgressReport>& progress)
                -> ProgressReports::UnpublishingHandler {
                if (progress->userInfo().contains(ProgressFileOperationKindKey)) {
                    // A single file's; only the whole sync is shown.
                    return [] {};
                }
                view->beginShowing(progress);
                return [progress, view] { view->endShowing(*progress); };
            }));
}

// Progress

void RSPNimbraDriveProgressFooterView::beginShowing(
    const std::shared_ptr<ProgressReport>& progress) {
    _syncing = true;
    _progressBar->setProgressAnimated(0, false);
    _progressBar->setHidden(false);
    for (const KeyPath& keyPath : observedKeyPaths()) {
        progress->addObserver(sharedFromThis(), {.forKeyPath = keyPath,
                                                 .options = KeyValueObservingOptions::initial});
    }
}

void RSPNimbraDriveProgressFooterView::endShowing(ProgressReport& progress) {
    for (const KeyPath& keyPath : observedKeyPaths()) {
        progress.removeObserverForKeyPath(*this, keyPath);
    }
    _syncing = false;
    _progressBar->setHidden(true);
    _updateLocalizedLastSync();
    setNeedsLayout();
}

void RSPNimbraDriveProgressFooterView::observeValueForKeyPath(const KeyPath& keyPath,
                                                              const Observation& observation) {
    const auto* progress = dynamic_cast<const ProgressReport*>(&observation.ofObject);
    if (progress == nullptr) {
        HeaderFooterView::observeValueForKeyPath(keyPath, observation);
        return;
    }
    // Whichever value has changed, everything is shown anew.
    show(*progress);
}

void RSPNimbraDriveProgressFooterView::show(const ProgressReport& progress) {
    if (progress.isIndeterminate()) {
        if (!_progressBar->isHidden()) {
            _progressBar->setHidden(true);
            _updateLocalizedLastSync();
        }
    } else {
        _progressBar->setHidden(false);
        _progressBar->setProgressAnimated(static_cast<float>(progress.fractionCompleted()), true);
        _statusLabel->setText(textOf(progress));
    }
    setNeedsLayout();
}

// Height

Size RSPNimbraDriveProgressFooterView::intrinsicContentSize() const {
    // One line is counted, whatever the label holds: that is meant, so that the rows below do not
    // jump while texts come and go.
    const double barHeight = _progressBar ? _progressBar->intrinsicContentSize().height : 0;
    return {ViewNoIntrinsicMetric, _statusLabel->lineHeight() + barHeight + gap};
}

double
RSPNimbraDriveProgressFooterView::preferredHeightForWidthInTableView(double /*width*/,
                                                                     const Table* /*table*/) const {
    return intrinsicContentSize().height;
}

// The sentence of the last sync

void RSPNimbraDriveProgressFooterView::_updateLocalizedLastSync() {
    const auto sentence = services().lastSync->MRGetLocalizedLastSyncWithError();
    if (!sentence) {
        writeLogMessage(services().systemLog, log_messages::noLastSyncSentence,
                        sentence.error().line());
        return;
    }
    _statusLabel->setText(*sentence);
    if (!*sentence && _lastSyncAutoUpdate) {
        _lastSyncSource->suspend();
        _lastSyncAutoUpdate = false;
    }
}

void RSPNimbraDriveProgressFooterView::_updateLocalizedLastSyncAndScheduleAutoUpdateWithDate(
    const std::optional<Date>& date) {
    _updateLocalizedLastSync();
    if (!date || !_statusLabel->text()) {
        return;
    }
    _lastSyncSource->setTimer(firstDelay(secondsSince(*date, services().clock->now())),
                              refreshInterval, std::chrono::nanoseconds(0));
    if (!_lastSyncAutoUpdate) {
        _lastSyncSource->resume();
        _lastSyncAutoUpdate = true;
    }
}

// Properties

RowValue RSPNimbraDriveProgressFooterView::valueForKey(const KeyPath& key) const {
    if (key.string() == "syncing") {
        return isSyncing();
    }
    if (key.string() == "lastSyncAutoUpdate") {
        return _lastSyncAutoUpdate;
    }
    if (key.string() == "subscribed") {
        return globalProgressSubscriber() != nullptr;
    }
    return HeaderFooterView::valueForKey(key);
}

std::shared_ptr<ProgressSubscriber>
RSPNimbraDriveProgressFooterView::globalProgressSubscriber() const {
    const std::scoped_lock lock(_tokens);
    return _globalProgressSubscriber;
}

void RSPNimbraDriveProgressFooterView::setGlobalProgressSubscriber(
    std::shared_ptr<ProgressSubscriber> subscriber) {
    const std::scoped_lock lock(_tokens);
    _globalProgressSubscriber = std::move(subscriber);
}

std::shared_ptr<ObserverToken> RSPNimbraDriveProgressFooterView::lastSyncDateSubscriber() const {
    const std::scoped_lock lock(_tokens);
    return _lastSyncDateSubscriber;
}

void RSPNimbraDriveProgressFooterView::setLastSyncDateSubscriber(
    std::shared_ptr<ObserverToken> token) {
    const std::scoped_lock lock(_tokens);
    _lastSyncDateSubscriber = std::move(token);
}

std::shared_ptr<RSPNimbraDriveProgressFooterView>
RSPNimbraDriveProgressFooterView::sharedFromThis() {
    return std::static_pointer_cast<RSPNimbraDriveProgressFooterView>(shared_from_this());
}

} // namespace nimbra
