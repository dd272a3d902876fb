// Where a loaded library lies, so that it can find the files installed beside it.
#pragma once

#include <string>

namespace Port {

// The folder, with its trailing slash, of the loaded file (library or program) that holds
// `address`, an address of the caller's own code; empty when the loader cannot tell.
std::string FolderOf(const void* address);

}  // namespace Port
