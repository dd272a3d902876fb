// Tab completion at the kelmarsh prompt, from what the interpreter knows at the moment of the Tab:
// its commands, namespaces and variables, and the tool's own help, which knows the roots, the command
// words of every root and object, and the options in each command's usage line; file names where
// none of these applies.
#pragma once

#include <tcl.h>

#include <string>
#include <string_view>
#include <vector>

namespace kelmarsh {

// The words of the command that the end of `text` stands in, before the word being typed: a command
// begins at the start, after a newline or `;`, after an open `[`, and after an open brace at the
// start of a word (most such braces hold a script). A bracketed or braced part of a word is kept
// as "[]" or "{}", which names no command.
std::vector<std::string> CommandWords(std::string_view text);

class Completer {
public:
    explicit Completer(Tcl_Interp* interp) : m_interp(interp) {}

    // What may stand for `word`, typed after `before` (the earlier lines of the same command too):
    // sorted, each once, each beginning with `word`. The interpreter's result, errorInfo and
    // errorCode are as they were afterwards.
    std::vector<std::string> Complete(std::string_view before, std::string_view word) const;

private:
    std::vector<std::string> CompleteNoSave(std::string_view before, std::string_view word) const;
    bool Run(std::initializer_list<std::string_view> words) const;
    std::vector<std::string> Call(std::initializer_list<std::string_view> words, bool* ok = nullptr) const;
    std::string HelpCommand() const;
    bool IsHelp(const std::string& command) const;
    std::string Target(const std::string& word) const;
    void AddCommands(std::string_view word, std::vector<std::string>& out) const;
    void AddVariables(std::string_view word, std::vector<std::string>& out) const;
    void AddNames(const char* kind, std::string_view word, std::vector<std::string>& out) const;
    void AddFiles(std::string_view word, std::vector<std::string>& out) const;
    void AddOptions(const std::string& target, const std::string& command, std::vector<std::string>& out) const;

    Tcl_Interp* m_interp;
};

}  // namespace kelmarsh
