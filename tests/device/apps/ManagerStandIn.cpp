#include "tests/device/apps/ManagerStandIn.h"

#include <algorithm>
#include <csignal>
#include <fnmatch.h>
#include <sdbus-c++/sdbus-c++.h>
#include <unistd.h>

namespace nimbra::test {

namespace {

constexpr const char* managerInterface = "org.freedesktop.systemd1.Manager";
constexpr const char* managerPath = "/org/freedesktop/systemd1";

using Strings = std::vector<std::string>;
using ListedUnit =
    sdbus::Struct<std::string, std::string, std::string, std::string, std::string, std::string,
                  sdbus::ObjectPath, std::uint32_t, std::string, sdbus::ObjectPath>;

/// The object of a unit, by the rule of systemd: what is no letter or digit as "_xx".
sdbus::ObjectPath pathOf(const std::string& unit) {
    constexpr const char* digits = "0123456789abcdef";
    std::string path = std::string(managerPath) + "/unit/";
    for (const char character : unit) {
        const auto byte = static_cast<unsigned char>(character);
        if (std::isalnum(byte) != 0) {
            path += character;
        } else {
            path += {'_', digits[byte / 16], digits[byte % 16]};
        }
    }
    return sdbus::ObjectPath(path);
}

bool matchesAny(const Strings& patterns, const std::string& name) {
    return std::ranges::any_of(patterns, [&name](const std::string& pattern) {
        return ::fnmatch(pattern.c_str(), name.c_str(), FNM_NOESCAPE) == 0;
    });
}

sdbus::Error noSuchUnit() {
    return sdbus::Error("org.freedesktop.systemd1.NoSuchUnit", "not loaded");
}

} // namespace

ManagerStandIn::ManagerStandIn()
    : _connection(sdbus::createSessionBusConnection("org.freedesktop.systemd1")),
      _object(sdbus::createObject(*_connection, managerPath)) {
    registerOperations();
    _thread = std::thread([this] {
        try {
            _connection->enterEventLoop();
        } catch (const sdbus::Error&) {
            // The bus has gone: nobody can ask for anything more.
            return;
        }
    });
}

ManagerStandIn::~ManagerStandIn() {
    leave();
}

void ManagerStandIn::registerOperations() {
    _object->registerMethod("ListUnitsByPatterns")
        .onInterface(managerInterface)
        .implementedAs([this](const Strings& states, const Strings& patterns) {
            const std::scoped_lock lock(_mutex);
            answer("ListUnitsByPatterns");
            std::vector<ListedUnit> listed;
            for (const auto& [name, unit] : _units) {
                if (matchesAny(patterns, name) && std::ranges::count(states, unit.state) > 0) {
                    listed.emplace_back(name, "A unit", "loaded", unit.state, "running", "",
                                        pathOf(name), 0U, "", sdbus::ObjectPath("/"));
                }
            }
            return listed;
        });
    _object->registerMethod("GetUnitByPID")
        .onInterface(managerInterface)
        .implementedAs([this](std::uint32_t process) {
            const std::scoped_lock lock(_mutex);
            answer("GetUnitByPID");
            if (_own.empty() || process != static_cast<std::uint32_t>(::getpid())) {
                throw sdbus::Error("org.freedesktop.systemd1.NoUnitForPID", "not ours");
            }
            return pathOf(_own);
        });
    _object->registerMethod("Subscribe").onInterface(managerInterface).implementedAs([this] {
        const std::scoped_lock lock(_mutex);
        _isObserved = true;
    });
    _object->registerMethod("KillUnit")
        .onInterface(managerInterface)
        .implementedAs(
            [this](const std::string& unit, const std::string& who, std::int32_t signal) {
                if (who != "all") {
                    throw sdbus::Error("org.freedesktop.DBus.Error.InvalidArgs", who);
                }
                kill(unit, signal);
            });
    _object->registerSignal("UnitRemoved")
        .onInterface(managerInterface)
        .withParameters<std::string, sdbus::ObjectPath>();
    _object->finishRegistration();
}

void ManagerStandIn::answer(const std::string& operation) {
    ++_calls[operation];
    _called.notify_all();
    if (const auto refusal = _refusals.find(operation); refusal != _refusals.end()) {
        throw sdbus::Error(refusal->second, "refused");
    }
}

void ManagerStandIn::registerUnit(const std::string& unit) {
    auto& object = _unitObjects[unit];
    if (object) {
        return;
    }
    object = sdbus::createObject(*_connection, pathOf(unit));
    object->registerProperty("InvocationID")
        .onInterface("org.freedesktop.systemd1.Unit")
        .withGetter([this, unit] {
            const std::scoped_lock lock(_mutex);
            const auto found = _units.find(unit);
            if (found == _units.end()) {
                throw noSuchUnit();
            }
            constexpr std::size_t length = 16;
            return std::vector<std::uint8_t>(length, found->second.invocation);
        });
    object->finishRegistration();
}

void ManagerStandIn::start(const std::string& unit, Manner manner) {
    registerUnit(unit);
    const std::scoped_lock lock(_mutex);
    _units[unit] = {.state = "active", .manner = manner, .invocation = ++_invocations};
}

void ManagerStandIn::holdThisProcess(const std::string& unit) {
    const std::scoped_lock lock(_mutex);
    _own = unit;
}

void ManagerStandIn::end(const std::string& unit) {
    if (change([&] { _units.erase(unit); })) {
        tellRemoved(unit);
    }
}

void ManagerStandIn::fail(const std::string& unit) {
    if (!change([&] { _units.at(unit).state = "failed"; })) {
        return;
    }
    const auto object = sdbus::createObject(*_connection, pathOf(unit));
    auto signal = object->createSignal("org.freedesktop.DBus.Properties", "PropertiesChanged");
    const std::map<std::string, sdbus::Variant> changed{{"ActiveState", sdbus::Variant("failed")}};
    signal << "org.freedesktop.systemd1.Unit" << changed << Strings();
    object->emitSignal(signal);
}

void ManagerStandIn::refuse(const std::string& operation, const std::string& name) {
    const std::scoped_lock lock(_mutex);
    _refusals[operation] = name;
}

void ManagerStandIn::leave() {
    if (_object) {
        _connection->leaveEventLoop();
        _thread.join();
        _unitObjects.clear();
        _object.reset();
        _connection.reset();
    }
}

void ManagerStandIn::awaitLists(int count) {
    std::unique_lock lock(_mutex);
    _called.wait(lock, [this, count] { return _calls["ListUnitsByPatterns"] >= count; });
}

int ManagerStandIn::calls(const std::string& operation) {
    const std::scoped_lock lock(_mutex);
    return _calls[operation];
}

std::vector<std::string> ManagerStandIn::sent() {
    const std::scoped_lock lock(_mutex);
    return _sent;
}

void ManagerStandIn::kill(const std::string& name, std::int32_t signal) {
    const std::scoped_lock lock(_mutex);
    const auto unit = _units.find(name);
    if (unit == _units.end() || unit->second.manner == Manner::refuses) {
        throw noSuchUnit();
    }
    _sent.push_back(name + (signal == SIGTERM   ? " TERM"
                            : signal == SIGKILL ? " KILL"
                                                : " another signal"));
    if (signal == SIGKILL || unit->second.manner == Manner::listens) {
        _units.erase(unit);
        if (_isObserved) {
            tellRemoved(name);
        }
    }
}

bool ManagerStandIn::change(const std::function<void()>& change) {
    const std::scoped_lock lock(_mutex);
    change();
    return _isObserved;
}

void ManagerStandIn::tellRemoved(const std::string& unit) {
    _object->emitSignal("UnitRemoved")
        .onInterface(managerInterface)
        .withArguments(unit, pathOf(unit));
}

} // namespace nimbra::test
