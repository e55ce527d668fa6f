#include "platform/accounts/AccountStore.h"
#include "platform/host/AccountSettingsPane.h"
#include "platform/system/ClassRegistry.h"
#include "platform/system/WorkQueues.h"

#include <memory>

namespace nimbra::test {

namespace {

/// A page with a row of every kind and in every state, to be driven from outside.
class RowsPane final : public AccountSettingsPane {
public:
    using AccountSettingsPane::AccountSettingsPane;

    const SpecifierArray& specifiers() override {
        if (!_specifiers) {
            build();
        }
        return *_specifiers;
    }

private:
    void build() {
        const auto group = Specifier::groupSpecifierWithID("Group");
        group->setPropertyForKey(Text("What the group is about."), FooterTextGroupKey);
        _notes = identified("com.example.notes", notes());
        const auto locked = identified(
            "com.example.locked",
            row("Locked", {.set = [](const RowValue&, const std::shared_ptr<Specifier>&) {},
                           .get = [](const Specifier&) { return RowValue(false); },
                           .cell = SwitchCell}));
        locked->setPropertyForKey(false, EnabledKey);

        _specifiers = {group,
                       _notes,
                       locked,
                       identified("twin.one", row("Twin", {.cell = LinkListCell})),
                       identified("twin.two", row("Twin", {.cell = LinkListCell})),
                       row("Storage", {.get = [](const Specifier&) { return Text("3 apps"); },
                                       .cell = LinkListCell}),
                       Specifier::groupSpecifierWithID("Buttons"),
                       button("Later", [this] { appendLater(); }),
                       button("Reload Parent", [this] { parentController()->reloadSpecifiers(); }),
                       button("Leave", [this] { dismissAnimated(true); }),
                       row("Nothing Behind", {.cell = ButtonCell})};
    }

    /// A switch that writes to the account and brings a row of its own.
    std::shared_ptr<Specifier> notes() {
        return row("Notes", {.set =
                                 [this](const RowValue& value, const std::shared_ptr<Specifier>&) {
                                     setNotes(boolValue(value));
                                 },
                             .get = [this](const Specifier&) { return RowValue(_notesAreOn); },
                             .cell = SwitchCell});
    }

    void setNotes(bool isOn) {
        const auto account = accountStore().accountWithIdentifier(AccountIdentifier("primary"));
        account->setEnabledForDataclass(isOn, Dataclass("kAccountDataclassNotes"));
        _notesAreOn = isOn;
        beginUpdates();
        if (isOn) {
            _details = row("Details", {.cell = LinkListCell});
            insertSpecifierAfterSpecifierAnimated(_details, _notes, true);
        } else {
            removeSpecifierAnimated(_details, true);
        }
        endUpdates();
        reloadSpecifierAnimated(_notes, false);
    }

    /// Brings a row when work on another queue has ended.
    void appendLater() {
        _queue = services().workQueues->serialQueueWithLabel("later");
        _queue->async([this, pane = shared_from_this()] {
            services().workQueues->mainQueue().async([this, pane] {
                addSpecifiersFromArrayAnimated({row("Arrived", {.cell = LinkListCell})}, true);
            });
        });
    }

    std::shared_ptr<Specifier> button(const char* name, const std::function<void()>& action) {
        auto specifier = row(name, {.cell = ButtonCell});
        specifier->setButtonAction([action](const std::shared_ptr<Specifier>&) { action(); });
        return specifier;
    }

    std::shared_ptr<Specifier> row(const char* name, Specifier::Row description) {
        description.target = this;
        return Specifier::preferenceSpecifierNamed(name, std::move(description));
    }

    static std::shared_ptr<Specifier> identified(const char* identifier,
                                                 std::shared_ptr<Specifier> specifier) {
        specifier->setIdentifier(identifier);
        return specifier;
    }

    std::shared_ptr<Specifier> _notes;
    std::shared_ptr<Specifier> _details;
    std::shared_ptr<WorkQueue> _queue;
    bool _notesAreOn = false;
};

} // namespace

} // namespace nimbra::test

extern "C" nimbra::BundleEntryPoint NimbraBundleRegisterClasses;

bool NimbraBundleRegisterClasses(nimbra::ClassRegistry& classes) {
    return classes.registerClass(
        {.name = "RowsPane", .create = [](const nimbra::PlatformServices& services) {
             return std::make_shared<nimbra::test::RowsPane>(services);
         }});
}
