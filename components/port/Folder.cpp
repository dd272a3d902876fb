#include "Port/Folder.h"

#include <dlfcn.h>

#include <cstring>

namespace Port {

std::string FolderOf(const void* address) {
    Dl_info info{};
    if (dladdr(address, &info) == 0 || !info.dli_fname) return {};
    const char* slash = std::strrchr(info.dli_fname, '/');
    if (!slash) return {};
    return std::string(info.dli_fname, static_cast<std::size_t>(slash - info.dli_fname + 1));
}

}  // namespace Port
