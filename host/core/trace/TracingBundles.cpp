#include "host/core/trace/TracingBundles.h"

#include "host/core/RowDescription.h"
#include "host/core/trace/Trace.h"

#include <utility>

namespace nimbra::host {

namespace {

class TracingBundle final : public Bundle {
public:
    TracingBundle(std::shared_ptr<Bundle> bundle, Text path, Trace& trace)
        : _bundle(std::move(bundle)), _path(std::move(path)), _trace(trace) {}

    [[nodiscard]] const std::optional<BundleIdentifier>& identifier() const override {
        return _bundle->identifier();
    }
    [[nodiscard]] Text localizedStringForKeyValueTable(const Text& key, const Text& value,
                                                       const Text& table) const override {
        return _bundle->localizedStringForKeyValueTable(key, value, table);
    }
    [[nodiscard]] std::shared_ptr<const Image> imageNamed(const Text& name) const override {
        return _bundle->imageNamed(name);
    }
    [[nodiscard]] bool isLoaded() const override { return _bundle->isLoaded(); }
    std::expected<void, Error> load() override {
        auto loaded = _bundle->load();
        _trace.write("bundle",
                     {{"op", "load"}, {"path", jsonOf(_path)}, {"loaded", loaded.has_value()}});
        return loaded;
    }

private:
    std::shared_ptr<Bundle> _bundle;
    Text _path;
    Trace& _trace;
};

} // namespace

std::shared_ptr<Bundle>
TracingBundles::bundleWithIdentifier(const BundleIdentifier& identifier) const {
    return _bundles.bundleWithIdentifier(identifier);
}

std::shared_ptr<Bundle> TracingBundles::bundleWithPath(const Text& path) {
    auto bundle = _bundles.bundleWithPath(path);
    return bundle ? std::make_shared<TracingBundle>(std::move(bundle), path, _trace) : nullptr;
}

std::shared_ptr<Bundle> TracingBundles::bundleForClass(const std::type_info& classType) const {
    return _bundles.bundleForClass(classType);
}

} // namespace nimbra::host
