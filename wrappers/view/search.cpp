// The search command: a matched method whose -type and -in collect every value given.
#include "package/static_init.h"
#include "wrappers/classes.h"

namespace TcltaskI {
namespace {

using I = ISearch;
constexpr auto search = Matched("search", 1, "UtilI::MITclProperty search in ", &I::search,
                                Option{"matchcase", "false"}, Option{"exactmatch", "false"}, Option{"regexp", "false"},
                                Option{"exp", "false"}, Option{"type", "all"}, Option{"in", "project"});

using W = TclWrapISearch;
constexpr auto rows = W::Rows<search>();

}  // namespace

const TclWrapISearch::Table TclWrapISearch::table{rows};

}  // namespace TcltaskI
