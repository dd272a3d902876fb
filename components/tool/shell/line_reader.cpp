#include "shell/line_reader.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <clocale>
#include <cstdio>
#include <cstring>
#include <cwchar>
#include <string_view>
#include <vector>

namespace kelmarsh {

namespace {

constexpr int kHistoryLines = 1000;
constexpr std::size_t kMostListed = 200;

// What ends the word being completed: `$` and `:` belong to it (variables, qualified names).
constexpr std::string_view kWordBreaks = " \t\n\"[]{};";

std::string CommonPrefix(const std::vector<std::string>& words) {
    std::string common = words.front();
    for (const std::string& word : words) {
        const auto differ = std::mismatch(common.begin(), common.end(), word.begin(), word.end());
        common.erase(differ.first, common.end());
    }
    return common;
}

// The candidates in columns below the line, as many columns as the terminal is wide.
void ShowList(EditLine* editor, const std::vector<std::string>& words) {
    int width = 80;
    el_get(editor, EL_GETTC, "co", &width);
    std::size_t longest = 0;
    for (const std::string& word : words) longest = std::max(longest, word.size());
    const std::size_t column = longest + 2;
    const std::size_t columns = std::max<std::size_t>(1, static_cast<std::size_t>(std::max(width, 1)) / column);
    const std::size_t shown = std::min(words.size(), kMostListed);
    std::fputc('\n', stdout);
    for (std::size_t i = 0; i < shown; ++i) {
        if ((i + 1) % columns == 0 || i + 1 == shown)
            std::fprintf(stdout, "%s\n", words[i].c_str());
        else
            std::fprintf(stdout, "%-*s", static_cast<int>(column), words[i].c_str());
    }
    if (shown < words.size()) std::fprintf(stdout, "... and %zu more\n", words.size() - shown);
    std::fflush(stdout);
}

}  // namespace

LineReader::LineReader(Tcl_Interp* interp, std::string historyFile, int interruptFd)
    : m_completer(interp),
      m_historyFile(std::move(historyFile)),
      m_interruptFd(interruptFd),
      m_history(history_init(), &history_end),
      m_editor(nullptr, &el_end) {
    std::setlocale(LC_CTYPE, "");  // so that the editor takes a UTF-8 character as one
    m_editor.reset(el_init("kelmarsh", stdin, stdout, stderr));
    EditLine* editor = m_editor.get();
    if (editor == nullptr || m_history == nullptr) return;

    HistEvent event;
    history(m_history.get(), &event, H_SETSIZE, kHistoryLines);
    history(m_history.get(), &event, H_SETUNIQUE, 1);  // not the same command twice in a row
    // No file, or an empty one, is no history yet.
    struct stat status;
    if (!m_historyFile.empty() && stat(m_historyFile.c_str(), &status) == 0 && status.st_size > 0 &&
        history(m_history.get(), &event, H_LOAD, m_historyFile.c_str()) < 0)
        std::fprintf(stderr, "kelmarsh: cannot read the history file %s\n", m_historyFile.c_str());

    el_set(editor, EL_CLIENTDATA, this);
    el_set(editor, EL_EDITOR, "emacs");
    el_set(editor, EL_SIGNAL, 0);  // Ctrl-C is the shell's own: it must break the read
    el_set(editor, EL_PROMPT, &LineReader::Prompt);
    el_wset(editor, EL_GETCFN, &LineReader::GetChar);
    el_set(editor, EL_HIST, history, m_history.get());
    // The wide form: libedit keeps these names as given, where the narrow form copies them and
    // never frees the copies.
    el_wset(editor, EL_ADDFN, L"kelmarsh-complete", L"complete the word before the cursor", &LineReader::OnTab);
    el_set(editor, EL_BIND, "^I", "kelmarsh-complete", nullptr);
    el_source(editor, nullptr);  // the user's ~/.editrc may bind keys otherwise

    // `exit` ends the process from inside Tcl, past this object's end: the history is saved there too.
    Tcl_CreateExitHandler(&LineReader::OnExit, this);
}

LineReader::~LineReader() {
    Tcl_DeleteExitHandler(&LineReader::OnExit, this);
    Save();
}

void LineReader::OnExit(ClientData data) { static_cast<LineReader*>(data)->Save(); }

void LineReader::Save() {
    if (m_saved || m_historyFile.empty() || m_history == nullptr) return;
    m_saved = true;
    // A history file made here is the user's alone: commands may hold what others should not read.
    const int fd = open(m_historyFile.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0600);
    if (fd >= 0) close(fd);
    HistEvent event;
    errno = 0;
    if (history(m_history.get(), &event, H_SAVE, m_historyFile.c_str()) < 0)
        std::fprintf(stderr, "kelmarsh: cannot write the history file %s: %s\n", m_historyFile.c_str(),
                     std::strerror(errno != 0 ? errno : EIO));
}

char* LineReader::Prompt(EditLine* editor) {
    void* data = nullptr;
    el_get(editor, EL_CLIENTDATA, &data);
    return static_cast<LineReader*>(data)->m_prompt.data();
}

// The editor's reads of the terminal, which end at once when Ctrl-C came, wherever the editor was
// when it came: a signal alone breaks a read only while it waits. -1 then, 0 at the end of input.
int LineReader::GetChar(EditLine* editor, wchar_t* character) {
    void* data = nullptr;
    el_get(editor, EL_CLIENTDATA, &data);
    const int interruptFd = static_cast<LineReader*>(data)->m_interruptFd;
    std::mbstate_t state{};
    for (;;) {
        pollfd watched[2] = {{STDIN_FILENO, POLLIN, 0}, {interruptFd, POLLIN, 0}};
        if (poll(watched, interruptFd >= 0 ? 2 : 1, -1) < 0) {
            if (errno == EINTR) continue;  // Ctrl-C shows in the pipe
            return -1;
        }
        if (interruptFd >= 0 && (watched[1].revents & POLLIN) != 0) {
            errno = EINTR;
            return -1;
        }
        char byte;
        const ssize_t got = read(STDIN_FILENO, &byte, 1);
        if (got == 0) return 0;
        if (got < 0) {
            if (errno == EINTR || errno == EAGAIN) continue;
            return -1;
        }
        wchar_t decoded;
        const std::size_t used = std::mbrtowc(&decoded, &byte, 1, &state);
        if (used == static_cast<std::size_t>(-2)) continue;  // more bytes of one character to come
        if (used == static_cast<std::size_t>(-1)) {
            decoded = static_cast<unsigned char>(byte);  // not in the locale's encoding: the byte itself
            state = std::mbstate_t{};
        }
        *character = decoded;
        return 1;
    }
}

std::optional<std::string> LineReader::Read(const char* prompt, const std::string& pending) {
    if (m_editor == nullptr) return std::nullopt;
    m_prompt = prompt;
    m_pending = pending;
    // The terminal goes into editing mode before the prompt shows, not after: keys typed as soon as
    // the prompt is seen would otherwise meet the terminal's own line mode, which echoes them and
    // turns Ctrl-D into an end of input that editing mode then loses.
    el_set(m_editor.get(), EL_PREP_TERM, 1);
    int count = 0;
    const char* line = el_gets(m_editor.get(), &count);
    if (line == nullptr || count <= 0) {
        if (count < 0) el_reset(m_editor.get());  // interrupted: what was typed is dropped
        return std::nullopt;
    }
    std::string text(line, static_cast<std::size_t>(count));
    if (text.ends_with('\n')) text.pop_back();
    return text;
}

void LineReader::Remember(const std::string& command) {
    // Completion leaves a space behind a word; the history keeps the command without it.
    const std::size_t end = command.find_last_not_of(" \t\n");
    if (end == std::string::npos || m_history == nullptr) return;
    HistEvent event;
    history(m_history.get(), &event, H_ENTER, command.substr(0, end + 1).c_str());
}

unsigned char LineReader::OnTab(EditLine* editor, int) {
    void* data = nullptr;
    el_get(editor, EL_CLIENTDATA, &data);
    return static_cast<LineReader*>(data)->Complete(editor);
}

// Puts in what all candidates share, with a space when there is one alone (none behind a namespace
// or a folder, which go on being typed); lists them when nothing can be put in.
unsigned char LineReader::Complete(EditLine* editor) {
    const LineInfo* line = el_line(editor);
    const std::string_view typed(line->buffer, static_cast<std::size_t>(line->cursor - line->buffer));
    const std::size_t brk = typed.find_last_of(kWordBreaks);
    const std::size_t start = brk == std::string_view::npos ? 0 : brk + 1;
    const std::string_view word = typed.substr(start);
    const std::vector<std::string> words = m_completer.Complete(m_pending + std::string(typed.substr(0, start)), word);
    if (words.empty()) return CC_ERROR;  // the bell: nothing fits

    std::string insert = CommonPrefix(words).substr(word.size());
    if (words.size() == 1 && !words[0].ends_with("::") && !words[0].ends_with('/')) insert += ' ';
    if (!insert.empty()) {
        el_insertstr(editor, insert.c_str());
        return CC_REFRESH;
    }
    ShowList(editor, words);
    return CC_REDISPLAY;
}

}  // namespace kelmarsh
