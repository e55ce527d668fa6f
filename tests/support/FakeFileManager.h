#pragma once

#include "platform/system/FileManager.h"

namespace nimbra::test {

class FakeFileManager final : public FileManager {
public:
    [[nodiscard]] Text tidewaterIdentityToken() override { return identity; }

    Text identity{"token"};
};

} // namespace nimbra::test
