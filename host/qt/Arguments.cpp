#include "host/qt/Arguments.h"

#include "host/core/CommandLine.h"

#include <CLI/CLI.hpp>
#include <QString>
#include <QStringList>
#include <map>
#include <optional>

namespace nimbra::window {

namespace {

constexpr const char* description =
    "Shows the settings page of Nimbra Drive, the cloud document storage of an account, in a\n"
    "window. The page runs on a device: a directory laid out like a device's root. The first use\n"
    "makes a sample device, so that there is something to try.\n";

constexpr const char* keys = "Keys: Tab and the arrows go from row to row, Space flips or presses, "
                             "Escape goes back,\n"
                             "F5 fetches anew, Ctrl+F searches, Ctrl+Q quits.";

/// The number that `word` is; nothing for what is none, or too small or large for a window.
std::optional<int> extentOf(const QString& word) {
    constexpr int least = 320;
    constexpr int most = 4096;
    bool isNumber = false;
    const int extent = word.toInt(&isNumber);
    return isNumber && extent >= least && extent <= most ? std::optional(extent) : std::nullopt;
}

/// "390x760"; nothing for what is no size.
std::optional<QSize> sizeOf(const std::string& word) {
    const QStringList extents = QString::fromStdString(word).split(QLatin1Char('x'));
    if (extents.size() != 2) {
        return std::nullopt;
    }
    const auto width = extentOf(extents.front());
    const auto height = extentOf(extents.back());
    return width && height ? std::optional(QSize(*width, *height)) : std::nullopt;
}

class Parser {
public:
    explicit Parser(Arguments& arguments) : _arguments(arguments) {
        _app.name("settingshost");
        _app.footer(keys);
        _app.set_version_flag("--version", "settingshost " NIMBRA_VERSION)
            ->description("Print the version and end");
        _app.set_help_flag("-h,--help", "Say this and end");
        addDeviceOptions();
        addWindowOptions();
    }

    void parse(int count, char** words) { _app.parse(count, words); }

    [[nodiscard]] const CLI::App& app() const { return _app; }

private:
    void addDeviceOptions() {
        const auto ownDevice = [this](CLI::Option* option) { _deviceOptions.push_back(option); };
        ownDevice(_app.add_option("--root", _arguments.root,
                                  "The device (default: ~/.local/state/nimbra/device)")
                      ->type_name("DIR")
                      ->check(host::problemOfPath));
        ownDevice(_app.add_option("--account", _arguments.account,
                                  "The account (default: the device's first)")
                      ->type_name("ID"));
        ownDevice(_app.add_flag("--first-setup", _arguments.firstSetup,
                                "Open the page as in the account's first setup"));
        _app.add_option("--locale", _arguments.locale,
                        "The language, e.g. ja-JP (default: the device's)")
            ->type_name("TAG")
            ->check(host::problemOfLanguage);
        _app.add_option("--bundle", _arguments.bundle,
                        "The page's bundle (default: the installed one)")
            ->type_name("DIR")
            ->check(host::problemOfPath);
    }

    void addWindowOptions() {
        _row = _app.add_option("--row", _arguments.row,
                               "Open the page and go to this row: its name as shown, or its "
                               "identifier")
                   ->type_name("ROW");
        CLI::Option* scenario =
            _app.add_option("--scenario", _arguments.scenario,
                            "Play this scenario before the user's eyes, on a device of its own")
                ->type_name("FILE")
                ->check(host::problemOfPath)
                ->excludes(_row);
        for (CLI::Option* option : _deviceOptions) {
            scenario->excludes(option);
        }
        _app.add_option("--screenshot", _arguments.screenshot,
                        "Put a picture of the window here once nothing moves, and end")
            ->type_name("FILE.png")
            ->check(host::problemOfPath);
        _app.add_option_function<std::string>(
                "--size",
                [this](const std::string& word) {
                    const auto size = sizeOf(word);
                    if (!size) {
                        throw CLI::ValidationError(
                            "--size", '"' + word +
                                          "\" is not a size such as \"390x760\", of 320 to 4096 "
                                          "points each");
                    }
                    _arguments.size = *size;
                },
                "The window's size in points (default: 390x760)")
            ->type_name("WIDTHxHEIGHT");
        addChoice("--appearance", "light or dark (default: the system's)",
                  _arguments.appearance.dark, {{"light", false}, {"dark", true}});
        addChoice("--contrast", "normal or high (default: the system's)",
                  _arguments.appearance.highContrast, {{"normal", false}, {"high", true}});
        addChoice("--motion", "full or reduced (default: the system's)",
                  _arguments.appearance.reducedMotion, {{"full", false}, {"reduced", true}});
        _app.add_option_function<double>(
                "--text-size",
                [this](double percent) { _arguments.appearance.textScale = percent / 100; },
                "The size of texts in percent, 50 to 300 (default: the system's)")
            ->type_name("PERCENT")
            ->check(CLI::Range(50, 300));
    }

    void addChoice(const std::string& name, const std::string& summary, std::optional<bool>& choice,
                   const std::map<std::string, bool>& words) {
        std::string known;
        for (const auto& [word, value] : words) {
            known += (known.empty() ? "" : " or ") + word;
        }
        _app.add_option_function<std::string>(
                name,
                [name, known, words, &choice](const std::string& word) {
                    const auto chosen = words.find(word);
                    if (chosen == words.end()) {
                        throw CLI::ValidationError(name, known + " expected, not " + word);
                    }
                    choice = chosen->second;
                },
                summary)
            ->type_name("");
    }

    Arguments& _arguments;
    CLI::App _app{description};
    std::vector<CLI::Option*> _deviceOptions;
    CLI::Option* _row = nullptr;
};

} // namespace

std::expected<Arguments, int> Arguments::parse(int count, char** words) {
    return host::parseCommandLine<Arguments, Parser, CLI::ParseError>(count, words);
}

} // namespace nimbra::window
