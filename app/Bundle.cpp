#include "app/Bundle.h"

#include <system_error>

namespace pyx {

Bundle Bundle::mainBundle() {
    std::error_code ec;
    const auto exe = std::filesystem::read_symlink("/proc/self/exe", ec);
    if (ec) return Bundle(PYXON_SOURCE_RESOURCES);
    return forProgram(exe, PYXON_SOURCE_RESOURCES);
}

Bundle Bundle::forProgram(const std::filesystem::path& programPath,
                          const std::filesystem::path& fallback) {
    const auto installed = programPath.parent_path().parent_path() / PYXON_INSTALL_DATADIR;
    std::error_code ec;
    if (std::filesystem::is_directory(installed, ec)) return Bundle(installed);
    return Bundle(fallback);
}

std::optional<std::string> Bundle::pathForResource(std::string_view name,
                                                   std::string_view type) const {
    std::string file(name);
    file += '.';
    file += type;
    const auto path = resourcePath_ / file;
    std::error_code ec;
    if (!std::filesystem::is_regular_file(path, ec)) return std::nullopt;
    return path.string();
}

}  // namespace pyx
