#include "host/core/ListWatcher.h"

namespace nimbra::host {

template <class... Parameters, class... Arguments>
void ListWatcher::tell(void (SettingsListObserver::*change)(Parameters...),
                       const Arguments&... arguments) {
    for (SettingsListObserver* const other : _others) {
        if (other != nullptr) {
            (other->*change)(arguments...);
        }
    }
}

void ListWatcher::didBeginUpdates() {
    tell(&SettingsListObserver::didBeginUpdates);
}

void ListWatcher::didEndUpdates() {
    tell(&SettingsListObserver::didEndUpdates);
}

void ListWatcher::didInsert(const SpecifierArray& rows, const Specifier& after, bool animated) {
    tell(&SettingsListObserver::didInsert, rows, after, animated);
    _rowsChanged();
}

void ListWatcher::didAppend(const SpecifierArray& rows, bool animated) {
    tell(&SettingsListObserver::didAppend, rows, animated);
    _rowsChanged();
}

void ListWatcher::didRemove(const SpecifierArray& rows, bool animated) {
    tell(&SettingsListObserver::didRemove, rows, animated);
    _rowsChanged();
}

void ListWatcher::didReloadRow(const Specifier& row, bool animated) {
    tell(&SettingsListObserver::didReloadRow, row, animated);
}

void ListWatcher::didReload(const SpecifierArray& rows) {
    tell(&SettingsListObserver::didReload, rows);
    _rowsChanged();
}

} // namespace nimbra::host
