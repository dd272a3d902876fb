// Where kelmarsh finds its Tcl packages: beside its own binary, wherever it was called from.
#pragma once

#include <string>
#include <vector>

namespace kelmarsh {

// The path of the running binary with every symbolic link resolved (from /proc/self/exe), or
// `fallback` when the system does not tell.
std::string ResolvedExecutable(const std::string& fallback);

// The folders that hold the packages for a binary at `executable`: ../lib/tcltk/kelmarVERSION (an installed tree)
// and ../lib (the build tree), each only when it holds a pkgIndex.tcl, the installed one first.
std::vector<std::string> PackageDirs(const std::string& executable);

}  // namespace kelmarsh
