// The commands of a collection: matched methods.
#include "package/static_init.h"
#include "wrappers/classes.h"

namespace TcltaskI {
namespace {

using I = ICollection;
constexpr auto append_to = Matched("append_to", 2, "UtilI::MITclProperty append_to in in ", &I::append_to, Option{"unique", "false"});
constexpr auto equal = Matched("equal", 2, "UtilI::MITclProperty equal in in ", &I::equal, Option{"order_dependent", "false"});
constexpr auto copy = Matched("copy", 1, "UtilI::MITclProperty copy in ", &I::copy);
constexpr auto foreach = Matched("foreach", 3, "UtilI::MITclProperty foreach in in in ", &I::foreach);
constexpr auto index = Matched("index", 2, "UtilI::MITclProperty index in in ", &I::index);
constexpr auto remove_from = Matched("remove_from", 2, "UtilI::MITclProperty remove_from in in ", &I::remove_from);
constexpr auto sizeof_ = Matched("sizeof", 1, "UtilI::MITclProperty sizeof_ in ", &I::sizeof_);
constexpr auto set = Matched("set", 2, "UtilI::MITclProperty set in in ", &I::set);
constexpr auto get = Matched("get", 1, "UtilI::MITclProperty get in ", &I::get);
constexpr auto properties = Matched("properties", 0, "UtilI::MITclProperty properties ", &I::properties);

using W = TclWrapICollection;
constexpr auto rows = W::Rows<append_to, equal, copy, foreach, index, remove_from, sizeof_, set, get,
                               properties>();

}  // namespace

const TclWrapICollection::Table TclWrapICollection::table{rows};

}  // namespace TcltaskI
