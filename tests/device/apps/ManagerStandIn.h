#pragma once

#include <condition_variable>
#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace sdbus {
class IConnection;
class IObject;
} // namespace sdbus

namespace nimbra::test {

/// Stands for the user's systemd on the session bus, with units that nothing runs in. Any thread.
class ManagerStandIn {
public:
    /// What a unit does with SIGTERM. SIGKILL ends every one.
    enum class Manner { listens, ignoresTerm, refuses };

    ManagerStandIn();
    ManagerStandIn(const ManagerStandIn&) = delete;
    ManagerStandIn& operator=(const ManagerStandIn&) = delete;
    ~ManagerStandIn();

    void start(const std::string& unit, Manner manner = Manner::listens);
    /// Makes `unit` the one that this process runs in.
    void holdThisProcess(const std::string& unit);
    /// Ends `unit`, which is then forgotten.
    void end(const std::string& unit);
    /// Ends `unit`, which stays known as one that has failed.
    void fail(const std::string& unit);
    /// Answers `operation` with the error `name` from now on.
    void refuse(const std::string& operation, const std::string& name);
    /// Leaves the bus.
    void leave();

    /// Waits until the units have been asked for so many times.
    void awaitLists(int count);
    /// How often `operation` has been called.
    [[nodiscard]] int calls(const std::string& operation);
    /// The signals that were sent, as "UNIT SIGNAL".
    [[nodiscard]] std::vector<std::string> sent();

private:
    struct Unit {
        std::string state;
        Manner manner;
        /// Which of all starts was its own.
        std::uint8_t invocation;
    };

    void registerOperations();
    void registerUnit(const std::string& unit);
    /// Counts a call of `operation`; throws where it is to be refused. With the lock.
    void answer(const std::string& operation);
    void kill(const std::string& name, std::int32_t signal);
    /// Does `change`; whether somebody has asked to be told. The telling comes later, without the
    /// lock: the thread that answers holds the bus while it waits for the lock.
    [[nodiscard]] bool change(const std::function<void()>& change);
    void tellRemoved(const std::string& unit);

    std::mutex _mutex;
    std::condition_variable _called;
    std::map<std::string, int> _calls;
    std::map<std::string, std::string> _refusals;
    bool _isObserved = false;
    std::string _own;
    std::map<std::string, Unit> _units;
    std::uint8_t _invocations = 0;
    std::vector<std::string> _sent;
    std::unique_ptr<sdbus::IConnection> _connection;
    std::unique_ptr<sdbus::IObject> _object;
    std::map<std::string, std::unique_ptr<sdbus::IObject>> _unitObjects;
    std::thread _thread;
};

} // namespace nimbra::test
