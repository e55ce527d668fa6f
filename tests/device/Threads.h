#pragma once

#include <functional>
#include <thread>
#include <vector>

namespace nimbra::test {

/// Runs each of `tasks` on a thread of its own and waits until all have ended.
inline void runAtOnce(const std::vector<std::function<void()>>& tasks) {
    std::vector<std::jthread> threads;
    threads.reserve(tasks.size());
    for (const auto& task : tasks) {
        threads.emplace_back(task);
    }
}

} // namespace nimbra::test
