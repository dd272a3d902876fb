// The commands of object queries: matched methods.
#include "package/static_init.h"
#include "wrappers/classes.h"

namespace TcltaskI {
namespace {

using I = IObject;
constexpr auto name = Matched("name", 1, "UtilI::MITclProperty name in ", &I::name);
constexpr auto type = Matched("type", 1, "UtilI::MITclProperty type in ", &I::type);
constexpr auto get = Matched("get", 2, "UtilI::MITclProperty get in in ", &I::get);
constexpr auto properties = Matched("properties", 1, "UtilI::MITclProperty properties in ", &I::properties, Option{"descriptors", "false"});

using W = TclWrapIObject;
constexpr auto rows = W::Rows<name, type, get, properties>();

}  // namespace

const TclWrapIObject::Table TclWrapIObject::table{rows};

}  // namespace TcltaskI
