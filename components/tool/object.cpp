// Questions about one design object: its name, its kind and its properties.
#include <array>

#include "TcltaskI/IObject.h"
#include "component.h"
#include "property.h"
#include "roots.h"

namespace kelmartool {

namespace {

struct Descriptor {
    const char* name;
    const char* type;
    const char* description;
};

// What the built-in properties of each kind mean; a property of the design file that is not
// listed here is a string given by the file.
constexpr std::array kDescriptors{
    Descriptor{"name", "string", "the object's name"},
    Descriptor{"type", "string", "the kind of the object"},
    Descriptor{"cell_type", "string", "the cell's library type, e.g. LUT or FF"},
    Descriptor{"site", "site", "the site the object is placed on; empty while unplaced"},
    Descriptor{"delay", "double", "delay in ns: of a cell from input to output, of a net from driver to loads"},
    Descriptor{"sequential", "bool", "whether the cell starts and ends timing paths"},
    Descriptor{"setup", "double", "setup time of a sequential cell in ns"},
    Descriptor{"clock", "clock", "the clock of a sequential cell"},
    Descriptor{"input_nets", "list", "nets that the cell loads"},
    Descriptor{"output_nets", "list", "nets that the cell drives"},
    Descriptor{"driver", "object", "the cell or input port that drives the net"},
    Descriptor{"loads", "list", "the cells and output ports the net drives"},
    Descriptor{"fanout", "int", "the number of loads of the net"},
    Descriptor{"direction", "string", "in or out"},
    Descriptor{"standard", "string", "the I/O standard of the port"},
    Descriptor{"bank", "bank", "the bank that holds the site"},
    Descriptor{"period", "double", "the clock period in ns"},
    Descriptor{"frequency_mhz", "double", "the clock frequency in MHz"},
    Descriptor{"net", "net", "the net the clock drives"},
    Descriptor{"x0", "int", "first column of the bank"},
    Descriptor{"y0", "int", "first row of the bank"},
    Descriptor{"x1", "int", "last column of the bank"},
    Descriptor{"y1", "int", "last row of the bank"},
    Descriptor{"sso_limit", "int", "outputs the bank may switch at once"},
    Descriptor{"sites", "int", "the number of sites of the bank"},
    Descriptor{"x", "int", "the column of the site"},
    Descriptor{"y", "int", "the row of the site"},
    Descriptor{"occupants", "list", "the cells and ports placed on the site"},
    Descriptor{"prohibited", "bool", "whether the floorplan forbids the site"},
};

const Descriptor* DescriptorOf(const std::string& property) {
    for (const Descriptor& d : kDescriptors)
        if (property == d.name) return &d;
    return nullptr;
}

class ObjectQuery final : public Component<TcltaskI::IObject> {
public:
    explicit ObjectQuery(const StatePtr& state) : m_state(state) {}

    CommonI::RESULT name(const Prop& object, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        std::string found;
        if (!One(object, found, message)) return 0;
        return Answer(NewText(found), result, message);
    }

    CommonI::RESULT type(const Prop& object, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        std::string found;
        if (!One(object, found, message)) return 0;
        return Answer(NewText(m_state->CurrentDesign()->TypeOf(found)), result, message);
    }

    CommonI::RESULT get(const Prop& object, const Str& property, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        std::string found;
        if (!One(object, found, message)) return 0;
        const std::optional<std::string> value = m_state->CurrentDesign()->PropertyOf(found, property.c_str());
        if (!value)
            return Refuse(*m_state, message, Refusal::Unknown, {"PROPERTY", property.c_str()},
                          "object '" + found + "' has no property '" + property.c_str() + "'");
        return Answer(NewText(*value), result, message);
    }

    CommonI::RESULT properties(const Prop& object, bool descriptors, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        std::string found;
        if (!One(object, found, message)) return 0;
        const Properties all = *m_state->CurrentDesign()->PropertiesOf(found);
        if (!descriptors) {
            DictBuilder dict;
            for (const auto& [key, value] : all) dict.Add(key, value);
            return Answer(dict.Take(), result, message);
        }
        Tcl_Obj* list = Tcl_NewListObj(0, nullptr);
        for (const auto& [key, value] : all) {
            const Descriptor* d = DescriptorOf(key);
            DictBuilder entry;
            entry.Add("name", key)
                .Add("type", d ? d->type : "string")
                .Add("description", d ? d->description : "a property given by the design file");
            Tcl_ListObjAppendElement(nullptr, list, entry.Take());
        }
        return Answer(list, result, message);
    }

private:
    // The one object a word names: a plain name, or a collection or list that holds exactly one.
    bool One(const Prop& object, std::string& found, Msg& message) const {
        const Design* design = m_state->CurrentDesign();
        if (design == nullptr) return Refuse(*m_state, message, Refusal::NoProject, kNoProject);
        const std::string text = TextOf(object);
        if (design->Find(text)) {
            found = text;
            return true;
        }
        std::vector<std::string> names;
        std::string error;
        TclValue value(NewText(text));
        if (!ResolveObjects(*m_state, value.get(), names, error)) return Fail(message, error);
        if (names.size() != 1)
            return Refuse(*m_state, message, Refusal::Value,
                          "expected one object, but '" + text + "' names " + std::to_string(names.size()));
        found = names.front();
        return true;
    }

    StatePtr m_state;
};

}  // namespace

CitI::IInterface* NewObjectQuery(const StatePtr& state) {
    return static_cast<TcltaskI::IObject*>(new ObjectQuery(state));
}

}  // namespace kelmartool
