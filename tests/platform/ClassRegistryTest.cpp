#include "platform/system/ClassRegistry.h"

#include "platform/host/SettingsListController.h"

#include <gtest/gtest.h>

namespace nimbra {
namespace {

ControllerClass classNamed(const std::string& name) {
    return {.name = name, .create = [](const PlatformServices&) { return nullptr; }};
}

TEST(ClassRegistry, AClassIsFoundByItsName) {
    ClassRegistry classes;

    ASSERT_TRUE(classes.registerClass(classNamed("Page")));

    ASSERT_NE(classes.classNamed("Page"), nullptr);
    EXPECT_EQ(classes.classNamed("Page")->name, "Page");
    EXPECT_EQ(classes.classNamed("Another"), nullptr);
}

TEST(ClassRegistry, ANameIsGivenOnce) {
    ClassRegistry classes;
    ASSERT_TRUE(classes.registerClass(classNamed("Page")));
    const ControllerClass* first = classes.classNamed("Page");

    EXPECT_FALSE(classes.registerClass(classNamed("Page")));

    EXPECT_EQ(classes.classNamed("Page"), first);
}

} // namespace
} // namespace nimbra
