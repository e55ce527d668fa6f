#include "host/core/trace/TracingAppTerminator.h"

#include "host/core/RowDescription.h"
#include "host/core/trace/Trace.h"

namespace nimbra::host {

void TracingAppTerminator::terminateApplication(const BundleIdentifier& bundle,
                                                const Termination& termination) {
    _trace.write("terminate", {{"bundle", bundle.string()},
                               {"reason", termination.reason},
                               {"report", termination.report},
                               {"description", jsonOf(termination.description)}});
    _terminator.terminateApplication(bundle, termination);
}

} // namespace nimbra::host
