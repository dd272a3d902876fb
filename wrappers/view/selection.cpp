// The commands of the selection: matched methods.
#include "package/static_init.h"
#include "wrappers/classes.h"

namespace TcltaskI {
namespace {

using I = ISelection;
constexpr auto add = Matched("add", 1, "UtilI::MITclProperty add in ", &I::add);
constexpr auto remove = Matched("remove", 1, "UtilI::MITclProperty remove in ", &I::remove);
constexpr auto new_ = Matched("new", 1, "UtilI::MITclProperty new_ in ", &I::new_);
constexpr auto current = Matched("current", 0, "UtilI::MITclProperty current ", &I::current);
constexpr auto clear = Matched("clear", 0, "UtilI::MITclProperty clear ", &I::clear);
constexpr auto set = Matched("set", 2, "UtilI::MITclProperty set in in ", &I::set);
constexpr auto get = Matched("get", 1, "UtilI::MITclProperty get in ", &I::get);
constexpr auto properties = Matched("properties", 0, "UtilI::MITclProperty properties ", &I::properties, Option{"descriptors", "false"});

using W = TclWrapISelection;
constexpr auto rows = W::Rows<add, remove, new_, current, clear, set, get, properties>();

}  // namespace

const TclWrapISelection::Table TclWrapISelection::table{rows};

}  // namespace TcltaskI
