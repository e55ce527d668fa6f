#include "device/accounts/DeviceListService.h"

#include "platform/system/WorkQueues.h"

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <map>
#include <mutex>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::device {

namespace {

using DeviceList = DeviceDescription::DeviceList;

std::vector<Text> textsOf(const std::vector<std::string>& names) {
    return {names.begin(), names.end()};
}

std::optional<DeviceListResponse> responseOf(const std::optional<DeviceList>& list) {
    if (!list || list->outcome == DeviceList::Outcome::fails) {
        return std::nullopt;
    }
    return DeviceListResponse{.incompatibleDeviceNames = textsOf(list->incompatible),
                              .needUpgradeDeviceNames = textsOf(list->needUpgrade)};
}

std::chrono::nanoseconds nanosecondsOf(double seconds) {
    // Nobody waits that long, and a timer can count no further than some hundreds of years.
    constexpr std::chrono::duration<double> longest = std::chrono::years(100);
    return std::chrono::duration_cast<std::chrono::nanoseconds>(
        std::min(std::chrono::duration<double>(seconds), longest));
}

} // namespace

/// The questions that were asked and not answered. What runs on the queue finds its question here
/// by a number, so that whoever ends the questions has their handlers in hand.
class DeviceListService::Questions : public std::enable_shared_from_this<Questions> {
public:
    Questions(DeviceListFile file, WorkQueues& queues) : _file(std::move(file)), _queues(queues) {}

    void ask(std::shared_ptr<const DeviceListRequest> request, bool hasAccount,
             DeviceListRequest::Handler handler) {
        Number number = 0;
        {
            const std::scoped_lock lock(_mutex);
            if (_isFinished) {
                return;
            }
            if (!_queue) {
                _queue = _queues.serialQueueWithLabel("device-list");
            }
            number = ++_lastNumber;
            _open.emplace(number, Question{.request = std::move(request),
                                           .handler = std::move(handler),
                                           .timer = nullptr});
        }
        _queue->async([weakSelf = weak_from_this(), number, hasAccount] {
            if (const auto self = weakSelf.lock()) {
                self->begin(number, hasAccount);
            }
        });
    }

    void finish() {
        std::map<Number, Question> released; // let go without the lock
        const std::scoped_lock lock(_mutex);
        _isFinished = true;
        released.swap(_open);
    }

private:
    using Number = std::uint64_t;
    struct Question {
        /// Kept until the answer, which hands it over.
        std::shared_ptr<const DeviceListRequest> request;
        DeviceListRequest::Handler handler;
        /// Null but for an answer that takes its time.
        std::shared_ptr<TimerEventSource> timer;
    };

    // On the queue.

    void begin(Number number, bool hasAccount) {
        if (!isOpen(number)) {
            return;
        }
        const auto list = hasAccount ? _file.read() : std::nullopt;
        if (list && list->delay > 0) {
            answerIn(nanosecondsOf(list->delay), number);
        } else {
            answer(number, list);
        }
    }

    void answerIn(std::chrono::nanoseconds delay, Number number) {
        const auto timer = _queues.timerSourceOnQueue(*_queue);
        timer->setEventHandler([weakSelf = weak_from_this(), number] {
            if (const auto self = weakSelf.lock()) {
                self->answer(number, self->_file.read());
            }
        });
        {
            const std::scoped_lock lock(_mutex);
            const auto question = _open.find(number);
            if (question == _open.end()) {
                return;
            }
            question->second.timer = timer;
        }
        timer->setTimer(delay, std::chrono::nanoseconds(0), std::chrono::nanoseconds(0));
        timer->resume();
    }

    void answer(Number number, const std::optional<DeviceList>& list) {
        if (list && list->outcome == DeviceList::Outcome::neverAnswers) {
            return;
        }
        if (auto question = take(number)) {
            question->handler(*question->request, responseOf(list));
        }
    }

    [[nodiscard]] bool isOpen(Number number) {
        const std::scoped_lock lock(_mutex);
        return _open.contains(number);
    }

    [[nodiscard]] std::optional<Question> take(Number number) {
        const std::scoped_lock lock(_mutex);
        auto question = _open.extract(number);
        return question ? std::optional(std::move(question.mapped())) : std::nullopt;
    }

    const DeviceListFile _file;
    WorkQueues& _queues;
    std::mutex _mutex;
    /// Made at the first question and the same from then on.
    std::shared_ptr<WorkQueue> _queue;
    /// Behind the queue, which their timers use.
    std::map<Number, Question> _open;
    Number _lastNumber = 0;
    bool _isFinished = false;
};

/// Shared with its question until that is answered, so that it may be let go before.
class DeviceListService::Request final : public DeviceListRequest,
                                         public std::enable_shared_from_this<Request> {
public:
    Request(std::shared_ptr<Account> account, std::shared_ptr<Questions> questions)
        : _account(std::move(account)), _questions(std::move(questions)) {}

    void performRequestWithHandler(Handler handler) override {
        _questions->ask(shared_from_this(), _account != nullptr, std::move(handler));
    }

private:
    const std::shared_ptr<Account> _account;
    const std::shared_ptr<Questions> _questions;
};

DeviceListService::DeviceListService(DeviceListFile file, WorkQueues& queues)
    : _questions(std::make_shared<Questions>(std::move(file), queues)) {}

DeviceListService::~DeviceListService() {
    finish();
}

std::shared_ptr<DeviceListRequest>
DeviceListService::initWithAccount(const std::shared_ptr<Account>& account) {
    return std::make_shared<Request>(account, _questions);
}

void DeviceListService::finish() {
    _questions->finish();
}

} // namespace nimbra::device
