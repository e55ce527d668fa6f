#pragma once

#include <spawn.h>
#include <string>
#include <vector>

namespace nimbra::device {

/// What a new process does with its descriptors, of which none of this process's but the three
/// standard ones are left to it. Operations give 0 or an errno.
class SpawnActions {
public:
    SpawnActions();
    SpawnActions(const SpawnActions&) = delete;
    SpawnActions& operator=(const SpawnActions&) = delete;
    ~SpawnActions();

    /// Whether it could be made.
    [[nodiscard]] int failure() const { return _failure; }
    [[nodiscard]] int open(int descriptor, const std::string& path, int flags, mode_t mode);
    [[nodiscard]] const posix_spawn_file_actions_t* get() const { return &_actions; }

private:
    posix_spawn_file_actions_t _actions{};
    int _failure;
};

/// How a new process starts: no signal is blocked or ignored. A program that a shell has put into
/// the background, or that was started without a terminal, ignores some, and this process passes on
/// what it was given: a tool of the device would never end by SIGPIPE or by SIGTERM.
class SpawnAttributes {
public:
    SpawnAttributes();
    SpawnAttributes(const SpawnAttributes&) = delete;
    SpawnAttributes& operator=(const SpawnAttributes&) = delete;
    ~SpawnAttributes();

    /// 0, or the errno why it could not be made.
    [[nodiscard]] int failure() const { return _failure; }
    [[nodiscard]] const posix_spawnattr_t* get() const { return &_attributes; }

private:
    posix_spawnattr_t _attributes{};
    int _failure;
};

/// Words as a new process gets them.
class SpawnWords {
public:
    explicit SpawnWords(std::vector<std::string> words);

    /// The words, and null behind them; as long as this object lives.
    [[nodiscard]] char* const* get() const { return _pointers.data(); }

private:
    std::vector<std::string> _words;
    std::vector<char*> _pointers;
};

} // namespace nimbra::device
