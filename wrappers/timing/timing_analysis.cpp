// The commands of a timing analysis: matched methods; seven of them end in a list of any length.
#include "package/static_init.h"
#include "wrappers/classes.h"

namespace TcltaskI {
namespace {

using I = ITimingAnalysis;
constexpr auto properties = Matched("properties", 0, "UtilI::MITclProperty properties ", &I::properties, Option{"descriptors", "false"});
constexpr auto delete_ = Matched("delete", 1, "UtilI::MITclProperty delete_ in ", &I::delete_);
constexpr auto disable_constraints = Matched("disable_constraints", 2, "UtilI::MITclProperty disable_constraints in in ", &I::disable_constraints);
constexpr auto disable_cpt = Matched("disable_cpt", 3, "UtilI::MITclProperty disable_cpt in in in ", &I::disable_cpt);
constexpr auto enable_constraints = Matched("enable_constraints", 2, "UtilI::MITclProperty enable_constraints in in ", &I::enable_constraints);
constexpr auto get = Matched("get", 2, "UtilI::MITclProperty get in in ", &I::get);
constexpr auto enable_cpt = Matched("enable_cpt", 3, "UtilI::MITclProperty enable_cpt in in in ", &I::enable_cpt);
constexpr auto new_ = Matched("new", 1, "UtilI::MITclProperty new_ in ", &I::new_, Option{"name", "\"\""});
constexpr auto reset = Matched("reset", 1, "UtilI::MITclProperty reset in ", &I::reset);
constexpr auto run = Matched("run", 1, "UtilI::MITclProperty run in ", &I::run, Option{"overwrite", "false"});
constexpr auto save_as = Matched("save_as", 2, "UtilI::MITclProperty save_as in in ", &I::save_as);
constexpr auto saveas = Matched("saveas", 2, "UtilI::MITclProperty saveas in in ", &I::saveas);
constexpr auto set = Matched("set", 3, "UtilI::MITclProperty set in in in ", &I::set);
constexpr auto set_constraint = Matched("set_constraint", 3, "UtilI::MITclProperty set_constraint in in in ", &I::set_constraint);
constexpr auto set_endpoints = Matched("set_endpoints", 4, "UtilI::MITclProperty set_endpoints in in in in ", &I::set_endpoints);
constexpr auto set_query = Matched("set_query", 3, "UtilI::MITclProperty set_query in in in ", &I::set_query, Option{"ld", "0"}, Option{"hf", "0"});
constexpr auto set_filter = Matched("set_filter", 4, "UtilI::MITclProperty set_filter in in in in ", &I::set_filter);
constexpr auto show_settings = Matched("show_settings", 1, "UtilI::MITclProperty show_settings in ", &I::show_settings);

using W = TclWrapITimingAnalysis;
constexpr auto rows = W::Rows<properties, delete_, disable_constraints, disable_cpt, enable_constraints, get,
                               enable_cpt, new_, reset, run, save_as, saveas, set, set_constraint,
                               set_endpoints, set_query, set_filter, show_settings>();

}  // namespace

const TclWrapITimingAnalysis::Table TclWrapITimingAnalysis::table{rows};

}  // namespace TcltaskI
