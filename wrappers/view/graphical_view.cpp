// The commands of the graphical view: zoom and pan are switch methods whose options are spelled in
// full; next and previous take no word at all. Count messages in the signature form.
#include "package/static_init.h"
#include "wrappers/classes.h"

namespace TcltaskI {
namespace {

using I = IGraphicalView;
constexpr auto zoom = Switch("zoom", 0, "UtilI::MITclProperty zoom ", &I::zoom,
                             Option{"full", "false"}, Option{"selection", "false"}, Option{"in", "false"},
                             Option{"out", "false"}, Option{"detailed", "false"}, Option{"last", "false"},
                             Option{"name", "(nil)"}, Option{"center", "{nil}"}, Option{"range", "{nil}"},
                             Option{"xrange", "{nil}"}, Option{"yrange", "{nil}"});
constexpr auto pan = Switch("pan", 0, "UtilI::MITclProperty pan ", &I::pan,
                            Option{"left", "false"}, Option{"right", "false"}, Option{"up", "false"},
                            Option{"down", "false"}, Option{"top", "false"}, Option{"bottom", "false"},
                            Option{"farleft", "false"}, Option{"farright", "false"},
                            Option{"percentage", "(nil)"}, Option{"delta", "{nil}"}, Option{"name", "(nil)"});
constexpr auto next = Switch("next", 0, "UtilI::MITclProperty next ", &I::next);
constexpr auto previous = Switch("previous", 0, "UtilI::MITclProperty previous ", &I::previous);

using W = TclWrapIGraphicalView;
constexpr auto rows = W::Rows<zoom, pan, next, previous>();

}  // namespace

const TclWrapIGraphicalView::Table TclWrapIGraphicalView::table{rows};

}  // namespace TcltaskI
