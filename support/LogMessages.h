#pragma once

#include "platform/system/SystemLog.h"

#include <string_view>

namespace nimbra {

/// A line that the pane writes to the system log: its level and its fixed English text, in which
/// "%@" stands for the description of an argument.
struct LogMessage {
    LogLevel level;
    std::string_view text;
};

/// Every line that the pane writes to the system log. They are never localized; that they differ
/// in capitals and punctuation is meant, and whoever searches a log relies on it.
namespace log_messages {

inline constexpr LogMessage markingAccount{LogLevel::standard,
                                           "Marking account as using Nimbra Drive"};
inline constexpr LogMessage enablingDataclasses{LogLevel::standard,
                                                "Enabling Tidewater and all TSY dataclasses..."};
inline constexpr LogMessage updatedCellularFlag{
    LogLevel::debug, "Successfully updated use-cellular flag on Nimbra account."};
inline constexpr LogMessage failedToUpdateCellularFlag{
    LogLevel::error, "Error updating use-cellular flag on Nimbra account: %@"};
inline constexpr LogMessage loadingTessaryBundle{LogLevel::standard,
                                                 "Tessary settings bundle not loaded. Loading..."};
inline constexpr LogMessage noBundleForIdentifier{LogLevel::error,
                                                  "Error! No bundle for bundle ID: %@"};
inline constexpr LogMessage noCachedAccess{LogLevel::error, "Error! No cached PRV access info"};
inline constexpr LogMessage failedToCreateDiagnoseDirectory{LogLevel::error,
                                                            "error creating diagnose dir: %@"};
/// The class at its head is not the pane's: the line keeps the name under which it is known.
inline constexpr LogMessage settingShareSourceView{
    LogLevel::standard,
    "VTUIDocumentsDataViewController: Setting source view of activity VC as %@."};
inline constexpr LogMessage noLastSyncDate{LogLevel::error, "Can't retrieve last sync date; %@"};
inline constexpr LogMessage noLastSyncSentence{LogLevel::error, "can't fetch last sync; %@"};

} // namespace log_messages

/// Writes `message` to `log` where its level is enabled, with `argument` in the place of "%@".
/// Any thread.
void writeLogMessage(SystemLog& log, const LogMessage& message, std::string_view argument = {});

} // namespace nimbra
