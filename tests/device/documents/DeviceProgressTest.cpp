#include "device/documents/DeviceProgress.h"

#include "tests/device/documents/ProgressObserver.h"

#include <gtest/gtest.h>
#include <limits>

namespace nimbra::device {
namespace {

using Calls = std::vector<std::string>;

class DeviceProgressTest : public testing::Test {
protected:
    void observe(const KeyPath& keyPath,
                 KeyValueObservingOptions options = KeyValueObservingOptions::none) {
        _progress->addObserver(_observer, {.forKeyPath = keyPath, .options = options});
    }
    void setFraction(double fraction) {
        _progress->apply({.values = {.fraction = fraction}, .keys = {ProgressKey::fraction}});
    }
    [[nodiscard]] DeviceProgress& progress() { return *_progress; }
    [[nodiscard]] test::ProgressObserver& observer() { return *_observer; }
    [[nodiscard]] std::shared_ptr<test::ProgressObserver>& observerItself() { return _observer; }

private:
    std::shared_ptr<DeviceProgress> _progress = std::make_shared<DeviceProgress>(
        ProgressValues{.fraction = 0.25, .description = "Uploading", .additional = "1 of 4"});
    std::shared_ptr<test::ProgressObserver> _observer = std::make_shared<test::ProgressObserver>();
};

TEST_F(DeviceProgressTest, TheValuesAreThoseItWasMadeWith) {
    const DeviceProgress ofOneFile(
        ProgressValues{.fileOperationKind = "copying", .indeterminate = true});

    EXPECT_EQ(progress().fractionCompleted(), 0.25);
    EXPECT_FALSE(progress().isIndeterminate());
    EXPECT_EQ(progress().localizedDescription(), Text("Uploading"));
    EXPECT_EQ(progress().localizedAdditionalDescription(), Text("1 of 4"));
    EXPECT_TRUE(progress().userInfo().empty());
    EXPECT_TRUE(ofOneFile.isIndeterminate());
    EXPECT_EQ(ofOneFile.localizedDescription(), Text());
    EXPECT_EQ(userInfoValue<Text>(ofOneFile.userInfo(), ProgressFileOperationKindKey),
              Text("copying"));
}

TEST_F(DeviceProgressTest, AFractionStaysFromNothingToAll) {
    for (const auto& [given, kept] :
         {std::pair{-0.5, 0.0}, std::pair{1.5, 1.0}, std::pair{0.5, 0.5},
          std::pair{std::numeric_limits<double>::infinity(), 1.0},
          std::pair{std::numeric_limits<double>::quiet_NaN(), 0.0}}) {
        setFraction(given);
        EXPECT_EQ(progress().fractionCompleted(), kept) << given;
    }
}

TEST_F(DeviceProgressTest, AnObserverIsToldInitiallyWithinItsRegistration) {
    int context = 0;
    progress().addObserver(observerItself(), {.forKeyPath = fractionCompletedKeyPath,
                                              .options = KeyValueObservingOptions::initial,
                                              .context = &context});
    observe(localizedDescriptionKeyPath);

    EXPECT_EQ(observer().calls, (Calls{"fractionCompleted 25%!"}));
    EXPECT_EQ(observer().context, &context);
}

TEST_F(DeviceProgressTest, EachKeyIsSetAndToldInTheOrderGiven) {
    observe(fractionCompletedKeyPath);
    observe(localizedDescriptionKeyPath);
    observe(localizedAdditionalDescriptionKeyPath);

    progress().apply(
        {.values = {.fileOperationKind = "copying",
                    .fraction = 0.5,
                    .indeterminate = true,
                    .description = "Done",
                    .additional = "all"},
         .keys = {ProgressKey::fraction, ProgressKey::fileOperationKind, ProgressKey::indeterminate,
                  ProgressKey::additional, ProgressKey::description}});

    EXPECT_EQ(observer().calls,
              (Calls{"fractionCompleted 50%", "fractionCompleted indeterminate",
                     "localizedAdditionalDescription all", "localizedDescription Done"}));
    EXPECT_EQ(progress().userInfo().size(), 1U);
}

TEST_F(DeviceProgressTest, AValueThatIsSetToWhatItWasIsToldToo) {
    observe(fractionCompletedKeyPath);

    progress().apply({.values = {.indeterminate = true}, .keys = {ProgressKey::indeterminate}});
    progress().apply({.values = {.indeterminate = true}, .keys = {ProgressKey::indeterminate}});

    EXPECT_EQ(observer().calls,
              (Calls{"fractionCompleted indeterminate", "fractionCompleted indeterminate"}));
}

TEST_F(DeviceProgressTest, RemovingEndsTheNewestRegistrationOfThatKey) {
    int first = 0;
    int second = 0;
    for (int* const context : {&first, &second}) {
        progress().addObserver(observerItself(),
                               {.forKeyPath = fractionCompletedKeyPath, .context = context});
    }
    progress().removeObserverForKeyPath(observer(), localizedDescriptionKeyPath);
    setFraction(0.5);
    EXPECT_EQ(observer().calls.size(), 2U);

    progress().removeObserverForKeyPath(observer(), fractionCompletedKeyPath);
    setFraction(0.75);
    EXPECT_EQ(observer().calls.size(), 3U);
    EXPECT_EQ(observer().context, &first);

    progress().removeObserverForKeyPath(observer(), fractionCompletedKeyPath);
    progress().removeObserverForKeyPath(observer(), fractionCompletedKeyPath);
    setFraction(1);
    EXPECT_EQ(observer().calls.size(), 3U);
}

TEST_F(DeviceProgressTest, AnObserverIsHeldWeakly) {
    observe(fractionCompletedKeyPath);
    const std::weak_ptr<test::ProgressObserver> gone = observerItself();

    observerItself().reset();

    EXPECT_TRUE(gone.expired());
    setFraction(0.5);
    EXPECT_EQ(progress().fractionCompleted(), 0.5);
}

TEST_F(DeviceProgressTest, AnObserverMayRemoveItselfAndOthersWhileItIsTold) {
    const auto other = std::make_shared<test::ProgressObserver>();
    observe(fractionCompletedKeyPath);
    progress().addObserver(other, {.forKeyPath = fractionCompletedKeyPath});
    observer().then = [&](KeyValueObservable& observed) {
        observed.removeObserverForKeyPath(*other, fractionCompletedKeyPath);
        observed.removeObserverForKeyPath(observer(), fractionCompletedKeyPath);
    };

    setFraction(0.5);
    setFraction(0.75);

    EXPECT_EQ(observer().calls, (Calls{"fractionCompleted 50%"}));
    EXPECT_TRUE(other->calls.empty());
}

TEST_F(DeviceProgressTest, AnObserverMayRemoveItselfWithinItsRegistration) {
    observer().then = [&](KeyValueObservable& observed) {
        observed.removeObserverForKeyPath(observer(), fractionCompletedKeyPath);
    };

    observe(fractionCompletedKeyPath, KeyValueObservingOptions::initial);
    setFraction(0.5);

    EXPECT_EQ(observer().calls, (Calls{"fractionCompleted 25%!"}));
}

TEST_F(DeviceProgressTest, AnObserverThatIsAddedWhileOthersAreToldHearsOfTheNextChange) {
    const auto other = std::make_shared<test::ProgressObserver>();
    observe(fractionCompletedKeyPath);
    observer().then = [&](KeyValueObservable& observed) {
        observer().then = nullptr;
        for (int count = 0; count < 100; ++count) {
            observed.addObserver(other, {.forKeyPath = fractionCompletedKeyPath});
        }
    };

    setFraction(0.5);
    EXPECT_TRUE(other->calls.empty());

    setFraction(0.75);
    EXPECT_EQ(other->calls.size(), 100U);
}

} // namespace
} // namespace nimbra::device
