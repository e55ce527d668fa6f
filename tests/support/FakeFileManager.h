#pragma once

#include "platform/system/FileManager.h"

#include <deque>
#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace nimbra::test {

/// Notes what is done to files, and fails when a test says so.
class FakeFileManager final : public FileManager {
public:
    explicit FakeFileManager(std::vector<std::string>& calls) : _calls(calls) {}

    [[nodiscard]] Text SystemRootDirectory() const override { return root; }
    [[nodiscard]] Text tidewaterIdentityToken() override { return identity; }

    [[nodiscard]] std::expected<void, Error> removeItemAtPath(const std::string& path) override {
        _calls.push_back("remove " + path);
        return outcome(removeOutcomes);
    }
    [[nodiscard]] std::expected<void, Error>
    createDirectoryAtPathWithIntermediateDirectoriesAttributes(
        const std::string& path, bool createsIntermediates,
        const FileAttributes& attributes) override {
        std::string call = "create " + path;
        if (createsIntermediates) {
            call += " and those above";
        }
        if (attributes.posixPermissions) {
            call += " for " + std::to_string(*attributes.posixPermissions);
        }
        _calls.push_back(call);
        return outcome(createOutcomes);
    }
    [[nodiscard]] bool isResourceReachable(const FileURL& url) override {
        _calls.push_back("reach " + url.path());
        return isReachable;
    }
    [[nodiscard]] std::optional<std::string> fileSystemRepresentation(const FileURL& url) override {
        return hasRepresentation ? std::optional(machineRoot + url.path()) : std::nullopt;
    }

    Text root{"/"};
    Text identity{"token"};
    /// Of the next calls, in order; nothing, and the end, is a success.
    std::deque<std::optional<Error>> removeOutcomes;
    std::deque<std::optional<Error>> createOutcomes;
    bool isReachable = true;
    bool hasRepresentation = true;
    /// What the machine calls the device's root.
    std::string machineRoot = "/device";

private:
    static std::expected<void, Error> outcome(std::deque<std::optional<Error>>& outcomes) {
        if (outcomes.empty()) {
            return {};
        }
        const std::optional<Error> next = outcomes.front();
        outcomes.pop_front();
        return next ? std::expected<void, Error>(std::unexpect, *next)
                    : std::expected<void, Error>();
    }

    std::vector<std::string>& _calls;
};

} // namespace nimbra::test
