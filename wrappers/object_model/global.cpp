// The commands of the global settings: matched methods without options.
#include "package/static_init.h"
#include "wrappers/classes.h"

namespace TcltaskI {
namespace {

using I = IGlobal;
constexpr auto set = Matched("set", 2, "UtilI::MITclProperty set in in ", &I::set);
constexpr auto unset = Matched("unset", 1, "UtilI::MITclProperty unset in ", &I::unset);
constexpr auto get = Matched("get", 1, "UtilI::MITclProperty get in ", &I::get);
constexpr auto properties = Matched("properties", 0, "UtilI::MITclProperty properties ", &I::properties);

using W = TclWrapIGlobal;
constexpr auto rows = W::Rows<set, unset, get, properties>();

}  // namespace

const TclWrapIGlobal::Table TclWrapIGlobal::table{rows};

}  // namespace TcltaskI
