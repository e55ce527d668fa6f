#include "bench/window/ManyRows.h"

#include "bench/window/BenchWindow.h"
#include "bench/window/Median.h"
#include "bench/window/MeteredApplication.h"
#include "bench/window/TimedRows.h"
#include "host/core/PaneSession.h"

#include <algorithm>
#include <iomanip>
#include <iostream>
#include <iterator>
#include <stdexcept>
#include <vector>

namespace nimbra::bench {

namespace {

constexpr std::size_t kFew = 100;
constexpr std::size_t kMany = 10'000;

void measureOpening(BenchWindow& few, BenchWindow& many) {
    constexpr int times = 9;
    std::vector<double> ofFew;
    std::vector<double> ofMany;
    for (int time = 0; time < times; ++time) {
        ofFew.push_back(few.openPane());
        few.closePane();
        ofMany.push_back(many.openPane());
        many.closePane();
    }
    const double fewTime = median(std::move(ofFew));
    const double manyTime = median(std::move(ofMany));
    std::cout << "OpeningManyRows: ratio " << std::setprecision(2) << manyTime / fewTime
              << std::setprecision(1) << "\n  " << manyTime << " ms: a pane with " << kMany
              << " applications, from its built list to its first frame\n  " << fewTime
              << " ms: with " << kFew << '\n';
}

void measureScrolling(BenchWindow& window, MeteredApplication& application) {
    static_cast<void>(window.openPane());
    QQuickItem& list = window.list();
    std::vector<double> frames;
    while (!list.property("atYEnd").toBool()) {
        const double end = list.property("originY").toDouble() +
                           list.property("contentHeight").toDouble() +
                           list.property("bottomMargin").toDouble() - list.height();
        const double next = std::min(list.property("contentY").toDouble() + list.height(), end);
        static_cast<void>(application.takeFrames());
        // The rows that come are made at once, the rest with the frame.
        const Stopwatch moving;
        list.setProperty("contentY", next);
        const double moved = moving.milliseconds();
        window.paint();
        frames.push_back(moved + std::ranges::max(application.takeFrames()));
    }
    window.closePane();
    const double usual = median(frames);
    const double worst = std::ranges::max(frames);
    std::cout << "ScrollingManyRows: ratio " << std::setprecision(2) << worst / usual
              << std::setprecision(1) << "\n  " << worst << " ms: the longest of " << frames.size()
              << " frames from end to end, a window's height each\n  " << usual
              << " ms: the frame in the middle\n";
}

/// What a flip of the switch over all applications costs.
struct Flip {
    double pane = 0;
    double window = 0;
};

Flip flip(BenchWindow& window, MeteredApplication& application, TimedRows& rows, bool isOn) {
    // Longer than anything that comes or goes.
    constexpr double calm = 500;
    constexpr double tooLong = 10'000;
    window::ShownRows& shown = *window.host().pane().rows();
    const int count = shown.rowCount();
    const double before = rows.milliseconds();
    static_cast<void>(application.takeFrames());
    const Stopwatch stopwatch;
    shown.set(shown.indexOf(QStringLiteral("Nimbra Drive")), isOn);
    while (shown.rowCount() == count || !window.host().session().isSettled()) {
        if (stopwatch.milliseconds() > tooLong) {
            throw std::runtime_error("the flip changes no rows");
        }
        window.paint();
    }
    const double all = stopwatch.milliseconds();
    std::vector<double> frames = application.takeFrames();
    double painting = 0;
    for (const double frame : frames) {
        painting += frame;
    }
    const double told = rows.milliseconds() - before;
    for (const Stopwatch moving; moving.milliseconds() < calm;) {
        window.paint();
    }
    std::ranges::copy(application.takeFrames(), std::back_inserter(frames));
    return {.pane = all - painting - told, .window = told + std::ranges::max(frames)};
}

void measureFlips(BenchWindow& window, MeteredApplication& application) {
    constexpr int times = 5;
    static_cast<void>(window.openPane());
    auto& model = window.host().pane().rows()->rows();
    TimedRows rows(model);
    window.host().session().setListObserver(&rows);
    std::vector<Flip> flips;
    for (int time = 0; time < times; ++time) {
        flips.push_back(flip(window, application, rows, false));
        flips.push_back(flip(window, application, rows, true));
    }
    const Flip longest = std::ranges::max(flips, {}, &Flip::window);
    std::cout << "FlippingManyRows: ratio " << std::setprecision(2)
              << (longest.pane + longest.window) / longest.pane << std::setprecision(1) << "\n  "
              << longest.window << " ms: the window takes in the batch of " << kMany
              << " rows and paints the longest frame\n  " << longest.pane
              << " ms: the pane's own work until it has settled\n";
    window.host().session().setListObserver(&model);
    window.closePane();
}

} // namespace

void measureManyRows(MeteredApplication& application) {
    BenchWindow few(kFew);
    BenchWindow many(kMany);
    std::cout << std::fixed;
    measureOpening(few, many);
    measureScrolling(many, application);
    measureFlips(many, application);
}

} // namespace nimbra::bench
