#include "shell/completion.h"

#include <algorithm>
#include <cctype>
#include <cstring>

namespace kelmarsh {

namespace {

// One command being read: its finished words and the word in progress. `closer` is the character
// that ends it inside a larger one: `]` for a command substitution, `}` for a braced script.
struct Context {
    std::vector<std::string> words;
    std::string word;
    bool inWord = false;
    bool inQuote = false;
    char closer = 0;
};

void EndWord(Context& context) {
    if (context.inWord) context.words.push_back(std::move(context.word));
    context.word.clear();
    context.inWord = false;
}

// The part of a word after its last `::`, the whole word when it has none.
std::string_view Tail(std::string_view name) {
    const std::size_t separator = name.rfind("::");
    return separator == std::string_view::npos ? name : name.substr(separator + 2);
}

// A plain variable reference such as $x or $::ns::x, whose value completion may read.
bool IsSimpleVariable(std::string_view word) {
    if (word.size() < 2 || word[0] != '$') return false;
    return std::all_of(word.begin() + 1, word.end(), [](unsigned char c) { return std::isalnum(c) || c == '_' || c == ':'; });
}

}  // namespace

std::vector<std::string> CommandWords(std::string_view text) {
    std::vector<Context> open(1);
    for (std::size_t i = 0; i < text.size(); ++i) {
        const char c = text[i];
        Context& context = open.back();
        if (c == '\\') {
            context.word += c;
            if (i + 1 < text.size()) context.word += text[++i];
            context.inWord = true;
        } else if (c == '[') {
            open.emplace_back().closer = ']';
        } else if ((c == ']' || c == '}') && c == context.closer) {
            open.pop_back();
            open.back().word += c == ']' ? "[]" : "{}";
            open.back().inWord = true;
        } else if (context.inQuote) {
            context.word += c;
            context.inQuote = c != '"';
        } else if (c == '{' && !context.inWord) {
            open.emplace_back().closer = '}';
        } else if (c == ' ' || c == '\t') {
            EndWord(context);
        } else if (c == '\n' || c == ';') {
            EndWord(context);
            context.words.clear();
        } else if (c == '#' && !context.inWord && context.words.empty()) {
            i = text.find('\n', i);
            if (i == std::string_view::npos) return {};  // in a comment: no command here
            --i;
        } else {
            if (c == '"' && !context.inWord) context.inQuote = true;
            context.word += c;
            context.inWord = true;
        }
    }
    return std::move(open.back().words);
}

std::vector<std::string> Completer::Complete(std::string_view before, std::string_view word) const {
    // Completion runs commands in the user's interpreter: what the user last saw stays as it was.
    Tcl_InterpState saved = Tcl_SaveInterpState(m_interp, TCL_OK);
    std::vector<std::string> words = CompleteNoSave(before, word);
    Tcl_RestoreInterpState(m_interp, saved);

    std::erase_if(words, [word](const std::string& w) { return !w.starts_with(word); });
    std::sort(words.begin(), words.end());
    words.erase(std::unique(words.begin(), words.end()), words.end());
    return words;
}

std::vector<std::string> Completer::CompleteNoSave(std::string_view before, std::string_view word) const {
    std::vector<std::string> out;
    if (word.starts_with('$')) {
        AddVariables(word.substr(1), out);
        for (std::string& name : out) name.insert(0, 1, '$');
        return out;
    }
    const std::vector<std::string> words = CommandWords(before);
    if (words.empty()) {
        AddCommands(word, out);
        return out;
    }
    const std::string help = HelpCommand();
    if (IsHelp(words[0])) {
        if (words.size() == 1) {
            // help answers with pairs of a root and what it is.
            const std::vector<std::string> roots = Call({help});
            for (std::size_t i = 0; roots.size() % 2 == 0 && i < roots.size(); i += 2) out.push_back(roots[i]);
        } else if (words.size() == 2) {
            out = Call({help, Target(words[1])});
        }
        return out;
    }
    bool known = false;
    const std::string target = Target(words[0]);
    std::vector<std::string> topics = Call({help, target}, &known);
    if (known && words.size() == 1)
        out = std::move(topics);
    else if (known && word.starts_with('-'))
        AddOptions(target, words[1], out);
    else if (word.starts_with(':'))
        AddCommands(word, out);
    else
        AddFiles(word, out);
    return out;
}

// Runs one command from its words at global level, its answer left in the interpreter's result.
bool Completer::Run(std::initializer_list<std::string_view> words) const {
    std::vector<Tcl_Obj*> objv;
    for (std::string_view word : words) {
        objv.push_back(Tcl_NewStringObj(word.data(), static_cast<int>(word.size())));
        Tcl_IncrRefCount(objv.back());
    }
    const int code = Tcl_EvalObjv(m_interp, static_cast<int>(objv.size()), objv.data(), TCL_EVAL_GLOBAL);
    for (Tcl_Obj* obj : objv) Tcl_DecrRefCount(obj);
    return code == TCL_OK;
}

// The words of the answer of one command; `ok` tells whether it ran, as an empty answer is one too.
std::vector<std::string> Completer::Call(std::initializer_list<std::string_view> words, bool* ok) const {
    const bool ran = Run(words);
    if (ok != nullptr) *ok = ran;
    std::vector<std::string> result;
    int count = 0;
    Tcl_Obj** elements = nullptr;
    if (!ran || Tcl_ListObjGetElements(nullptr, Tcl_GetObjResult(m_interp), &count, &elements) != TCL_OK) return result;
    for (int i = 0; i < count; ++i) result.emplace_back(Tcl_GetString(elements[i]));
    return result;
}

// The tool's help, asked under its own name where it has one, so that a `help` of the user's own
// does not answer.
std::string Completer::HelpCommand() const {
    Tcl_CmdInfo info;
    return Tcl_GetCommandInfo(m_interp, "::kelmartool::help", &info) != 0 ? "::kelmartool::help" : "::help";
}

bool Completer::IsHelp(const std::string& command) const {
    if (command == "help") return true;
    bool ok = false;
    const std::vector<std::string> origin = Call({"namespace", "origin", command}, &ok);
    return ok && origin == Call({"namespace", "origin", HelpCommand()});
}

// What help is asked about for a command word: the object word a variable holds for `$coll`.
std::string Completer::Target(const std::string& word) const {
    if (!IsSimpleVariable(word)) return word;
    const char* value = Tcl_GetVar2(m_interp, word.c_str() + 1, nullptr, TCL_GLOBAL_ONLY);
    return value != nullptr ? value : word;
}

// Commands and namespaces, the way the typed word names them: `se` gives `set` and `search`,
// `::kelmar::IC` gives `::kelmar::ICollection3`, `kelmart` gives `kelmartool::`.
void Completer::AddCommands(std::string_view word, std::vector<std::string>& out) const {
    AddNames("commands", word, out);
}

// Variables and namespaces, named as AddCommands names commands; `name` is the word without its `$`.
void Completer::AddVariables(std::string_view name, std::vector<std::string>& out) const {
    AddNames("vars", name, out);
}

// The names `info KIND` knows and the namespaces, in the namespace the word names, qualified as in
// the word. A word without `::` is looked up from the global namespace, where the prompt runs.
void Completer::AddNames(const char* kind, std::string_view word, std::vector<std::string>& out) const {
    const std::size_t separator = word.rfind("::");
    const bool qualified = separator != std::string_view::npos;
    const std::string parent(qualified ? word.substr(0, separator) : "");
    const std::string qualifier = qualified ? parent + "::" : "";
    const std::vector<std::string> names = qualified ? Call({"info", kind, parent + "::*"}) : Call({"info", kind});
    for (const std::string& name : names) out.push_back(qualifier + std::string(Tail(name)));
    for (const std::string& child : Call({"namespace", "children", parent.empty() ? "::" : parent}))
        out.push_back(qualifier + std::string(Tail(child)) + "::");
}

// The options of one command, read from its usage line, where each stands as `?-name`.
void Completer::AddOptions(const std::string& target, const std::string& command, std::vector<std::string>& out) const {
    if (!Run({HelpCommand(), target, command})) return;
    const std::string usage = Tcl_GetStringResult(m_interp);
    for (std::size_t at = usage.find("?-"); at != std::string::npos; at = usage.find("?-", at + 2)) {
        std::size_t end = at + 2;
        while (end < usage.size() && (std::isalnum(static_cast<unsigned char>(usage[end])) || usage[end] == '_')) ++end;
        if (end > at + 2) out.push_back(usage.substr(at + 1, end - at - 1));
    }
}

// Files and folders whose names begin with the word, a folder with a / behind it.
void Completer::AddFiles(std::string_view word, std::vector<std::string>& out) const {
    std::string pattern;
    for (char c : word) {
        if (std::strchr("*?[]{}\\", c) != nullptr) pattern += '\\';
        pattern += c;
    }
    pattern += '*';
    const std::vector<std::string> folders = Call({"glob", "-nocomplain", "-types", "d", "--", pattern});
    for (std::string& path : Call({"glob", "-nocomplain", "--", pattern})) {
        if (std::find(folders.begin(), folders.end(), path) != folders.end()) path += '/';
        out.push_back(std::move(path));
    }
}

}  // namespace kelmarsh
