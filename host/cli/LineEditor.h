#pragma once

#include <cstddef>
#include <filesystem>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace nimbra::cli {

/// Reads lines from a terminal, with editing, history and completion. One at a time in a process;
/// main thread.
class LineEditor {
public:
    struct Completion {
        /// How many bytes before the cursor a candidate replaces.
        std::size_t replaced = 0;
        std::vector<std::string> candidates;
    };
    struct Configuration {
        std::string prompt;
        /// Where the history is kept from one use to the next; its directory is made. A history
        /// that cannot be read or written is done without.
        std::filesystem::path history;
        /// While the user types, `whenWoken` is called each time this file descriptor is readable;
        /// what it returns is shown above the line.
        int wakeUpDescriptor = -1;
        std::function<std::string()> whenWoken;
        /// What the line up to the cursor can be completed to.
        std::function<Completion(std::string_view line)> complete;
    };

    explicit LineEditor(Configuration configuration);
    LineEditor(const LineEditor&) = delete;
    LineEditor& operator=(const LineEditor&) = delete;
    ~LineEditor();

    /// The next line without its end; empty when the user gave it up with ^C, nothing at the end
    /// of the input.
    [[nodiscard]] std::optional<std::string> readLine();
    /// The same behind another prompt, for an answer: without completion, and not remembered.
    [[nodiscard]] std::optional<std::string> readAnswer(const std::string& prompt);

private:
    class Library;

    std::unique_ptr<Library> _library;
};

} // namespace nimbra::cli
