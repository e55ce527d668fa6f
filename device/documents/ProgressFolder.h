#pragma once

#include "device/documents/ProgressValues.h"
#include "device/files/Descriptor.h"
#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <thread>

namespace nimbra {
class SystemLog;
}

namespace nimbra::device {

class ProgressPublisher;

/// The progress that other processes publish: a file `ID.json` each in the device's
/// `run/nimbra/progress`. The progress is published when its file appears, changed when it is
/// written anew, and over when the file goes. A file that is no progress is told of in the log and
/// changes nothing; names that begin with a dot or end otherwise are none of its concern.
///
/// Main queue only; the files are read on a thread of its own.
class ProgressFolder {
public:
    /// Publishes everything for the file that `url` names. Neither `publisher` nor `log` is owned;
    /// both outlive the folder.
    ProgressFolder(DevicePaths paths, ProgressPublisher& publisher, std::string url,
                   SystemLog& log);
    ProgressFolder(const ProgressFolder&) = delete;
    ProgressFolder& operator=(const ProgressFolder&) = delete;
    /// Ends the thread as `finish` does.
    ~ProgressFolder();

    /// Makes the folder where it is missing, for its owner alone, publishes what stands there, and
    /// watches it from here on. Where that is not possible, one line in the log says why.
    /// Once only.
    void start();

    /// Ends the watching. What was published stays.
    void finish();

private:
    [[nodiscard]] std::expected<void, Error> makeAndWatch();
    void run();
    /// Does what the watch has told; false once the folder has gone.
    [[nodiscard]] bool readEvents();
    /// The names of what stands in the folder now; nothing, with a line in the log, on an error.
    [[nodiscard]] std::optional<std::set<std::string>> namesInFolder();
    /// Makes what is published what the files `names` say.
    void readAll(const std::set<std::string>& names);
    void fileChanged(const std::string& name);
    void fileGone(const std::string& name);
    void allGone();
    void reportBadFile(const std::string& name, const Error& error);
    void report(const Error& error);
    void check(const std::expected<void, Error>& outcome);

    DevicePaths _paths;
    ProgressPublisher& _publisher;
    std::string _url;
    SystemLog& _log;
    std::filesystem::path _directory;
    std::optional<Descriptor> _watch;
    /// Tells the thread to end.
    std::optional<Descriptor> _end;
    /// What is published of each file. Only the thread's, once that has begun.
    std::map<std::string, ProgressValues> _published;
    /// What the log was told of each bad file, so as not to repeat it. Only the thread's.
    std::map<std::string, std::string> _reported;
    std::thread _thread;
};

} // namespace nimbra::device
