#pragma once

#include "platform/system/FileManager.h"

namespace nimbra::test {

class FakeFileManager final : public FileManager {
public:
    [[nodiscard]] Text SystemRootDirectory() const override { return root; }
    [[nodiscard]] Text tidewaterIdentityToken() override { return identity; }

    Text root{"/"};
    Text identity{"token"};
};

} // namespace nimbra::test
