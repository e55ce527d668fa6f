#pragma once

#include "platform/documents/DaemonConnection.h"

namespace nimbra::test {

class FakeDaemonConnection final : public DaemonConnection {
public:
    [[nodiscard]] std::string mobileDocumentsURL() const override { return url; }

    std::string url = "file:///documents/";
};

} // namespace nimbra::test
