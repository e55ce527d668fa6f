#include "device/system/SpawnSettings.h"

#include <csignal>
#include <unistd.h>
#include <utility>

namespace nimbra::device {

SpawnActions::SpawnActions() : _failure(::posix_spawn_file_actions_init(&_actions)) {
    // First, so that what is opened afterwards stays, under whatever number.
    if (_failure == 0) {
        _failure = ::posix_spawn_file_actions_addclosefrom_np(&_actions, STDERR_FILENO + 1);
    }
}

SpawnActions::~SpawnActions() {
    ::posix_spawn_file_actions_destroy(&_actions);
}

int SpawnActions::open(int descriptor, const std::string& path, int flags, mode_t mode) {
    return ::posix_spawn_file_actions_addopen(&_actions, descriptor, path.c_str(), flags, mode);
}

SpawnAttributes::SpawnAttributes() : _failure(::posix_spawnattr_init(&_attributes)) {
    sigset_t none{};
    sigset_t all{};
    ::sigemptyset(&none);
    ::sigfillset(&all);
    const auto set = [this](int failure) { _failure = _failure == 0 ? failure : _failure; };
    set(::posix_spawnattr_setsigmask(&_attributes, &none));
    set(::posix_spawnattr_setsigdefault(&_attributes, &all));
    constexpr short flags = POSIX_SPAWN_SETSIGMASK | POSIX_SPAWN_SETSIGDEF;
    set(::posix_spawnattr_setflags(&_attributes, flags));
}

SpawnAttributes::~SpawnAttributes() {
    ::posix_spawnattr_destroy(&_attributes);
}

SpawnWords::SpawnWords(std::vector<std::string> words) : _words(std::move(words)) {
    _pointers.reserve(_words.size() + 1);
    for (std::string& word : _words) {
        _pointers.push_back(word.data());
    }
    _pointers.push_back(nullptr);
}

} // namespace nimbra::device
