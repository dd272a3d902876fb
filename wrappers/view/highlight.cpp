// The commands of the highlight: matched methods. The default colour of add asks the script-level
// command `highlight` anew on every call.
#include "package/static_init.h"
#include "wrappers/classes.h"

namespace TcltaskI {
namespace {

using I = IHighlight;
constexpr auto add = Matched("add", 1, "UtilI::MITclProperty add in ", &I::add, Option{"color", "[highlight get default_highlight_color]"});
constexpr auto remove = Matched("remove", 1, "UtilI::MITclProperty remove in ", &I::remove);
constexpr auto new_ = Matched("new", 1, "UtilI::MITclProperty new_ in ", &I::new_, Option{"color", "\"\""});
constexpr auto current = Matched("current", 0, "UtilI::MITclProperty current ", &I::current);
constexpr auto clear = Matched("clear", 0, "UtilI::MITclProperty clear ", &I::clear);
constexpr auto set = Matched("set", 2, "UtilI::MITclProperty set in in ", &I::set);
constexpr auto get = Matched("get", 1, "UtilI::MITclProperty get in ", &I::get);
constexpr auto properties = Matched("properties", 0, "UtilI::MITclProperty properties ", &I::properties, Option{"descriptors", "false"});

using W = TclWrapIHighlight;
constexpr auto rows = W::Rows<add, remove, new_, current, clear, set, get, properties>();

}  // namespace

const TclWrapIHighlight::Table TclWrapIHighlight::table{rows};

}  // namespace TcltaskI
