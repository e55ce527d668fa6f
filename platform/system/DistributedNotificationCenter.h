#pragma once

#include "platform/system/NotificationCenter.h"

namespace nimbra {

/// The daemon has another date of the last sync, or none any more.
inline const NotificationName MRDidUpdateLastSyncStatusDistributedNotification{
    "MRDidUpdateLastSyncStatusDistributedNotification"};
/// User info, date: the last sync's.
inline const UserInfoKey MRSyncStatusLastSyncDateKey{"MRSyncStatusLastSyncDateKey"};

/// Tells observers in all processes of the device. Any thread.
///
/// An observation has a queue: a notification comes from outside, on no thread of the observer's.
/// A sender cannot be told from another one in its process, so an observation names none. User info
/// carries booleans, numbers, texts and dates; what it has beside them stays behind.
class DistributedNotificationCenter : public NotificationCenter {};

} // namespace nimbra
