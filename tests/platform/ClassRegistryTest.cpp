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

TEST(ClassRegistry, AClassAnswersByTheNamesOfItsOperations) {
    ClassRegistry classes;
    ControllerClass page = classNamed("Page");
    page.classOperations.emplace("number", [] { return RowValue(std::int64_t{7}); });
    ASSERT_TRUE(classes.registerClass(page));

    const auto& operations = classes.classNamed("Page")->classOperations;

    EXPECT_EQ(operations.at("number")(), RowValue(std::int64_t{7}));
    EXPECT_FALSE(operations.contains("another"));
}

TEST(ClassRegistry, TheClassesOfAnotherComeOverWhereTheyAre) {
    ClassRegistry classes;
    ClassRegistry others;
    ASSERT_TRUE(classes.registerClass(classNamed("Page")));
    ASSERT_TRUE(others.registerClass(classNamed("Other")));
    ASSERT_TRUE(others.registerHeaderFooterClass({.name = "Page", .initWithSpecifier = {}}));
    const ControllerClass* other = others.classNamed("Other");

    ASSERT_TRUE(classes.takeClassesOf(others));

    EXPECT_EQ(classes.classNamed("Other"), other);
    EXPECT_NE(classes.classNamed("Page"), nullptr);
    EXPECT_NE(classes.headerFooterClassNamed("Page"), nullptr);
    EXPECT_EQ(others.classNamed("Other"), nullptr);
    EXPECT_EQ(others.headerFooterClassNamed("Page"), nullptr);
}

TEST(ClassRegistry, NoClassComesOverWhereTheNameOfOneIsTaken) {
    ClassRegistry classes;
    ASSERT_TRUE(classes.registerClass(classNamed("Page")));
    ASSERT_TRUE(classes.registerHeaderFooterClass({.name = "Footer", .initWithSpecifier = {}}));
    const ControllerClass* first = classes.classNamed("Page");
    ClassRegistry pages;
    ASSERT_TRUE(pages.registerClass(classNamed("Another")));
    ASSERT_TRUE(pages.registerClass(classNamed("Page")));
    ClassRegistry footers;
    ASSERT_TRUE(footers.registerClass(classNamed("Another")));
    ASSERT_TRUE(footers.registerHeaderFooterClass({.name = "Footer", .initWithSpecifier = {}}));

    EXPECT_FALSE(classes.takeClassesOf(pages));
    EXPECT_FALSE(classes.takeClassesOf(footers));

    EXPECT_EQ(classes.classNamed("Page"), first);
    EXPECT_EQ(classes.classNamed("Another"), nullptr);
    EXPECT_NE(pages.classNamed("Another"), nullptr);
}

} // namespace
} // namespace nimbra
