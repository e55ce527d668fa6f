#include "host/core/trace/TableTracer.h"

#include "host/core/RowDescription.h"
#include "host/core/trace/Trace.h"

#include <utility>

namespace nimbra::host {

namespace {

nlohmann::ordered_json labels(const SpecifierArray& rows) {
    auto list = nlohmann::ordered_json::array();
    for (const auto& row : rows) {
        list.push_back(jsonOf(row->label()));
    }
    return list;
}

} // namespace

void TableTracer::didBeginUpdates() {
    write("beginUpdates", {}, true);
}

void TableTracer::didEndUpdates() {
    write("endUpdates", {}, true);
}

void TableTracer::didInsert(const SpecifierArray& rows, const Specifier& after, bool animated) {
    _trace.write("table", {{"op", "insert"},
                           {"rows", labels(rows)},
                           {"after", jsonOf(after.label())},
                           {"animated", animated}});
}

void TableTracer::didAppend(const SpecifierArray& rows, bool animated) {
    write("append", rows, animated);
}

void TableTracer::didRemove(const SpecifierArray& rows, bool animated) {
    write("remove", rows, animated);
}

void TableTracer::didReloadRow(const Specifier& row, bool animated) {
    _trace.write("table", {{"op", "reloadRow"},
                           {"rows", nlohmann::ordered_json::array({jsonOf(row.label())})},
                           {"animated", animated}});
}

void TableTracer::didReload(const SpecifierArray& rows) {
    write("reload", rows, false);
}

void TableTracer::write(std::string_view operation, const SpecifierArray& rows, bool animated) {
    _trace.write("table", {{"op", operation}, {"rows", labels(rows)}, {"animated", animated}});
}

} // namespace nimbra::host
