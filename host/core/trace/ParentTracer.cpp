#include "host/core/trace/ParentTracer.h"

#include "host/core/trace/Trace.h"

namespace nimbra::host {

void ParentTracer::didReload(const SpecifierArray& /*rows*/) {
    _trace.write("parent", {{"op", "reloadSpecifiers"}});
}

} // namespace nimbra::host
