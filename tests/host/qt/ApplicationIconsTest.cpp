#include "host/qt/ApplicationIcons.h"

#include <QDir>
#include <QFile>
#include <QIcon>
#include <QImage>
#include <QQmlComponent>
#include <QQmlEngine>
#include <QTemporaryDir>
#include <cmath>
#include <gtest/gtest.h>
#include <memory>
#include <set>

namespace nimbra::window {
namespace {

double linear(double channel) {
    return channel <= 0.04045 ? channel / 12.92 : std::pow((channel + 0.055) / 1.055, 2.4);
}

double luminanceOf(const QColor& color) {
    return (0.2126 * linear(color.redF())) + (0.7152 * linear(color.greenF())) +
           (0.0722 * linear(color.blueF()));
}

struct ApplicationIconsTest : testing::Test {
    QTemporaryDir folder;
    QStringList pathsBefore = QIcon::themeSearchPaths();
    QString themeBefore = QIcon::themeName();
    ApplicationIcons icons;

    ApplicationIconsTest() {
        write(QStringLiteral("themes/sample/index.theme"),
              "[Icon Theme]\nName=Sample\nDirectories=32x32/apps\n\n"
              "[32x32/apps]\nSize=32\nContext=Applications\nType=Fixed\n");
        paint(QStringLiteral("themes/sample/32x32/apps/org.example.Notes.png"), QSize(32, 32));
        QIcon::setThemeSearchPaths({folder.filePath(QStringLiteral("themes"))});
        QIcon::setThemeName(QStringLiteral("sample"));
    }
    ApplicationIconsTest(const ApplicationIconsTest&) = delete;
    ApplicationIconsTest& operator=(const ApplicationIconsTest&) = delete;
    ~ApplicationIconsTest() override {
        QIcon::setThemeName(themeBefore);
        QIcon::setThemeSearchPaths(pathsBefore);
    }

    void write(const QString& path, const QByteArray& bytes) const {
        const QString place = folder.filePath(path);
        ASSERT_TRUE(QDir().mkpath(QFileInfo(place).path()));
        QFile file(place);
        ASSERT_TRUE(file.open(QIODevice::WriteOnly));
        ASSERT_EQ(file.write(bytes), bytes.size());
    }

    void paint(const QString& path, const QSize& size) const {
        const QString place = folder.filePath(path);
        ASSERT_TRUE(QDir().mkpath(QFileInfo(place).path()));
        QImage image(size, QImage::Format_ARGB32);
        image.fill(Qt::yellow);
        ASSERT_TRUE(image.save(place, "PNG"));
    }

    QImage iconOf(const QString& identifier, const QString& name, const QSize& asked = {}) {
        // What the engine hands in of a source.
        const QString id = ApplicationIcons::sourceFor(identifier, name)
                               .toString(QUrl::RemoveScheme | QUrl::RemoveAuthority)
                               .mid(1);
        QSize told;
        const QImage image = icons.requestPixmap(id, &told, asked).toImage();
        EXPECT_EQ(told, image.size());
        return image;
    }

    /// The colour of the circle, nothing where the image is none.
    static QColor circleOf(const QImage& image) {
        if (image.pixelColor(0, 0).alpha() != 0) {
            return {};
        }
        return image.pixelColor(image.width() / 2, 2);
    }

    static int whitePixelsOf(const QImage& image) {
        int count = 0;
        for (int y = 0; y < image.height(); ++y) {
            for (int x = 0; x < image.width(); ++x) {
                count += image.pixelColor(x, y) == QColor(Qt::white) ? 1 : 0;
            }
        }
        return count;
    }
};

TEST_F(ApplicationIconsTest, TheThemesIconIsShown) {
    const QImage icon = iconOf(QStringLiteral("org.example.Notes"), QStringLiteral("Notes"));

    EXPECT_EQ(icon.size(), QSize(32, 32));
    EXPECT_EQ(icon.pixelColor(0, 0), QColor(Qt::yellow));
}

TEST_F(ApplicationIconsTest, AThemesIconFillsTheSizeThatIsAskedFor) {
    const QImage icon =
        iconOf(QStringLiteral("org.example.Notes"), QStringLiteral("Notes"), QSize(64, 64));

    EXPECT_EQ(icon.size(), QSize(64, 64));
    EXPECT_EQ(icon.pixelColor(2, 60), QColor(Qt::yellow));
}

TEST_F(ApplicationIconsTest, AnIconThatIsNotSquareStandsInTheMiddle) {
    paint(QStringLiteral("themes/sample/32x32/apps/org.example.Wide.png"), QSize(32, 16));

    const QImage icon = iconOf(QStringLiteral("org.example.Wide"), QStringLiteral("Wide"));

    EXPECT_EQ(icon.size(), QSize(32, 32));
    EXPECT_EQ(icon.pixelColor(16, 2).alpha(), 0);
    EXPECT_EQ(icon.pixelColor(16, 16), QColor(Qt::yellow));
}

TEST_F(ApplicationIconsTest, AnApplicationWithoutAnIconGetsItsLetterInACircle) {
    const QString identifier = QStringLiteral("org.example.Mail");

    const QImage icon = iconOf(identifier, QStringLiteral("mail"), QSize(48, 48));

    EXPECT_EQ(icon.size(), QSize(48, 48));
    EXPECT_EQ(circleOf(icon), ApplicationIcons::colorFor(identifier));
    EXPECT_GT(whitePixelsOf(icon), 20);
    EXPECT_NE(icon, iconOf(identifier, QStringLiteral("news"), QSize(48, 48)));
    EXPECT_EQ(icon, iconOf(identifier, QStringLiteral("Mail"), QSize(48, 48)));
}

TEST_F(ApplicationIconsTest, AnIconThatIsBrokenGivesWayToTheLetter) {
    write(QStringLiteral("themes/sample/32x32/apps/org.example.Torn.png"), "no picture");

    const QString identifier = QStringLiteral("org.example.Torn");
    EXPECT_EQ(circleOf(iconOf(identifier, QStringLiteral("Torn"))),
              ApplicationIcons::colorFor(identifier));
}

TEST_F(ApplicationIconsTest, TheIconOfAnotherApplicationIsNotTaken) {
    const QString identifier = QStringLiteral("org.example.Notes-beta");

    EXPECT_EQ(circleOf(iconOf(identifier, QStringLiteral("Notes beta"))),
              ApplicationIcons::colorFor(identifier));
}

TEST_F(ApplicationIconsTest, AnIdentifierIsNeverAPath) {
    paint(QStringLiteral("themes/x.png"), QSize(32, 32));
    paint(QStringLiteral("themes/sample/32x32/x.png"), QSize(32, 32));
    for (const QString& identifier :
         {QStringLiteral("../x"), QStringLiteral(".."), QString(), QStringLiteral("a/../../x"),
          folder.filePath(QStringLiteral("themes/x")),
          folder.filePath(QStringLiteral("themes/x.png")), QStringLiteral("%2e%2e%2fx"),
          QStringLiteral("x\0y?name=z#w"), QStringLiteral("Ünïcode"), QString(100000, u'a')}) {
        const QImage icon = iconOf(identifier, QStringLiteral("x"));
        EXPECT_EQ(icon.size(), QSize(32, 32));
        EXPECT_EQ(circleOf(icon), ApplicationIcons::colorFor(identifier));
    }
}

TEST_F(ApplicationIconsTest, AnUnknownAddressIsACircle) {
    for (const QString& id : {QString(), QStringLiteral("."), QStringLiteral("...."),
                              QStringLiteral("../x"), QStringLiteral("%%%.&&&")}) {
        QSize told;
        EXPECT_EQ(icons.requestPixmap(id, &told, {}).size(), QSize(32, 32));
        EXPECT_EQ(told, QSize(32, 32));
    }
}

TEST_F(ApplicationIconsTest, TheSizeIsTheSmallerSideAndWithinReason) {
    const auto sizeFor = [this](const QSize& asked) {
        return iconOf(QStringLiteral("a"), QStringLiteral("A"), asked).size();
    };

    EXPECT_EQ(sizeFor(QSize(0, 0)), QSize(32, 32));
    EXPECT_EQ(sizeFor(QSize(29, 0)), QSize(29, 29));
    EXPECT_EQ(sizeFor(QSize(0, 29)), QSize(29, 29));
    EXPECT_EQ(sizeFor(QSize(80, 40)), QSize(40, 40));
    EXPECT_EQ(sizeFor(QSize(1, 1)), QSize(1, 1));
    EXPECT_EQ(sizeFor(QSize(-5, -5)), QSize(32, 32));
    EXPECT_EQ(sizeFor(QSize(100000, 100000)), QSize(1024, 1024));
}

TEST_F(ApplicationIconsTest, TheLetterIsTheFirstCharacterInUpperCase) {
    const auto letterOf = [](const char* name) {
        return ApplicationIcons::letterFor(QStringLiteral("org"), QString::fromUtf8(name));
    };

    EXPECT_EQ(letterOf("notes"), QStringLiteral("N"));
    EXPECT_EQ(letterOf("  \u200Eübung"), QStringLiteral("Ü"));
    EXPECT_EQ(letterOf("e\u0301tude"), QStringLiteral("E\u0301"));
    EXPECT_EQ(letterOf("ßharp"), QStringLiteral("S"));
    EXPECT_EQ(letterOf("書類"), QStringLiteral("書"));
    EXPECT_EQ(letterOf("𠮷野"), QStringLiteral("𠮷"));
    EXPECT_EQ(letterOf("😀 fun"), QStringLiteral("😀"));
    EXPECT_EQ(letterOf("👍🏽 yes"), QStringLiteral("👍🏽"));
    EXPECT_EQ(letterOf("🇩🇪🇫🇷"), QStringLiteral("🇩🇪"));
    EXPECT_EQ(letterOf(""), QStringLiteral("O"));
    EXPECT_EQ(ApplicationIcons::letterFor(QString(), QStringLiteral("\u200E ")), QString());
    const QString tower = QStringLiteral("a") + QString(100000, QChar(0x0301));
    EXPECT_LE(ApplicationIcons::letterFor(QString(), tower).size(), 32);
}

TEST_F(ApplicationIconsTest, TheAddressSurvivesEveryText) {
    const QUrl source =
        ApplicationIcons::sourceFor(QStringLiteral("a/b?c#d%20é"), QStringLiteral("/?#%"));

    EXPECT_TRUE(source.isValid());
    EXPECT_EQ(source.scheme(), QStringLiteral("image"));
    EXPECT_EQ(source.host(), QStringLiteral("application"));
    EXPECT_FALSE(source.hasQuery());
    EXPECT_FALSE(source.hasFragment());
    EXPECT_EQ(source.path().count(u'/'), 1);
    EXPECT_FALSE(source.toString().contains(u'%'));
}

TEST_F(ApplicationIconsTest, AnImageElementShowsIt) {
    QQmlEngine engine;
    engine.addImageProvider(QString::fromLatin1(ApplicationIcons::kProvider),
                            std::make_unique<ApplicationIcons>().release());
    QQmlComponent component(&engine);
    component.setData("import QtQuick\nImage { sourceSize: Qt.size(29, 29) }", QUrl());
    const std::unique_ptr<QObject> image(component.create());
    ASSERT_TRUE(image) << component.errorString().toStdString();

    image->setProperty("source", ApplicationIcons::sourceFor(QStringLiteral("../a?b#c%20"),
                                                             QStringLiteral("書類")));

    constexpr int ready = 1;
    EXPECT_EQ(image->property("status").toInt(), ready);
    EXPECT_EQ(image->property("implicitWidth").toDouble(), 29);
}

TEST_F(ApplicationIconsTest, AWhiteLetterIsReadOnEveryColor) {
    for (const QColor& color : ApplicationIcons::colors()) {
        EXPECT_GE(1.05 / (luminanceOf(color) + 0.05), 4.5) << color.name().toStdString();
    }
}

TEST_F(ApplicationIconsTest, TheColorsAreWellApart) {
    std::set<int> hues;
    for (const QColor& color : ApplicationIcons::colors()) {
        hues.insert(color.hsvHue());
    }
    ASSERT_EQ(hues.size(), 8U);
    int before = *hues.rbegin() - 360;
    for (const int hue : hues) {
        EXPECT_GE(hue - before, 25);
        before = hue;
    }
}

TEST_F(ApplicationIconsTest, AnIdentifierHasItsColorForEver) {
    const auto& colors = ApplicationIcons::colors();
    std::set<QString> seen;
    for (int i = 0; i < 200; ++i) {
        seen.insert(ApplicationIcons::colorFor(QStringLiteral("org.example.App%1").arg(i)).name());
    }

    EXPECT_EQ(seen.size(), colors.size());
    // The hash of nothing is its start, 0x811C9DC5, folded: 0x811C1CD9.
    EXPECT_EQ(ApplicationIcons::colorFor(QString()), colors.at(1));
}

} // namespace
} // namespace nimbra::window
