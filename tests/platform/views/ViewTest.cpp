#include "platform/views/View.h"

#include "platform/system/Syslog.h"
#include "platform/views/Window.h"
#include "tests/support/TestPlatform.h"

#include <cmath>
#include <gtest/gtest.h>
#include <string>
#include <syslog.h>
#include <utility>
#include <vector>

namespace nimbra {
namespace {

struct Move {
    std::string view;
    Window* from;
    Window* to;

    friend bool operator==(const Move&, const Move&) = default;
};

class RecordingView final : public View {
public:
    RecordingView(const PlatformServices& services, std::string name, std::vector<Move>& moves)
        : View(services, {}), _name(std::move(name)), _moves(moves) {}

    void willMoveToWindow(Window* window) override {
        _moves.push_back({_name, this->window(), window});
    }
    void layoutSubviews() override {
        ++layouts;
        View::layoutSubviews();
    }

    int layouts = 0;

private:
    std::string _name;
    std::vector<Move>& _moves;
};

struct Observed final : KeyValueObservable {
    void addObserver(const std::shared_ptr<KeyValueObserver>& /*observer*/,
                     const Registration& /*registration*/) override {}
    void removeObserverForKeyPath(const KeyValueObserver& /*observer*/,
                                  const KeyPath& /*keyPath*/) override {}
};

struct ViewTest : testing::Test {
    test::TestPlatform platform;
    Window window;
    Window otherWindow;
    std::vector<Move> moves;

    [[nodiscard]] std::shared_ptr<RecordingView> viewNamed(const std::string& name) {
        return std::make_shared<RecordingView>(platform.services(), name, moves);
    }
};

using ViewDeathTest = ViewTest;

TEST_F(ViewTest, AViewThatMovesIntoAWindowTakesItsTreeAlong) {
    const auto root = viewNamed("root");
    const auto first = viewNamed("first");
    const auto inner = viewNamed("inner");
    const auto second = viewNamed("second");
    root->addSubview(first);
    first->addSubview(inner);
    root->addSubview(second);
    EXPECT_TRUE(moves.empty());

    root->moveToWindow(&window);

    EXPECT_EQ(moves, (std::vector<Move>{{"root", nullptr, &window},
                                        {"first", nullptr, &window},
                                        {"inner", nullptr, &window},
                                        {"second", nullptr, &window}}));
    EXPECT_EQ(inner->window(), &window);
    EXPECT_EQ(second->window(), &window);
}

TEST_F(ViewTest, EveryMoveOfARootIsToldAlsoIntoTheSameWindow) {
    const auto root = viewNamed("root");

    root->moveToWindow(&window);
    root->moveToWindow(&window);
    root->moveToWindow(&otherWindow);
    root->moveToWindow(nullptr);

    EXPECT_EQ(moves, (std::vector<Move>{{"root", nullptr, &window},
                                        {"root", &window, &window},
                                        {"root", &window, &otherWindow},
                                        {"root", &otherWindow, nullptr}}));
    EXPECT_EQ(root->window(), nullptr);
}

TEST_F(ViewTest, ASubviewEntersAndLeavesTheWindowOfItsSuperview) {
    const auto root = viewNamed("root");
    const auto view = viewNamed("view");
    root->moveToWindow(&window);
    moves.clear();

    root->addSubview(view);
    EXPECT_EQ(view->window(), &window);
    EXPECT_EQ(view->superview(), root.get());
    view->removeFromSuperview();

    EXPECT_EQ(view->window(), nullptr);
    EXPECT_EQ(view->superview(), nullptr);
    EXPECT_TRUE(root->subviews().empty());
    EXPECT_EQ(moves, (std::vector<Move>{{"view", nullptr, &window}, {"view", &window, nullptr}}));
}

TEST_F(ViewTest, AMoveWithinAWindowIsNotTold) {
    const auto root = viewNamed("root");
    const auto left = viewNamed("left");
    const auto right = viewNamed("right");
    const auto view = viewNamed("view");
    root->addSubview(left);
    root->addSubview(right);
    left->addSubview(view);
    root->moveToWindow(&window);
    moves.clear();

    right->addSubview(left->subviews().front());

    EXPECT_TRUE(moves.empty());
    EXPECT_TRUE(left->subviews().empty());
    EXPECT_EQ(view->superview(), right.get());
    EXPECT_EQ(view->window(), &window);
}

TEST_F(ViewTest, AViewThatIsAddedAgainComesToTheFront) {
    const auto root = viewNamed("root");
    const auto first = viewNamed("first");
    const auto second = viewNamed("second");
    root->addSubview(first);
    root->addSubview(second);

    root->addSubview(first);

    EXPECT_EQ(root->subviews(), (std::vector<std::shared_ptr<View>>{second, first}));
}

TEST_F(ViewTest, ASubviewOutlivesItsSuperviewAlone) {
    auto root = viewNamed("root");
    const auto view = viewNamed("view");
    root->addSubview(view);
    root->moveToWindow(&window);
    moves.clear();

    root.reset();

    EXPECT_EQ(view->superview(), nullptr);
    EXPECT_EQ(view->window(), nullptr);
    EXPECT_EQ(moves, (std::vector<Move>{{"view", &window, nullptr}}));
    view->removeFromSuperview();
}

TEST_F(ViewDeathTest, AViewIsNeverInsideItself) {
    const auto root = viewNamed("root");
    const auto inner = viewNamed("inner");
    root->addSubview(inner);

    EXPECT_DEATH(root->addSubview(root), "cannot be added to itself");
    EXPECT_DEATH(inner->addSubview(root), "cannot be added to itself or to what is in it");
    EXPECT_DEATH(root->addSubview(nullptr), "no view to be added");
}

TEST_F(ViewTest, OneLayoutPassReachesThoseThatAskForIt) {
    const auto root = viewNamed("root");
    const auto asking = viewNamed("asking");
    const auto resting = viewNamed("resting");
    root->addSubview(asking);
    root->addSubview(resting);
    root->layoutIfNeeded();
    ASSERT_EQ(root->layouts, 1);

    asking->setNeedsLayout();
    root->layoutIfNeeded();

    EXPECT_EQ(root->layouts, 1);
    EXPECT_EQ(asking->layouts, 2);
    EXPECT_EQ(resting->layouts, 1);
    EXPECT_FALSE(asking->needsLayout());
}

TEST_F(ViewTest, OnlyAnotherSizeAsksForALayout) {
    const auto view = viewNamed("view");
    view->setFrame({{1, 2}, {3, 4}});
    view->layoutIfNeeded();

    view->setFrame({{5, 6}, {3, 4}});
    EXPECT_FALSE(view->needsLayout());
    view->setFrame({{5, 6}, {3, 5}});

    EXPECT_TRUE(view->needsLayout());
    EXPECT_EQ(view->frame(), (Rect{{5, 6}, {3, 5}}));
}

TEST_F(ViewTest, ResistanceIsHighAndStaysWithinItsBounds) {
    const auto view = viewNamed("view");
    const auto vertical = LayoutAxis::vertical;
    EXPECT_EQ(view->contentCompressionResistancePriorityForAxis(vertical), 750);

    view->setContentCompressionResistancePriorityForAxis(2000, vertical);
    EXPECT_EQ(view->contentCompressionResistancePriorityForAxis(vertical), 1000);
    view->setContentCompressionResistancePriorityForAxis(NAN, vertical);

    EXPECT_EQ(view->contentCompressionResistancePriorityForAxis(vertical), 0);
    EXPECT_EQ(view->contentCompressionResistancePriorityForAxis(LayoutAxis::horizontal), 750);
}

TEST_F(ViewTest, AChangeThatNobodyObservesIsSaidInOneLine) {
    std::vector<std::pair<int, std::string>> lines;
    auto before = replaceSyslogSink([&lines](int priority, const std::string& message) {
        lines.emplace_back(priority, message);
    });
    Observed object;

    viewNamed("view")->observeValueForKeyPath(KeyPath("fraction"), {.ofObject = object});
    replaceSyslogSink(std::move(before));

    EXPECT_EQ(lines, (std::vector<std::pair<int, std::string>>{
                         {LOG_WARNING, "a view was told of \"fraction\", which it does not "
                                       "observe"}}));
}

TEST_F(ViewTest, AViewThatLeavesTakesTheConstraintsThatSpeakOfItAlong) {
    const auto root = viewNamed("root");
    const auto going = viewNamed("going");
    const auto staying = viewNamed("staying");
    root->addSubview(going);
    root->addSubview(staying);
    const LayoutConstraint width{
        .firstItem = staying.get(), .firstAttribute = LayoutAttribute::width, .constant = 7};
    LayoutConstraint beside = width;
    beside.secondItem = going.get();
    beside.secondAttribute = LayoutAttribute::width;
    root->addConstraints({beside, width});

    going->removeFromSuperview();

    ASSERT_EQ(root->constraints().size(), 1U);
    EXPECT_EQ(root->constraints().front().constant, 7);
}

TEST_F(ViewDeathTest, AConstraintThatDoesNotFitStopsTheProgram) {
    const auto root = viewNamed("root");
    const auto view = viewNamed("view");
    const auto stranger = viewNamed("stranger");
    root->addSubview(view);
    const LayoutConstraint good{.firstItem = view.get(), .firstAttribute = LayoutAttribute::width};
    const auto expectDeath = [&root](const LayoutConstraint& constraint) {
        EXPECT_DEATH(root->addConstraints({constraint}), "does not fit the view");
    };

    LayoutConstraint bad = good;
    bad.firstItem = stranger.get();
    expectDeath(bad);
    bad = good;
    bad.secondItem = root.get();
    expectDeath(bad);
    bad.secondAttribute = LayoutAttribute::height;
    expectDeath(bad);
    bad = good;
    bad.constant = NAN;
    expectDeath(bad);
    bad = good;
    bad.priority = 1001;
    expectDeath(bad);
}

} // namespace
} // namespace nimbra
