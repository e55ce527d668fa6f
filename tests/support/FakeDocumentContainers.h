#pragma once

#include "platform/documents/DocumentContainers.h"

#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace nimbra::test {

/// The containers that a test lists, and a record of what was asked of them.
class FakeDocumentContainers final : public DocumentContainers {
public:
    struct Listed {
        std::string identifier;
        bool isPublic = true;
        bool registrationFails = false;
    };

    [[nodiscard]] std::vector<std::shared_ptr<DocumentContainer>> allContainers() override {
        ++enumerations;
        if (onEnumeration) {
            onEnumeration();
        }
        std::vector<std::shared_ptr<DocumentContainer>> containers;
        for (const Listed& container : listed) {
            containers.push_back(std::make_shared<Container>(*this, container));
        }
        return containers;
    }
    void forceRefreshAllContainersWithCompletion(std::function<void()> completion) override {
        refreshes.push_back(std::move(completion));
    }
    void unregisterCurrentProcessAsPriorityHint() override { calls.emplace_back("unregister"); }

    std::vector<Listed> listed;
    /// "register IDENTIFIER" and "unregister", in order.
    std::vector<std::string> calls;
    int enumerations = 0;
    /// What happens elsewhere while the containers are enumerated.
    std::function<void()> onEnumeration;
    /// The completions of the refreshes asked for, for the test to call.
    std::vector<std::function<void()>> refreshes;

private:
    class Container final : public DocumentContainer {
    public:
        Container(FakeDocumentContainers& owner, Listed listed)
            : _owner(owner), _listed(std::move(listed)) {}

        [[nodiscard]] bool isDocumentScopePublic() const override { return _listed.isPublic; }
        [[nodiscard]] std::expected<void, Error>
        registerCurrentProcessAsPriorityHintWithError() override {
            _owner.calls.push_back("register " + _listed.identifier);
            if (_listed.registrationFails) {
                return std::unexpected(Error{"test", 1, "the daemon refuses"});
            }
            return {};
        }

    private:
        FakeDocumentContainers& _owner;
        Listed _listed;
    };
};

} // namespace nimbra::test
