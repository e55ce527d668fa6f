#pragma once

#include <compare>
#include <functional>
#include <ostream>
#include <string>
#include <utility>

namespace nimbra {

/// A name that identifies something of one kind, so that names of two kinds cannot be mixed up.
/// `Kind` is a tag type that is never defined.
template <class Kind>
class Identifier {
public:
    explicit Identifier(std::string name) : _name(std::move(name)) {}

    [[nodiscard]] const std::string& string() const { return _name; }

    friend auto operator<=>(const Identifier&, const Identifier&) = default;
    friend std::ostream& operator<<(std::ostream& out, const Identifier& identifier) {
        return out << identifier._name;
    }

private:
    std::string _name;
};

/// Names a bundle, installed applications included, in reverse-domain form.
using BundleIdentifier = Identifier<struct BundleKind>;
/// Names an account of the `AccountStore`.
using AccountIdentifier = Identifier<struct AccountKind>;
/// Names a kind of data that an account can carry.
using Dataclass = Identifier<struct DataclassKind>;
/// Names a notification of a `NotificationCenter`.
using NotificationName = Identifier<struct NotificationKind>;
/// Names an entry of a row's property dictionary.
using PropertyKey = Identifier<struct PropertyKind>;
/// Names an entry of a user-info dictionary.
using UserInfoKey = Identifier<struct UserInfoKind>;

} // namespace nimbra

template <class Kind>
struct std::hash<nimbra::Identifier<Kind>> {
    std::size_t operator()(const nimbra::Identifier<Kind>& identifier) const noexcept {
        return std::hash<std::string>{}(identifier.string());
    }
};
