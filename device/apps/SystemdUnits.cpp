#include "device/apps/SystemdUnits.h"

#include "device/apps/UnitNames.h"

#include <algorithm>
#include <csignal>
#include <cstdint>
#include <optional>
#include <poll.h>
#include <sdbus-c++/sdbus-c++.h>
#include <set>
#include <string>
#include <unistd.h>
#include <utility>
#include <vector>

namespace nimbra::device {

namespace {

using Clock = std::chrono::steady_clock;

constexpr const char* service = "org.freedesktop.systemd1";
constexpr const char* path = "/org/freedesktop/systemd1";
constexpr const char* managerInterface = "org.freedesktop.systemd1.Manager";

/// A unit as the manager lists it: name, description, states, the unit that it follows, its object,
/// and its job.
using ListedUnit =
    sdbus::Struct<std::string, std::string, std::string, std::string, std::string, std::string,
                  sdbus::ObjectPath, std::uint32_t, std::string, sdbus::ObjectPath>;

/// One run of a unit: the next one under the same name is another.
struct RunningUnit {
    std::string name;
    std::vector<std::uint8_t> invocation;

    friend bool operator==(const RunningUnit&, const RunningUnit&) = default;
};

/// Whether the manager or the bus has gone: nothing can be done to a unit any more.
bool isGone(const sdbus::Error& error) {
    static const std::set<std::string, std::less<>> names{
        "org.freedesktop.DBus.Error.ServiceUnknown", "org.freedesktop.DBus.Error.Disconnected",
        "System.Error.ENOTCONN", "System.Error.EPIPE", "System.Error.ESHUTDOWN"};
    return names.contains(error.getName());
}

/// The user's manager over a connection of its own; its operations throw what the library throws.
class Manager {
public:
    Manager()
        : _connection(sdbus::createSessionBusConnection()),
          _proxy(sdbus::createProxy(*_connection, service, path)) {
        // Nobody waits longer for an answer of a manager that hangs.
        constexpr std::chrono::seconds longestCall(5);
        _connection->setMethodCallTimeout(
            static_cast<std::uint64_t>(std::chrono::microseconds(longestCall).count()));
    }
    Manager(const Manager&) = delete;
    Manager& operator=(const Manager&) = delete;
    ~Manager() = default;

    /// The units that run `application`, but not of the one that holds this process.
    [[nodiscard]] std::vector<RunningUnit> unitsOf(const std::string& application) const {
        std::vector<ListedUnit> listed;
        const std::vector<std::string> states{"active", "activating", "reloading", "deactivating"};
        const std::vector<std::string> patterns{"app-*.scope", "app-*.service"};
        _proxy->callMethod("ListUnitsByPatterns")
            .onInterface(managerInterface)
            .withArguments(states, patterns)
            .storeResultsTo(listed);
        std::erase_if(listed, [&application](const ListedUnit& unit) {
            return !isUnitOfApplication(unit.get<0>(), application);
        });
        std::vector<RunningUnit> units;
        if (listed.empty()) {
            return units;
        }
        const auto own = ownUnit();
        for (const ListedUnit& unit : listed) {
            if (unit.get<6>() == own) {
                continue;
            }
            if (auto invocation = invocationOf(unit.get<6>())) {
                units.push_back({.name = unit.get<0>(), .invocation = std::move(*invocation)});
            }
        }
        return units;
    }

    /// From now on a change of a unit ends `awaitChange`.
    void observe() {
        const auto change = [this](sdbus::Message& /*message*/) { _hasChanged = true; };
        const std::string sent = std::string("type='signal',sender='") + service + "',";
        _connection->addMatch(sent + "interface='" + managerInterface + "',member='UnitRemoved'",
                              change, sdbus::floating_slot);
        _connection->addMatch(sent + "interface='org.freedesktop.DBus.Properties'," +
                                  "member='PropertiesChanged',path_namespace='" + path + "/unit'",
                              change, sdbus::floating_slot);
        _proxy->callMethod("Subscribe").onInterface(managerInterface);
    }

    /// Waits until a unit has changed since the last call, at most until `latest`; whether one has.
    [[nodiscard]] bool awaitChange(Clock::time_point latest) {
        while (true) {
            while (_connection->processPendingRequest()) {
            }
            if (std::exchange(_hasChanged, false)) {
                return true;
            }
            const auto left = std::chrono::ceil<std::chrono::milliseconds>(latest - Clock::now());
            if (left.count() <= 0) {
                return false;
            }
            const auto events = _connection->getEventLoopPollData();
            pollfd descriptor{.fd = events.fd, .events = events.events, .revents = 0};
            static_cast<void>(::poll(&descriptor, 1, static_cast<int>(left.count())));
        }
    }

    /// Sends `signal` to every process of `unit`.
    void kill(const std::string& unit, int signal) const {
        _proxy->callMethod("KillUnit")
            .onInterface(managerInterface)
            .withArguments(unit, std::string("all"), std::int32_t(signal));
    }

private:
    /// Nothing where the unit has gone meanwhile.
    [[nodiscard]] std::optional<std::vector<std::uint8_t>>
    invocationOf(const sdbus::ObjectPath& unit) const {
        try {
            return sdbus::createProxy(*_connection, service, unit)
                ->getProperty("InvocationID")
                .onInterface("org.freedesktop.systemd1.Unit")
                .get<std::vector<std::uint8_t>>();
        } catch (const sdbus::Error& error) {
            if (error.getName() != "org.freedesktop.DBus.Error.UnknownObject" &&
                error.getName() != "org.freedesktop.systemd1.NoSuchUnit") {
                throw;
            }
            return std::nullopt;
        }
    }

    /// The unit that holds this process; nothing where it is in none of the manager's.
    [[nodiscard]] std::optional<sdbus::ObjectPath> ownUnit() const {
        try {
            sdbus::ObjectPath own;
            _proxy->callMethod("GetUnitByPID")
                .onInterface(managerInterface)
                .withArguments(static_cast<std::uint32_t>(::getpid()))
                .storeResultsTo(own);
            return own;
        } catch (const sdbus::Error& error) {
            // Without an answer every unit may be the one.
            if (error.getName() != "org.freedesktop.systemd1.NoUnitForPID") {
                throw;
            }
            return std::nullopt;
        }
    }

    std::unique_ptr<sdbus::IConnection> _connection;
    std::unique_ptr<sdbus::IProxy> _proxy;
    bool _hasChanged = false;
};

/// The units of one application that have been asked to end. Those that it starts in meanwhile are
/// none of them.
class EndingUnits final : public EndingApplication {
public:
    EndingUnits(std::string application, std::unique_ptr<Manager> manager,
                std::vector<RunningUnit> units)
        : _application(std::move(application)), _manager(std::move(manager)),
          _units(std::move(units)) {}

    /// Whether any of them was there to get `signal`.
    bool send(int signal) {
        bool isSent = false;
        for (const RunningUnit& unit : _units) {
            try {
                _manager->kill(unit.name, signal);
                isSent = true;
            } catch (const sdbus::Error&) {
                // It has ended meanwhile; the others get it all the same.
                continue;
            }
        }
        return isSent;
    }

    [[nodiscard]] bool awaitEnd(std::chrono::milliseconds longest) override {
        const auto latest = Clock::now() + longest;
        try {
            while (isAnyRunning()) {
                if (!_manager->awaitChange(latest)) {
                    return false;
                }
            }
        } catch (const sdbus::Error& error) {
            return isGone(error);
        }
        return true;
    }

    void kill() override {
        try {
            // A unit that was started anew meanwhile was not asked to end.
            if (isAnyRunning()) {
                send(SIGKILL);
            }
        } catch (const sdbus::Error&) {
            // The manager has gone, and with it every way to a unit.
            return;
        }
    }

private:
    [[nodiscard]] bool isAnyRunning() {
        try {
            const auto running = _manager->unitsOf(_application);
            std::erase_if(_units, [&running](const RunningUnit& unit) {
                return std::ranges::find(running, unit) == running.end();
            });
        } catch (const sdbus::Error& error) {
            if (isGone(error)) {
                throw;
            }
            // Nothing is known to have ended.
        }
        return !_units.empty();
    }

    std::string _application;
    std::unique_ptr<Manager> _manager;
    std::vector<RunningUnit> _units;
};

} // namespace

std::unique_ptr<EndingApplication> SystemdUnits::askToEnd(const BundleIdentifier& application) {
    constexpr std::chrono::minutes pause(1);
    if (_failed && Clock::now() < *_failed + pause) {
        return nullptr;
    }
    std::unique_ptr<Manager> manager;
    try {
        manager = std::make_unique<Manager>();
    } catch (const sdbus::Error&) {
        _failed = Clock::now();
        return nullptr;
    }
    try {
        auto units = manager->unitsOf(application.string());
        if (units.empty()) {
            return nullptr;
        }
        manager->observe();
        auto ending = std::make_unique<EndingUnits>(application.string(), std::move(manager),
                                                    std::move(units));
        return ending->send(SIGTERM) ? std::move(ending) : nullptr;
    } catch (const sdbus::Error&) {
        return nullptr;
    }
}

} // namespace nimbra::device
