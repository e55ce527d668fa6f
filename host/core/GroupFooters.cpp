#include "host/core/GroupFooters.h"

#include "platform/system/ClassRegistry.h"
#include "platform/system/SystemLog.h"

#include <algorithm>
#include <iterator>
#include <utility>

namespace nimbra::host {

GroupFooters::GroupFooters(const ClassRegistry& classes, const PlatformServices& services,
                           SystemLog& log)
    : _classes(classes), _services(services), _log(log) {}

GroupFooters::~GroupFooters() {
    setShown(false);
}

bool GroupFooters::Footer::isFor(const Specifier& row, const std::string& rowClass) const {
    const bool isSameGroup =
        group.get() == &row || (row.identifier() && row.identifier() == group->identifier());
    return isSameGroup && className == rowClass;
}

void GroupFooters::update(const SpecifierArray& rows) {
    std::vector<Footer> earlier = std::exchange(_footers, {});
    std::ranges::move(std::exchange(_absent, {}), std::back_inserter(earlier));
    for (const auto& row : rows) {
        const Text className = textValue(row->propertyForKey(FooterCellClassGroupKey));
        if (!className) {
            continue;
        }
        const auto known = std::ranges::find_if(
            earlier, [&](const Footer& footer) { return footer.isFor(*row, className.string()); });
        if (known != earlier.end()) {
            known->group = row;
            _footers.push_back(std::move(*known));
            earlier.erase(known);
        } else {
            _footers.push_back({.group = row,
                                .className = className.string(),
                                .view = viewFor(*row, className.string())});
        }
    }
    _absent = std::move(earlier);
    for (const Footer& footer : _absent) {
        move(footer, nullptr);
    }
    if (_isShown) {
        setShown(true);
    }
}

std::shared_ptr<HeaderFooterView> GroupFooters::viewFor(const Specifier& group,
                                                        const std::string& className) {
    const HeaderFooterClass* headerFooterClass = _classes.headerFooterClassNamed(className);
    if (headerFooterClass == nullptr) {
        _log.write(LogLevel::error, "No view class \"" + className + "\" for the group \"" +
                                        group.label().string() + '"');
        return nullptr;
    }
    return headerFooterClass->initWithSpecifier(group, _services);
}

void GroupFooters::setShown(bool isShown) {
    _isShown = isShown;
    for (const Footer& footer : _footers) {
        if (footer.view && (footer.view->window() != nullptr) != isShown) {
            move(footer, isShown ? _windows.data() : nullptr);
        }
    }
}

void GroupFooters::move(const Footer& footer, Window* window) {
    if (footer.view && (window != nullptr || footer.view->window() != nullptr)) {
        footer.view->moveToWindow(window);
    }
}

void GroupFooters::layOut(double width) {
    for (const Footer& footer : _footers) {
        if (footer.view) {
            const double height = footer.view->preferredHeightForWidthInTableView(width, nullptr);
            footer.view->setFrame({.origin = {}, .size = {width, height}});
            footer.view->layoutIfNeeded();
        }
    }
}

std::shared_ptr<HeaderFooterView> GroupFooters::footerOf(const Specifier& group) const {
    const auto place = std::ranges::find_if(
        _footers, [&group](const Footer& footer) { return footer.group.get() == &group; });
    return place != _footers.end() ? place->view : nullptr;
}

std::shared_ptr<HeaderFooterView> GroupFooters::first() const {
    const auto place =
        std::ranges::find_if(_footers, [](const Footer& footer) { return footer.view != nullptr; });
    return place != _footers.end() ? place->view : nullptr;
}

void GroupFooters::moveFirst(bool intoWindow) {
    const auto view = first();
    if (!intoWindow) {
        view->moveToWindow(nullptr);
        return;
    }
    const bool isInFirst = view->window() == _windows.data();
    view->moveToWindow(&_windows.at(isInFirst ? 1 : 0));
}

} // namespace nimbra::host
