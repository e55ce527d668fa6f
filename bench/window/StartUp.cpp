#include "bench/window/StartUp.h"

#include "bench/window/Median.h"
#include "host/core/DeviceLocation.h"
#include "host/core/scenario/TemporaryDirectory.h"

#include <array>
#include <chrono>
#include <cstdlib>
#include <iomanip>
#include <iostream>
#include <spawn.h>
#include <stdexcept>
#include <string>
#include <sys/wait.h>
#include <unistd.h>
#include <vector>

namespace nimbra::bench {

namespace {

constexpr int kPairs = 15;

struct Start {
    double milliseconds = 0;
    double megabytes = 0;
};

/// The line that the program writes when it has painted; empty where it ends without one.
std::string firstLineOf(int descriptor) {
    std::string line;
    for (char character = 0; ::read(descriptor, &character, 1) == 1 && character != '\n';) {
        line += character;
    }
    return line;
}

Start start(std::vector<std::string> command) {
    std::vector<char*> words;
    for (std::string& word : command) {
        words.push_back(word.data());
    }
    words.push_back(nullptr);
    std::array<int, 2> pipe{};
    if (::pipe(pipe.data()) != 0) {
        throw std::runtime_error("no pipe can be made");
    }
    posix_spawn_file_actions_t actions;
    ::posix_spawn_file_actions_init(&actions);
    ::posix_spawn_file_actions_adddup2(&actions, pipe[1], STDOUT_FILENO);
    ::posix_spawn_file_actions_addclose(&actions, pipe[0]);
    ::posix_spawn_file_actions_addclose(&actions, pipe[1]);

    const auto began = std::chrono::steady_clock::now();
    pid_t child = 0;
    const int spawned =
        ::posix_spawn(&child, words.front(), &actions, nullptr, words.data(), environ);
    ::posix_spawn_file_actions_destroy(&actions);
    ::close(pipe[1]);
    const std::string line = spawned == 0 ? firstLineOf(pipe[0]) : std::string();
    const std::chrono::duration<double, std::milli> taken =
        std::chrono::steady_clock::now() - began;
    ::close(pipe[0]);
    int status = 0;
    if (spawned != 0 || ::waitpid(child, &status, 0) != child || status != 0 || line.empty()) {
        throw std::runtime_error(command.front() + ": shows no window");
    }
    return {.milliseconds = taken.count(), .megabytes = std::stod(line) / 1024};
}

double medianOf(const std::vector<Start>& starts, double Start::* figure) {
    std::vector<double> figures;
    for (const Start& start : starts) {
        figures.push_back(start.*figure);
    }
    return median(std::move(figures));
}

} // namespace

void measureStartUp() {
    const auto directory = host::TemporaryDirectory::make();
    if (!directory) {
        throw std::runtime_error(directory.error().line());
    }
    const std::string device = directory->path() / "device";
    if (const auto provided = host::provideDevice(device); !provided) {
        throw std::runtime_error(provided.error().line());
    }
    const std::vector<std::string> emptyWindow{NIMBRA_EMPTY_WINDOW};
    const std::vector<std::string> paneWindow{
        NIMBRA_PANE_WINDOW, "--root", device, "--bundle", NIMBRA_BUNDLE, "--row", "Nimbra Drive"};
    // The files of both are in the machine's memory then.
    static_cast<void>(start(emptyWindow));
    static_cast<void>(start(paneWindow));
    std::vector<Start> empty;
    std::vector<Start> pane;
    for (int pair = 0; pair < kPairs; ++pair) {
        empty.push_back(start(emptyWindow));
        pane.push_back(start(paneWindow));
    }
    const double emptyTime = medianOf(empty, &Start::milliseconds);
    const double paneTime = medianOf(pane, &Start::milliseconds);
    const double emptyMemory = medianOf(empty, &Start::megabytes);
    const double paneMemory = medianOf(pane, &Start::megabytes);
    std::cout << std::fixed << std::setprecision(2) << "StartUp: ratio " << paneTime / emptyTime
              << " in time, " << paneMemory / emptyMemory << " in memory\n"
              << std::setprecision(0) << "  " << paneTime << " ms, " << paneMemory
              << " MB: from nothing to the first frame with the open pane\n  " << emptyTime
              << " ms, " << emptyMemory << " MB: to that of an empty window\n";
}

} // namespace nimbra::bench
