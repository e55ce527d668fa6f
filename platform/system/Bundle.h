#pragma once

#include "platform/values/Error.h"
#include "platform/values/Identifier.h"
#include "platform/values/Text.h"

#include <expected>
#include <memory>
#include <optional>

namespace nimbra {

struct Image;

/// A folder of code and resources that belong together. Any queue, but where an operation says
/// otherwise.
class Bundle {
public:
    Bundle() = default;
    Bundle(const Bundle&) = delete;
    Bundle& operator=(const Bundle&) = delete;
    virtual ~Bundle() = default;

    /// Absent for a folder that does not say what it is called, or has not been loaded.
    [[nodiscard]] virtual const std::optional<BundleIdentifier>& identifier() const = 0;

    /// The text under `key` in the string table `table`, in the best language that the bundle has
    /// for the user. Where no table has the key, `value` comes back: the very object passed in.
    [[nodiscard]] virtual Text localizedStringForKeyValueTable(const Text& key, const Text& value,
                                                               const Text& table) const = 0;

    /// The image called `name` that the bundle ships; null when it has none of that name.
    [[nodiscard]] virtual std::shared_ptr<const Image> imageNamed(const Text& name) const = 0;

    /// Whether the bundle's code is part of this process; once it is, it stays so.
    [[nodiscard]] virtual bool isLoaded() const = 0;

    /// Makes it so, and its classes can be found by name; nothing to do where it is loaded. The
    /// platform logs why a bundle cannot be loaded. Main queue.
    virtual std::expected<void, Error> load() = 0;
};

} // namespace nimbra
