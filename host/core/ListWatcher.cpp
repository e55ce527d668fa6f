#include "host/core/ListWatcher.h"

namespace nimbra::host {

void ListWatcher::didBeginUpdates() {
    if (_next != nullptr) {
        _next->didBeginUpdates();
    }
}

void ListWatcher::didEndUpdates() {
    if (_next != nullptr) {
        _next->didEndUpdates();
    }
}

void ListWatcher::didInsert(const SpecifierArray& rows, const Specifier& after, bool animated) {
    if (_next != nullptr) {
        _next->didInsert(rows, after, animated);
    }
    _rowsChanged();
}

void ListWatcher::didAppend(const SpecifierArray& rows, bool animated) {
    if (_next != nullptr) {
        _next->didAppend(rows, animated);
    }
    _rowsChanged();
}

void ListWatcher::didRemove(const SpecifierArray& rows, bool animated) {
    if (_next != nullptr) {
        _next->didRemove(rows, animated);
    }
    _rowsChanged();
}

void ListWatcher::didReloadRow(const Specifier& row, bool animated) {
    if (_next != nullptr) {
        _next->didReloadRow(row, animated);
    }
}

void ListWatcher::didReload(const SpecifierArray& rows) {
    if (_next != nullptr) {
        _next->didReload(rows);
    }
    _rowsChanged();
}

} // namespace nimbra::host
