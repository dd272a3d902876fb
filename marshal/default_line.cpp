// Setting a default variable without compiling and running its line on every call.
//
// The line "namespace eval <space> {variable <var>; set <var> <default>}" costs thousands of
// instructions, while what a script can see of it is small: the namespace (made when missing), a
// frame of that namespace one level below the caller, whose words are the line's, in which a
// command default runs and the variable's write traces run, and the variable's new value. This file
// does that work directly. It needs the call frame's words, the namespace's resolvers and the
// variable's record, which only Tcl's internal interface shows; that use stays in this file.
//
// A variable that nothing traces, links or resolves takes its new value in place; for a literal
// default no script runs at all, and no frame is pushed. Any other variable (a new one, a traced
// one, an array, a link, one behind a resolver) is declared and set by Tcl's own `variable` and
// `set` in the namespace's frame, and the caller reads it back, as after the line.
// A default that is not one literal word or one command of literal words runs the line itself.
#include "marshal/default_line.h"

#include <cstddef>
#include <cstring>
#include <optional>

#include "Port/StringBase.h"

#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wunused-parameter"
#pragma GCC diagnostic ignored "-Wmissing-field-initializers"
#include <tclInt.h>
#pragma GCC diagnostic pop

namespace TcltaskI {

namespace {

Tcl_Obj* Kept(const char* text, int length = -1) {
    Tcl_Obj* obj = Tcl_NewStringObj(text, length);
    Tcl_IncrRefCount(obj);
    return obj;
}

// Parses `text` as one command that takes all of it; false (and nothing to free) otherwise.
bool ParseWhole(Tcl_Parse& parse, const char* text, int length) {
    if (Tcl_ParseCommand(nullptr, text, length, 0, &parse) != TCL_OK) return false;
    if (parse.numWords > 0 && parse.commandStart + parse.commandSize == text + length) return true;
    Tcl_FreeParse(&parse);
    return false;
}

// The text of a simple word (braced, quoted or bare, without substitutions).
Tcl_Obj* SimpleWordValue(const Tcl_Token* word) {
    return word->numComponents == 1 ? Kept(word[1].start, word[1].size) : Kept("");
}

// A default that is one literal word gets its value; one that is one command of literal words, in
// brackets, gets the command's words. Any other leaves both empty.
void ParseDefault(DefaultLine& out, const char* text) {
    Tcl_Parse parse;
    if (!ParseWhole(parse, text, static_cast<int>(std::strlen(text)))) return;
    const Tcl_Token* word = parse.tokenPtr;
    if (parse.numWords != 1) {
        // Not one word: the line runs as it is.
    } else if (word->type == TCL_TOKEN_SIMPLE_WORD) {
        out.literal = SimpleWordValue(word);
    } else if (word->type == TCL_TOKEN_WORD && word->numComponents == 1 && word[1].type == TCL_TOKEN_COMMAND) {
        Tcl_Parse inner;
        if (ParseWhole(inner, word[1].start + 1, word[1].size - 2)) {
            std::vector<const Tcl_Token*> words;
            const Tcl_Token* token = inner.tokenPtr;
            for (int i = 0; i < inner.numWords; token += token->numComponents + 1, ++i)
                if (token->type == TCL_TOKEN_SIMPLE_WORD) words.push_back(token);
            if (static_cast<int>(words.size()) == inner.numWords)
                for (const Tcl_Token* simple : words) out.command.push_back(SimpleWordValue(simple));
            Tcl_FreeParse(&inner);
        }
    }
    Tcl_FreeParse(&parse);
}

// A frame of the namespace, as `namespace eval` pushes it, for as long as the object lives.
class NamespaceFrame {
public:
    NamespaceFrame(Tcl_Interp* interp, Tcl_Namespace* space, Tcl_Obj* const* words) : m_interp(interp) {
        Tcl_PushCallFrame(interp, &m_frame, space, 0);
        auto* frame = reinterpret_cast<CallFrame*>(&m_frame);
        frame->objc = 4;
        frame->objv = words;
    }
    NamespaceFrame(const NamespaceFrame&) = delete;
    NamespaceFrame& operator=(const NamespaceFrame&) = delete;
    ~NamespaceFrame() { Tcl_PopCallFrame(m_interp); }

private:
    Tcl_Interp* m_interp;
    Tcl_CallFrame m_frame;
};

// The namespace's variable `name` when `variable` and `set` would do nothing with it but replace its
// value: a defined scalar of the namespace that no trace watches, no link leads away from and no
// resolver may answer for. Otherwise null.
Var* PlainVariable(Tcl_Interp* interp, Tcl_Namespace* space, Tcl_Obj* name) {
    auto* ns = reinterpret_cast<Namespace*>(space);
    if (reinterpret_cast<Interp*>(interp)->resolverPtr != nullptr || ns->varResProc != nullptr ||
        ns->compiledVarResProc != nullptr)
        return nullptr;
    // The table's keys are Tcl values, compared by their text.
    Tcl_HashEntry* entry = Tcl_FindHashEntry(&ns->varTable.table, reinterpret_cast<const char*>(name));
    if (entry == nullptr) return nullptr;
    Var* var = reinterpret_cast<Var*>(reinterpret_cast<char*>(entry) - offsetof(VarInHash, entry));
    if (var->value.objPtr == nullptr) return nullptr;
    constexpr int kPlain = VAR_IN_HASHTABLE | VAR_NAMESPACE_VAR;
    return (var->flags & ~kPlain) == 0 && (var->flags & VAR_NAMESPACE_VAR) != 0 ? var : nullptr;
}

// `variable <var>` and `set <var> <value>` run as the commands they are, in the current frame.
int DeclareAndSet(Tcl_Interp* interp, Tcl_Obj* name, Tcl_Obj* value) {
    static thread_local Tcl_Obj* const variableWord = Kept("variable");
    static thread_local Tcl_Obj* const setWord = Kept("set");
    Tcl_Obj* declare[] = {variableWord, name};
    const int code = Tcl_EvalObjv(interp, 2, declare, 0);
    if (code != TCL_OK) return code;
    Tcl_Obj* set[] = {setWord, name, value};
    return Tcl_EvalObjv(interp, 3, set, 0);
}

}  // namespace

void MakeDefaultLine(DefaultLine& out, const char* className, const char* word, const Option& option, bool matched) {
    const Port_String variable = matched ? Port_String("__", option.name, "__") : Port_String(option.name);
    const Port_String space(className, "::", word);
    // The variable is declared in the namespace first: without that, Tcl would write a global variable
    // of the same name when one exists (plain names such as `in` or `name` of zoom), and the read-back
    // of the namespace variable would fail.
    Port_String body("variable ", variable.c_str(), "; ");
    body += Port_String("set ", variable.c_str(), " ", option.defaultText);
    const Port_String line("namespace eval ", space.c_str(), " {", body.c_str(), "}");
    out.space = Kept(space.c_str());
    out.name = Kept(variable.c_str());
    out.variable = Kept(Port_String(space.c_str(), "::", variable.c_str()).c_str());
    out.line = Kept(line.c_str());
    out.frameWords[0] = Kept("namespace");
    out.frameWords[1] = Kept("eval");
    out.frameWords[2] = out.space;
    out.frameWords[3] = Kept(body.c_str());
    ParseDefault(out, option.defaultText);
}

int SetDefault(Tcl_Interp* interp, const DefaultLine& line, Script::TclObjRef& value) {
    value = Script::TclObjRef();
    if (line.literal == nullptr && line.command.empty()) return Tcl_EvalObjEx(interp, line.line, 0);

    Tcl_Namespace* space = nullptr;
    if (TclGetNamespaceFromObj(interp, line.space, &space) != TCL_OK) {
        // Made when missing, as `namespace eval` makes it; the look-up's message is not the caller's.
        Tcl_ResetResult(interp);
        space = Tcl_CreateNamespace(interp, Tcl_GetString(line.space), nullptr, nullptr);
        if (space == nullptr) return TCL_ERROR;
    }
    // The frame is pushed only where a script may run in it: a command default, or a variable that
    // Tcl's own commands must set. A literal given to a plain variable runs nothing.
    std::optional<NamespaceFrame> frame;
    Script::TclObjRef got(line.literal);
    if (!line.command.empty()) {
        frame.emplace(interp, space, line.frameWords);
        const int code = Tcl_EvalObjv(interp, static_cast<int>(line.command.size()), line.command.data(), 0);
        if (code != TCL_OK) return code;
        got = Script::TclObjRef(Tcl_GetObjResult(interp));
    }
    if (Var* var = PlainVariable(interp, space, line.name)) {
        Tcl_Obj* old = var->value.objPtr;
        if (old != got.get()) {
            var->value.objPtr = got.get();
            Tcl_IncrRefCount(got.get());
            Tcl_DecrRefCount(old);
        }
        value = std::move(got);
        return TCL_OK;
    }
    if (!frame) frame.emplace(interp, space, line.frameWords);
    return DeclareAndSet(interp, line.name, got.get());
}

}  // namespace TcltaskI
