#pragma once

#include "platform/system/WorkQueue.h"
#include "platform/values/Identifier.h"
#include "platform/values/UserInfo.h"

#include <functional>
#include <memory>

namespace nimbra {

/// The host application has come to the front.
inline const NotificationName ApplicationDidBecomeActiveNotification{
    "ApplicationDidBecomeActiveNotification"};
/// Somebody signed in to cloud documents, or out.
inline const NotificationName TidewaterIdentityDidChangeNotification{
    "TidewaterIdentityDidChangeNotification"};
/// A document container came or went.
inline const NotificationName MRContainerListDidChangeNotification{
    "MRContainerListDidChangeNotification"};

/// One posting: its name, who posted it (may be null), and what it carries.
struct Notification {
    NotificationName name;
    const void* object = nullptr;
    UserInfo userInfo;
};

/// Stands for one registration. Letting it go does not end the registration.
class ObserverToken {
public:
    virtual ~ObserverToken() = default;
};

/// Tells observers within this process of what has happened. Any thread.
class NotificationCenter {
public:
    using Block = std::function<void(const Notification&)>;

    struct Observation {
        /// Only postings of this sender; null for every sender's.
        const void* object = nullptr;
        /// Where the block runs, asynchronously; null for at once, on the queue that posts. Not
        /// owned: it outlives the registration.
        WorkQueue* queue = nullptr;
        Block usingBlock;
    };

    virtual ~NotificationCenter() = default;

    /// Calls the observation's block for every notification called `name` from now on, in the
    /// order of registration. The block is held until `removeObserver`.
    [[nodiscard]] virtual std::shared_ptr<ObserverToken>
    addObserverForName(const NotificationName& name, Observation observation) = 0;

    /// Ends the registration that `token` stands for; null, or a token that is no longer
    /// registered, is nothing to remove. A block that another thread has begun runs to its end.
    virtual void removeObserver(const std::shared_ptr<ObserverToken>& token) = 0;

    /// Tells every observer of `notification`. Returns when those without a queue have run.
    virtual void postNotification(const Notification& notification) = 0;
};

} // namespace nimbra
