#pragma once

#include <cstdlib>
#include <optional>
#include <string>
#include <utility>

namespace nimbra::test {

/// While it lives, a variable of this process's environment has another value, or none; then it has
/// its own again, for the tests that come after in the same process.
class EnvironmentVariable {
public:
    EnvironmentVariable(std::string name, const std::optional<std::string>& value)
        : _name(std::move(name)) {
        if (const char* earlier = std::getenv(_name.c_str())) {
            _earlier = earlier;
        }
        set(value);
    }
    EnvironmentVariable(const EnvironmentVariable&) = delete;
    EnvironmentVariable& operator=(const EnvironmentVariable&) = delete;
    ~EnvironmentVariable() { set(_earlier); }

    void set(const std::optional<std::string>& value) {
        if (value) {
            ::setenv(_name.c_str(), value->c_str(), 1);
        } else {
            ::unsetenv(_name.c_str());
        }
    }

private:
    std::string _name;
    std::optional<std::string> _earlier;
};

} // namespace nimbra::test
