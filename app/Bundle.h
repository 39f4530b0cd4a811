// The application's resource directory: where the metric configuration lives.
//
// Installed, it is share/pyxon under the program's prefix (bin/pyxon -> share/pyxon). Run from
// the build tree, where no such directory exists, it is the source tree's resources/.
#pragma once

#include <filesystem>
#include <optional>
#include <string>
#include <string_view>

namespace pyx {

class Bundle {
  public:
    explicit Bundle(std::filesystem::path resourcePath) : resourcePath_(std::move(resourcePath)) {}

    // The bundle of the running program.
    static Bundle mainBundle();
    // The bundle of the program at programPath: share/pyxon under its prefix when that folder
    // exists, otherwise fallback.
    static Bundle forProgram(const std::filesystem::path& programPath,
                             const std::filesystem::path& fallback);

    // The path of the resource "name.type", if that file exists.
    [[nodiscard]] std::optional<std::string> pathForResource(std::string_view name,
                                                             std::string_view type) const;
    [[nodiscard]] const std::filesystem::path& resourcePath() const { return resourcePath_; }

  private:
    std::filesystem::path resourcePath_;
};

}  // namespace pyx
