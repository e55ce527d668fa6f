#include "support/LogMessages.h"

#include "tests/support/FakeSystemLog.h"

#include <gtest/gtest.h>
#include <string>

namespace nimbra {
namespace {

using test::FakeSystemLog;
using Lines = FakeSystemLog::Lines;

TEST(LogMessages, TheArgumentStandsInThePlaceOfThePlaceholder) {
    FakeSystemLog log;

    writeLogMessage(log, log_messages::noBundleForIdentifier, "com.example.notes");

    EXPECT_EQ(log.lines,
              Lines({{LogLevel::error, "Error! No bundle for bundle ID: com.example.notes"}}));
}

TEST(LogMessages, AnArgumentThatHoldsAPlaceholderIsTakenAsItStands) {
    FakeSystemLog log;

    writeLogMessage(log, log_messages::settingShareSourceView, "a %@ b");

    EXPECT_EQ(log.lines,
              Lines({{LogLevel::standard, "VTUIDocumentsDataViewController: Setting source view "
                                          "of activity VC as a %@ b."}}));
}

TEST(LogMessages, ALevelThatIsNotEnabledIsNotWritten) {
    FakeSystemLog log;
    log.enabled = {LogLevel::error};

    writeLogMessage(log, log_messages::updatedCellularFlag);
    writeLogMessage(log, log_messages::markingAccount);
    writeLogMessage(log, log_messages::noCachedAccess);

    EXPECT_EQ(log.lines, Lines({{LogLevel::error, "Error! No cached PRV access info"}}));
}

TEST(LogMessages, TheTextsAndLevelsAreTheSystemsOwn) {
    Lines expected{
        {LogLevel::standard, "Marking account as using Nimbra Drive"},
        {LogLevel::standard, "Enabling Tidewater and all TSY dataclasses..."},
        {LogLevel::debug, "Successfully updated use-cellular flag on Nimbra account."},
        {LogLevel::error, "Error updating use-cellular flag on Nimbra account: %@"},
        {LogLevel::standard, "Tessary settings bundle not loaded. Loading..."},
        {LogLevel::error, "Error! No bundle for bundle ID: %@"},
        {LogLevel::error, "Error! No cached PRV access info"},
        {LogLevel::error, "error creating diagnose dir: %@"},
        {LogLevel::standard,
         "VTUIDocumentsDataViewController: Setting source view of activity VC as %@."},
        {LogLevel::error, "Can't retrieve last sync date; %@"},
        {LogLevel::error, "can't fetch last sync; %@"},
    };

    Lines listed;
    for (const LogMessage& message :
         {log_messages::markingAccount, log_messages::enablingDataclasses,
          log_messages::updatedCellularFlag, log_messages::failedToUpdateCellularFlag,
          log_messages::loadingTessaryBundle, log_messages::noBundleForIdentifier,
          log_messages::noCachedAccess, log_messages::failedToCreateDiagnoseDirectory,
          log_messages::settingShareSourceView, log_messages::noLastSyncDate,
          log_messages::noLastSyncSentence}) {
        listed.emplace_back(message.level, message.text);
    }

    EXPECT_EQ(listed, expected);
}

} // namespace
} // namespace nimbra
