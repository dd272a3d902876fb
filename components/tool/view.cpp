// The graphical view: a viewport over the device in site units, with a history that zoom and pan
// extend and next and previous walk. Columns grow to the right, rows grow upwards.
#include <algorithm>
#include <cmath>
#include <optional>

#include "TcltaskI/IGraphicalView.h"
#include "component.h"
#include "property.h"
#include "roots.h"

namespace kelmartool {

namespace {

struct Box {
    double x0, y0, x1, y1;  // x1, y1 exclusive
    void Cover(const Box& o) {
        x0 = std::min(x0, o.x0), y0 = std::min(y0, o.y0), x1 = std::max(x1, o.x1), y1 = std::max(y1, o.y1);
    }
};

std::optional<Box> SiteBox(const Design& d, const std::string& site) {
    auto s = d.device.ParseSite(site);
    if (!s) return std::nullopt;
    return Box{double(s->x), double(s->y), double(s->x + 1), double(s->y + 1)};
}

// Where an object lies on the device; nothing for an unplaced one.
std::optional<Box> BoxOf(const Design& d, const std::string& name) {
    const auto ref = d.Find(name);
    if (!ref) return std::nullopt;
    switch (ref->kind) {
        case Kind::Cell: return SiteBox(d, d.cells[ref->index].site);
        case Kind::Port: return SiteBox(d, d.ports[ref->index].site);
        case Kind::Site: return SiteBox(d, name);
        case Kind::Bank: {
            const Bank& b = d.device.banks[ref->index];
            return Box{double(b.x0), double(b.y0), double(b.x1 + 1), double(b.y1 + 1)};
        }
        case Kind::Clock: {
            const std::string& net = d.clocks[ref->index].net;
            return net.empty() ? std::nullopt : BoxOf(d, net);
        }
        case Kind::Net: {
            const Net& n = d.nets[ref->index];
            std::optional<Box> box = BoxOf(d, n.driver);
            for (const std::string& load : n.loads)
                if (auto b = BoxOf(d, load)) box ? box->Cover(*b) : void(box = b);
            return box;
        }
    }
    return std::nullopt;
}

std::optional<Box> BoxOfAll(const Design& d, const std::vector<std::string>& names) {
    std::optional<Box> box;
    for (const std::string& n : names)
        if (auto b = BoxOf(d, n)) box ? box->Cover(*b) : void(box = b);
    return box;
}

// A coordinate or delta a script gives lies within a billion sites of the origin: far beyond any
// device (at most 100000 sites a side), and near enough that the view's sums, differences and
// halves stay finite, whatever zoom -in or -out does with them afterwards.
constexpr double kFarthest = 1e9;

enum class Read { Numbers, NotNumbers, TooFar };

// The numbers of a property's value: exactly `count` finite numbers, each within kFarthest.
Read Numbers(const TcltaskI::IGraphicalView::Prop& p, std::size_t count, std::vector<double>& out) {
    TclValue value = ValueOf(p);
    int n = 0;
    Tcl_Obj** items = nullptr;
    if (!value || Tcl_ListObjGetElements(nullptr, value.get(), &n, &items) != TCL_OK || std::size_t(n) != count)
        return Read::NotNumbers;
    out.clear();
    for (int i = 0; i < n; ++i) {
        double v = 0;
        if (Tcl_GetDoubleFromObj(nullptr, items[i], &v) != TCL_OK) return Read::NotNumbers;
        out.push_back(v);
    }
    for (double v : out)
        if (!(std::fabs(v) <= kFarthest)) return Read::TooFar;  // inf and NaN too
    return Read::Numbers;
}

bool Given(const TcltaskI::IGraphicalView::Prop& p) { return p && !IsNil(TextOf(p)); }

class View final : public Component<TcltaskI::IGraphicalView> {
public:
    explicit View(const StatePtr& state) : m_state(state) {}

    CommonI::RESULT zoom(bool full, bool selection, bool in, bool out, bool detailed, bool last, const Prop& name,
                         const Prop& center, const Prop& range, const Prop& xrange, const Prop& yrange, Out& result,
                         Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        const Design* d = m_state->CurrentDesign();
        if (d == nullptr) return Refuse(*m_state, message, Refusal::NoProject, kNoProject);
        if (int(full) + int(selection) + int(last) + int(Given(name)) + int(Given(range)) > 1)
            return Refuse(*m_state, message, Refusal::Value,
                          "zoom takes at most one of -full, -selection, -last, -name and -range");
        if (int(in) + int(out) + int(detailed) > 1)
            return Refuse(*m_state, message, Refusal::Value, "zoom takes at most one of -in, -out and -detailed");

        Viewport v = Shown();
        if (full) v = Whole(*d);
        if (selection) {
            auto box = BoxOfAll(*d, m_state->selection);
            if (!box)
                return Refuse(*m_state, message, Refusal::State, "the selection holds no placed object to zoom to");
            v = FromBox(*box);
        }
        if (last) {
            if (m_state->view.position == 0)
                return Refuse(*m_state, message, Refusal::State, "there is no earlier view to zoom back to");
            v = m_state->view.history[m_state->view.position - 1];
        }
        if (Given(name)) {
            std::vector<std::string> names;
            if (!Resolve(name, names, message)) return 0;
            auto box = BoxOfAll(*d, names);
            if (!box)
                return Refuse(*m_state, message, Refusal::Value, "'" + TextOf(name) + "' is not placed on the device");
            v = FromBox(*box);
        }
        std::vector<double> n;
        if (Given(range)) {
            if (!Need(range, 4, "-range", "four numbers {X0 Y0 X1 Y1}", n, message)) return 0;
            v = FromBox(Box{std::min(n[0], n[2]), std::min(n[1], n[3]), std::max(n[0], n[2]), std::max(n[1], n[3])});
        }
        if (Given(xrange)) {
            if (!Need(xrange, 2, "-xrange", "two numbers {X0 X1}", n, message)) return 0;
            v.x = std::min(n[0], n[1]), v.width = std::fabs(n[1] - n[0]);
        }
        if (Given(yrange)) {
            if (!Need(yrange, 2, "-yrange", "two numbers {Y0 Y1}", n, message)) return 0;
            v.y = std::min(n[0], n[1]), v.height = std::fabs(n[1] - n[0]);
        }
        if (Given(center)) {
            if (!Need(center, 2, "-center", "two numbers {X Y}", n, message)) return 0;
            v.x = n[0] - v.width / 2, v.y = n[1] - v.height / 2;
        }
        const double factor = Setting("zoom_factor", 2.0);
        if (in) Scale(v, 1.0 / factor);
        if (out) Scale(v, factor);
        if (detailed) Scale(v, std::min(1.0, 4.0 / std::max(v.width, v.height)));
        return Show(*d, v, result, message);
    }

    CommonI::RESULT pan(bool left, bool right, bool up, bool down, bool top, bool bottom, bool farleft, bool farright,
                        const Prop& percentage, const Prop& delta, const Prop& name, Out& result,
                        Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        const Design* d = m_state->CurrentDesign();
        if (d == nullptr) return Refuse(*m_state, message, Refusal::NoProject, kNoProject);
        if ((left && right) || (up && down) || (top && bottom) || (farleft && farright))
            return Refuse(*m_state, message, Refusal::Value, "pan cannot move both ways at once");
        double percent = Setting("pan_percentage", 50.0);
        if (Given(percentage)) {
            std::vector<double> p;
            if (Numbers(percentage, 1, p) != Read::Numbers || p[0] <= 0 || p[0] > 1000)
                return Refuse(
                    *m_state, message, Refusal::Value,
                    "-percentage expects a number above 0 and at most 1000, not '" + TextOf(percentage) + "'");
            percent = p[0];
        }
        Viewport v = Shown();
        const double dx = v.width * percent / 100.0, dy = v.height * percent / 100.0;
        if (left) v.x -= dx;
        if (right) v.x += dx;
        if (up) v.y += dy;
        if (down) v.y -= dy;
        if (top) v.y = d->device.rows - v.height;
        if (bottom) v.y = 0;
        if (farleft) v.x = 0;
        if (farright) v.x = d->device.columns - v.width;
        if (Given(delta)) {
            std::vector<double> n;
            if (!Need(delta, 2, "-delta", "two numbers {DX DY}", n, message)) return 0;
            v.x += n[0], v.y += n[1];
        }
        if (Given(name)) {
            std::vector<std::string> names;
            if (!Resolve(name, names, message)) return 0;
            auto box = BoxOfAll(*d, names);
            if (!box)
                return Refuse(*m_state, message, Refusal::Value, "'" + TextOf(name) + "' is not placed on the device");
            v.x = (box->x0 + box->x1) / 2 - v.width / 2, v.y = (box->y0 + box->y1) / 2 - v.height / 2;
        }
        return Show(*d, v, result, message);
    }

    CommonI::RESULT next(Out& result, Msg& message) override { return Step(+1, result, message); }
    CommonI::RESULT previous(Out& result, Msg& message) override { return Step(-1, result, message); }

private:
    static Viewport Whole(const Design& d) { return {0, 0, double(d.device.columns), double(d.device.rows)}; }
    static Viewport FromBox(const Box& b) { return {b.x0, b.y0, b.x1 - b.x0, b.y1 - b.y0}; }
    static void Scale(Viewport& v, double f) {
        const double cx = v.x + v.width / 2, cy = v.y + v.height / 2;
        v.width *= f, v.height *= f;
        v.x = cx - v.width / 2, v.y = cy - v.height / 2;
    }

    // The numbers an option gives, or false with the failure said in `message`.
    bool Need(const Prop& p, std::size_t count, const char* option, const char* what, std::vector<double>& n,
              Msg& message) const {
        const ToolState& state = *m_state;
        switch (Numbers(p, count, n)) {
            case Read::Numbers: return true;
            case Read::NotNumbers:
                return Refuse(state, message, Refusal::Value, std::string(option) + " expects " + what) != 0;
            case Read::TooFar: break;
        }
        return Refuse(state, message, Refusal::Value,
                      std::string(option) + " expects numbers from -" + std::to_string(std::lround(kFarthest)) +
                          " to " + std::to_string(std::lround(kFarthest)) + ", not '" + TextOf(p) + "'") != 0;
    }

    double Setting(const char* name, double fallback) const { return m_state->settings.Number(name, fallback); }

    Viewport Shown() const {
        const ViewState& view = m_state->view;
        return view.history.empty() ? Whole(*m_state->CurrentDesign()) : view.history[view.position];
    }

    bool Resolve(const Prop& p, std::vector<std::string>& names, Msg& message) const {
        std::string error;
        TclValue value = ValueOf(p);
        if (ResolveObjects(*m_state, value.get(), names, error)) return true;
        return Fail(message, error);
    }

    // Keeps the viewport on the device, at least one site and at most the device large, then
    // makes it the one shown; a view that differs from the shown one starts a new history branch.
    CommonI::RESULT Show(const Design& d, Viewport v, Out& result, Msg& message) {
        const double columns = d.device.columns, rows = d.device.rows;
        v.width = std::clamp(v.width, 1.0, columns);
        v.height = std::clamp(v.height, 1.0, rows);
        v.x = std::clamp(v.x, 0.0, columns - v.width);
        v.y = std::clamp(v.y, 0.0, rows - v.height);
        ViewState& view = m_state->view;
        if (view.history.empty()) view.history.push_back(Whole(d));
        if (!(v == view.history[view.position])) {
            view.history.resize(view.position + 1);
            view.history.push_back(v);
            view.position = view.history.size() - 1;
            m_state->Changed();
        }
        return Answer(Value(v), result, message);
    }

    CommonI::RESULT Step(int direction, Out& result, Msg& message) {
        if (!Alive(*m_state, message)) return 0;
        if (m_state->CurrentDesign() == nullptr) return Refuse(*m_state, message, Refusal::NoProject, kNoProject);
        ViewState& view = m_state->view;
        if (direction < 0 && view.position == 0)
            return Refuse(*m_state, message, Refusal::State, "there is no previous view");
        if (direction > 0 && view.position + 1 >= view.history.size())
            return Refuse(*m_state, message, Refusal::State, "there is no next view");
        view.position = direction < 0 ? view.position - 1 : view.position + 1;
        m_state->Changed();
        return Answer(Value(view.history[view.position]), result, message);
    }

    static Tcl_Obj* Value(const Viewport& v) {
        DictBuilder dict;
        dict.Add("x", v.x).Add("y", v.y).Add("width", v.width).Add("height", v.height);
        return dict.Take();
    }

    StatePtr m_state;
};

}  // namespace

CitI::IInterface* NewView(const StatePtr& state) { return static_cast<TcltaskI::IGraphicalView*>(new View(state)); }

}  // namespace kelmartool
