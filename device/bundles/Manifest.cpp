#include "device/bundles/Manifest.h"

#include "device/description/DescriptionValues.h"
#include "device/json/JsonReader.h"

namespace nimbra::device {

std::expected<Manifest, Error> Manifest::read(const std::filesystem::path& bundle) {
    const auto reader = JsonReader::readFile(bundle / "manifest.json");
    if (!reader) {
        return std::unexpected(reader.error());
    }
    reader->allowOnly({"identifier", "executable", "principalClass", "developmentLanguage"});
    const JsonReader principalClass = reader->member("principalClass");
    Manifest manifest{
        .identifier = BundleIdentifier(readName(reader->member("identifier"))),
        .executable = readName(reader->member("executable")),
        .principalClass =
            principalClass.isAbsent() ? std::nullopt : std::optional(readName(principalClass)),
        .developmentLanguage = readLocale(reader->member("developmentLanguage"), "en")};
    if (manifest.executable.find('/') != std::string::npos) {
        reader->member("executable").expected("the name of a file beside the manifest");
    }
    if (const auto problem = reader->problem()) {
        return std::unexpected(*problem);
    }
    return manifest;
}

} // namespace nimbra::device
