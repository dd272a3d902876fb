#include "shell/package_dirs.h"

#include <filesystem>
#include <system_error>

namespace kelmarsh {

std::string ResolvedExecutable(const std::string& fallback) {
    std::error_code error;
    const std::filesystem::path self = std::filesystem::read_symlink("/proc/self/exe", error);
    if (!error && !self.empty()) return self.string();
    const std::filesystem::path resolved = std::filesystem::weakly_canonical(fallback, error);
    return error ? fallback : resolved.string();
}

std::vector<std::string> PackageDirs(const std::string& executable) {
    const std::filesystem::path lib = std::filesystem::path(executable).parent_path().parent_path() / "lib";
    std::vector<std::string> dirs;
    // The installed package folder (lib/tcltk/kelmarVERSION), then the build tree's lib.
    for (const std::filesystem::path& dir : {lib / "tcltk" / ("kelmar" KELMAR_VERSION), lib}) {
        std::error_code error;
        // Only a folder with an index: a bare ../lib such as /usr/lib would make Tcl's package search
        // walk every folder in it.
        if (std::filesystem::is_regular_file(dir / "pkgIndex.tcl", error))
            dirs.push_back(dir.lexically_normal().string());
    }
    return dirs;
}

}  // namespace kelmarsh
