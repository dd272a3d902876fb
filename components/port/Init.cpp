// The file and path-list init objects. The layer keeps no open files and no search paths of its
// own, so these only count the modules that hold it up; the counters are constant-initialised and
// so are right even while other libraries run their static initialisers before this one.
#include "Port/Init.h"

namespace Port {

namespace {
int g_fileInits = 0;
int g_pathListInits = 0;
}  // namespace

FileInit::FileInit() { ++g_fileInits; }
FileInit::~FileInit() { --g_fileInits; }

PathListInit::PathListInit() { ++g_pathListInits; }
PathListInit::~PathListInit() { --g_pathListInits; }

int FileInitCount() noexcept { return g_fileInits; }
int PathListInitCount() noexcept { return g_pathListInits; }

}  // namespace Port
