// The commands of a floorplan: matched methods; close, import and export have options.
#include "package/static_init.h"
#include "wrappers/classes.h"

namespace TcltaskI {
namespace {

using I = IXFloorplan;
constexpr Option ucf{"ucf", "\"\""}, csv{"csv", "\"\""}, vhdl{"vhdl", "\"\""}, vlog{"vlog", "\"\""};
constexpr auto open = Matched("open", 0, "UtilI::MITclProperty open ", &I::open);
constexpr auto open_full = Matched("open_full", 3, "UtilI::MITclProperty open_full in in in ", &I::open_full);
constexpr auto open_empty = Matched("open_empty", 9, "UtilI::MITclProperty open_empty in in in in in in in in in ", &I::open_empty);
constexpr auto close = Matched("close", 0, "UtilI::MITclProperty close ", &I::close, Option{"nosave", "false"});
constexpr auto save = Matched("save", 0, "UtilI::MITclProperty save ", &I::save);
constexpr auto import = Matched("import", 0, "UtilI::MITclProperty import ", &I::import, ucf, csv, vhdl, vlog);
constexpr auto export_ = Matched("export", 0, "UtilI::MITclProperty export_ ", &I::export_, ucf, csv, vhdl, vlog);
constexpr auto group = Matched("group", 2, "UtilI::MITclProperty group in in ", &I::group);
constexpr auto ungroup = Matched("ungroup", 1, "UtilI::MITclProperty ungroup in ", &I::ungroup);
constexpr auto properties = Matched("properties", 0, "UtilI::MITclProperty properties ", &I::properties);
constexpr auto get = Matched("get", 1, "UtilI::MITclProperty get in ", &I::get);
constexpr auto set = Matched("set", 2, "UtilI::MITclProperty set in in ", &I::set);
constexpr auto block_properties = Matched("block_properties", 0, "UtilI::MITclProperty block_properties ", &I::block_properties);
constexpr auto block_get = Matched("block_get", 2, "UtilI::MITclProperty block_get in in ", &I::block_get);
constexpr auto block_set_constraint = Matched("block_set_constraint", 3, "UtilI::MITclProperty block_set_constraint in in in ", &I::block_set_constraint);
constexpr auto block_delete_constraint = Matched("block_delete_constraint", 2, "UtilI::MITclProperty block_delete_constraint in in ", &I::block_delete_constraint);
constexpr auto prohibit = Matched("prohibit", 1, "UtilI::MITclProperty prohibit in ", &I::prohibit);
constexpr auto allow = Matched("allow", 1, "UtilI::MITclProperty allow in ", &I::allow);
constexpr auto drc = Matched("drc", 0, "UtilI::MITclProperty drc ", &I::drc);
constexpr auto sso_analysis = Matched("sso_analysis", 0, "UtilI::MITclProperty sso_analysis ", &I::sso_analysis);
constexpr auto clock_analysis = Matched("clock_analysis", 0, "UtilI::MITclProperty clock_analysis ", &I::clock_analysis);
constexpr auto make_pin_compatible = Matched("make_pin_compatible", 4, "UtilI::MITclProperty make_pin_compatible in in in in ", &I::make_pin_compatible);
constexpr auto zoom = Matched("zoom", 2, "UtilI::MITclProperty zoom in in ", &I::zoom);
constexpr auto refresh = Matched("refresh", 0, "UtilI::MITclProperty refresh ", &I::refresh);

using W = TclWrapIXFloorplan;
constexpr auto rows = W::Rows<open, open_full, open_empty, close, save, import, export_, group, ungroup,
                               properties, get, set, block_properties, block_get, block_set_constraint,
                               block_delete_constraint, prohibit, allow, drc, sso_analysis, clock_analysis,
                               make_pin_compatible, zoom, refresh>();

}  // namespace

const TclWrapIXFloorplan::Table TclWrapIXFloorplan::table{rows};

}  // namespace TcltaskI
