#pragma once

#include "platform/documents/LastSync.h"

#include <functional>
#include <string>
#include <vector>

namespace nimbra::test {

/// Answers that a test gives; notes in `calls` each sentence that is asked for.
class FakeLastSync final : public LastSync {
public:
    explicit FakeLastSync(std::vector<std::string>& calls) : _calls(calls) {}

    [[nodiscard]] std::expected<std::optional<Date>, Error>
    MRGetLastSyncDateWithError() const override {
        return date;
    }
    [[nodiscard]] std::expected<Text, Error> MRGetLocalizedLastSyncWithError() const override {
        _calls.emplace_back("sentence");
        if (whenAsked) {
            whenAsked();
        }
        return sentence;
    }

    std::expected<std::optional<Date>, Error> date;
    std::expected<Text, Error> sentence;
    /// Called where the sentence is asked for, to see how things stand at that moment.
    std::function<void()> whenAsked;

private:
    std::vector<std::string>& _calls;
};

} // namespace nimbra::test
