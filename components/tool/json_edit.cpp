// A JSON text changed in place (json_edit.h says what is kept).
//
// The source text is walked only where `before` and `wanted` differ: an unchanged value is copied
// as its text without being looked at, so the walk costs what the change does, plus one scan over
// the siblings of each changed value. The scan is a loop, not a recursion, so that deep nesting in
// parts of the file that do not change costs no stack.
#include "json_edit.h"

#include <algorithm>
#include <cstdint>
#include <deque>
#include <map>
#include <optional>
#include <unordered_map>
#include <vector>

namespace kelmartool {

namespace {

using Json = nlohmann::ordered_json;

bool Blank(char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\r'; }

// One member of an object or element of an array in the source text.
struct Item {
    std::string key;        // of a member
    std::size_t lead = 0;   // where the blank text before it starts (behind the bracket or comma)
    std::size_t begin = 0;  // where the member's key or the element starts
    std::size_t value = 0;  // where the value starts
    std::size_t end = 0;    // just behind the value
    std::size_t after = 0;  // just behind the blank text that follows: the comma or closing bracket
};

// One item of the text being made: an item of the source, or a new value.
struct Piece {
    const Item* source = nullptr;  // null for a new one
    const Json* before = nullptr;  // what the source item holds, in the caller's form
    const Json* wanted = nullptr;
    std::string key;  // of a new member
};

class Editor {
public:
    explicit Editor(std::string_view text) : m_text(text) {
        m_start = text.substr(0, 3) == "\xEF\xBB\xBF" ? 3 : 0;  // the parser allows a byte order mark
        m_start = Skip(m_start);
        m_end = ValueEnd(m_start);
        m_newline = text.find("\r\n") != std::string_view::npos ? "\r\n" : "\n";
        m_oneLine = text.substr(m_start, m_end - m_start).find('\n') == std::string_view::npos;
        // The unit of indentation is that of the first indented line.
        for (std::size_t at = text.find('\n', m_start); at < m_end; at = text.find('\n', at + 1)) {
            std::size_t first = at + 1;
            while (first < m_end && (text[first] == ' ' || text[first] == '\t')) ++first;
            if (first > at + 1 && first < m_end && !Blank(text[first])) {
                m_unit = text.substr(at + 1, first - at - 1);
                break;
            }
        }
        if (m_text[m_start] == '{') {
            const auto members = Items(m_start);
            if (!members.empty()) {
                const std::size_t keyEnd = StringEnd(members.front().begin);
                m_colon = text.substr(keyEnd, members.front().value - keyEnd);
                if (m_colon.back() != ' ') m_space.clear();
            }
        }
    }

    std::size_t Edit(const Json& before, const Json& wanted, std::string& text) {
        std::string out;
        out.reserve(m_text.size());
        out.append(m_text.substr(0, m_start));
        Value(m_start, m_end, before, wanted, out);
        out.append(m_text.substr(m_end));
        text = std::move(out);
        return m_changes;
    }

private:
    std::string_view Span(std::size_t from, std::size_t to) const { return m_text.substr(from, to - from); }

    std::size_t Skip(std::size_t at) const {
        while (at < m_text.size() && Blank(m_text[at])) ++at;
        return at;
    }

    std::size_t StringEnd(std::size_t at) const {
        for (++at; at < m_text.size() && m_text[at] != '"'; ++at)
            if (m_text[at] == '\\') ++at;
        return at + 1;
    }

    std::size_t ValueEnd(std::size_t at) const {
        const char c = m_text[at];
        if (c == '"') return StringEnd(at);
        if (c == '{' || c == '[') {
            std::size_t depth = 0;
            for (; at < m_text.size(); ++at) {
                const char d = m_text[at];
                if (d == '"')
                    at = StringEnd(at) - 1;
                else if (d == '{' || d == '[')
                    ++depth;
                else if ((d == '}' || d == ']') && --depth == 0)
                    return at + 1;
            }
            return at;
        }
        while (at < m_text.size() && !Blank(m_text[at]) && m_text[at] != ',' && m_text[at] != ']' && m_text[at] != '}')
            ++at;
        return at;
    }

    // The members or elements of the object or array that starts at `begin`.
    std::vector<Item> Items(std::size_t begin) const {
        std::vector<Item> items;
        const bool object = m_text[begin] == '{';
        std::size_t at = Skip(begin + 1);
        if (m_text[at] == (object ? '}' : ']')) return items;
        std::size_t lead = begin + 1;
        for (;;) {
            Item item;
            item.lead = lead;
            item.begin = at;
            if (object) {
                const std::size_t keyEnd = StringEnd(at);
                const std::string_view quoted = Span(at, keyEnd);
                item.key = quoted.find('\\') == std::string_view::npos
                               ? std::string(quoted.substr(1, quoted.size() - 2))
                               : Json::parse(quoted).get<std::string>();
                at = Skip(Skip(keyEnd) + 1);  // behind the colon
            }
            item.value = at;
            item.end = ValueEnd(at);
            item.after = Skip(item.end);
            items.push_back(std::move(item));
            if (m_text[items.back().after] != ',') return items;
            lead = items.back().after + 1;
            at = Skip(lead);
        }
    }

    Json Parsed(const Item& item) const { return Json::parse(Span(item.value, item.end)); }

    // Whether the source element holds `value` (the caller's form of it may differ from the text).
    bool Holds(const Item& item, const Json& value) const {
        const std::string_view token = Span(item.value, item.end);
        if (value.is_string() && token.find('\\') == std::string_view::npos)
            return token.size() >= 2 && token.front() == '"' &&
                   token.substr(1, token.size() - 2) == value.get_ref<const std::string&>();
        return Parsed(item) == value;
    }

    // The indentation of the line that holds `at`.
    std::string LineIndent(std::size_t at) const {
        const std::size_t newline = m_text.rfind('\n', at);
        std::size_t first = newline == std::string_view::npos ? 0 : newline + 1;
        std::size_t last = first;
        while (last < at && (m_text[last] == ' ' || m_text[last] == '\t')) ++last;
        return std::string(Span(first, last));
    }

    // A new value: on one line (objects with a blank inside their braces when `pad`), or one item
    // a line below `indent`.
    void Format(const Json& value, const std::string& indent, bool oneLine, bool pad, std::string& out) const {
        if (!value.is_structured() || value.empty()) {
            out += value.dump();
            return;
        }
        const bool object = value.is_object();
        const std::string inner = indent + m_unit;
        out += object ? "{" : "[";
        if (oneLine && pad && object) out += ' ';
        for (auto it = value.begin(); it != value.end(); ++it) {
            if (it != value.begin()) out += oneLine ? "," + m_space : ",";
            if (!oneLine) out += m_newline + inner;
            if (object) out += Json(it.key()).dump() + m_colon;
            Format(*it, inner, oneLine, pad, out);
        }
        if (!oneLine) out += m_newline + indent;
        if (oneLine && pad && object) out += ' ';
        out += object ? '}' : ']';
    }

    void Value(std::size_t begin, std::size_t end, const Json& before, const Json& wanted, std::string& out) {
        if (before == wanted) {
            out.append(Span(begin, end));
        } else if (m_text[begin] == '{' && before.is_object() && wanted.is_object()) {
            Object(begin, end, before, wanted, out);
        } else if (m_text[begin] == '[' && before.is_array() && wanted.is_array()) {
            Array(begin, end, before, wanted, out);
        } else {
            ++m_changes;
            Format(wanted, LineIndent(begin), m_oneLine, false, out);
        }
    }

    void Object(std::size_t begin, std::size_t end, const Json& before, const Json& wanted, std::string& out) {
        const std::vector<Item> items = Items(begin);
        std::map<std::string, std::size_t, std::less<>> last;  // the item of a name; a repeated one counts last
        for (std::size_t i = 0; i < items.size(); ++i) last[items[i].key] = i;
        // Each new member goes behind the items of the members before it in `wanted`.
        std::vector<std::vector<const std::string*>> added(items.size() + 1);
        std::size_t behind = 0;
        for (auto it = wanted.begin(); it != wanted.end(); ++it) {
            if (auto found = last.find(it.key()); found != last.end()) {
                behind = std::max(behind, found->second + 1);
                continue;
            }
            auto old = before.find(it.key());
            if (old == before.end() || *old != it.value()) added[behind].push_back(&it.key());
        }
        std::deque<Json> parsed;  // what a member holds that `before` leaves out
        std::vector<Piece> pieces;
        const auto addNew = [&](std::size_t slot) {
            for (const std::string* key : added[slot]) {
                ++m_changes;
                pieces.push_back(Piece{nullptr, nullptr, &wanted.at(*key), *key});
            }
        };
        addNew(0);
        for (std::size_t i = 0; i < items.size(); ++i) {
            const Item& item = items[i];
            const auto want = wanted.find(item.key);
            const auto old = before.find(item.key);
            if (want == wanted.end() && old != before.end()) {
                if (last[item.key] == i) ++m_changes;  // removed, with any earlier member of its name
            } else if (want == wanted.end() || last[item.key] != i) {
                pieces.push_back(Piece{&item, nullptr, nullptr, {}});
            } else {
                const Json* was = old != before.end() ? &*old : &parsed.emplace_back(Parsed(item));
                pieces.push_back(Piece{&item, was, &*want, {}});
            }
            addNew(i + 1);
        }
        Assemble(begin, end, items, pieces, out);
    }

    void Array(std::size_t begin, std::size_t end, const Json& before, const Json& wanted, std::string& out) {
        const std::vector<Item> items = Items(begin);
        // The caller's elements stand for the source's one by one, unless the caller changed their
        // order or number (a set kept sorted): then the source's own values are matched.
        bool inOrder = items.size() == before.size();
        for (std::size_t i = 0; inOrder && i < items.size(); ++i)
            inOrder = !before[i].is_primitive() || Holds(items[i], before[i]);
        Json own;
        if (!inOrder) {
            own = Json::array();
            for (const Item& item : items) own.push_back(Parsed(item));
        }
        const Json& old = inOrder ? before : own;
        const std::size_t oldSize = old.size(), newSize = wanted.size();

        // The source element each wanted one comes from, or none: the unchanged ends first, then in
        // the middle an equal element, one of the same name, and the rest in order.
        std::vector<std::size_t> from(newSize, SIZE_MAX);
        std::vector<bool> used(oldSize, false);
        std::size_t head = 0, tail = 0;
        while (head < oldSize && head < newSize && old[head] == wanted[head]) {
            from[head] = head;
            used[head] = true;
            ++head;
        }
        while (tail < oldSize - head && tail < newSize - head &&
               old[oldSize - 1 - tail] == wanted[newSize - 1 - tail]) {
            from[newSize - 1 - tail] = oldSize - 1 - tail;
            used[oldSize - 1 - tail] = true;
            ++tail;
        }
        const auto nameOf = [](const Json& v) -> const std::string* {
            if (!v.is_object()) return nullptr;
            auto name = v.find("name");
            return name != v.end() && name->is_string() ? &name->get_ref<const std::string&>() : nullptr;
        };
        const auto pair = [&](auto keyOf) {
            std::unordered_map<std::string, std::deque<std::size_t>> free;
            for (std::size_t i = head; i < oldSize - tail; ++i)
                if (!used[i])
                    if (auto key = keyOf(old[i])) free[*key].push_back(i);
            if (free.empty()) return;  // nothing left to pair with: a run of new elements, say
            for (std::size_t j = head; j < newSize - tail; ++j) {
                if (from[j] != SIZE_MAX) continue;
                auto key = keyOf(wanted[j]);
                if (!key) continue;
                auto it = free.find(*key);
                if (it == free.end() || it->second.empty()) continue;
                from[j] = it->second.front();
                used[from[j]] = true;
                it->second.pop_front();
            }
        };
        pair([](const Json& v) { return std::optional<std::string>(v.dump()); });
        pair([&](const Json& v) {
            const std::string* name = nameOf(v);
            return name ? std::optional<std::string>(*name) : std::nullopt;
        });
        for (std::size_t i = head, j = head; i < oldSize - tail && j < newSize - tail;) {
            if (used[i] || nameOf(old[i])) {
                ++i;
            } else if (from[j] != SIZE_MAX || nameOf(wanted[j])) {
                ++j;
            } else {
                from[j] = i;
                used[i] = true;
            }
        }
        for (std::size_t i = 0; i < oldSize; ++i) m_changes += used[i] ? 0 : 1;
        std::vector<Piece> pieces;
        for (std::size_t j = 0; j < newSize; ++j) {
            if (from[j] == SIZE_MAX) {
                ++m_changes;
                pieces.push_back(Piece{nullptr, nullptr, &wanted[j], {}});
            } else {
                pieces.push_back(Piece{&items[from[j]], &old[from[j]], &wanted[j], {}});
            }
        }
        Assemble(begin, end, items, pieces, out);
    }

    // Writes the object or array of `pieces` in place of the one of `items` at [begin, end). The
    // k-th piece gets the blank text around the k-th item, so that a file's own way of breaking
    // lines (the first element beside the bracket, say) stays where it was.
    void Assemble(std::size_t begin, std::size_t end, const std::vector<Item>& items, const std::vector<Piece>& pieces,
                  std::string& out) {
        const char open = m_text[begin], close = m_text[end - 1];
        out += open;
        const std::size_t n = items.size(), m = pieces.size();
        const std::string indent = LineIndent(begin);
        for (std::size_t k = 0; k < m; ++k) {
            // The item whose place the piece takes, or the last one.
            const Item* like = n > 0 ? &items[std::min(k, n - 1)] : nullptr;
            std::string lead;
            if (like && (k == 0 || n > 1 || Span(like->lead, like->begin).find('\n') != std::string_view::npos))
                lead = Span(like->lead, like->begin);
            else if (like || m_oneLine)
                lead = k == 0 ? "" : m_space;  // beside the one item on its line, or in a file of one line
            else
                lead = m_newline + indent + m_unit;
            out += lead;
            const Piece& piece = pieces[k];
            if (piece.source && !piece.wanted) {
                out.append(Span(piece.source->begin, piece.source->end));
            } else if (piece.source) {
                out.append(Span(piece.source->begin, piece.source->value));
                Value(piece.source->value, piece.source->end, *piece.before, *piece.wanted, out);
            } else {
                if (open == '{') out += Json(piece.key).dump() + m_colon;
                // On a line of its own like its siblings, or on one line where they are: beside
                // others, or a sibling object or array written on one line.
                const std::size_t newline = lead.rfind('\n');
                const bool siblingOnOneLine = like && (m_text[like->value] == '{' || m_text[like->value] == '[') &&
                                              Span(like->value, like->end).find('\n') == std::string_view::npos;
                // A blank inside the braces where the sibling object, or the object itself, has one.
                const bool pad = like && m_text[like->value] == '{' ? m_text[like->value + 1] == ' '
                                                                    : open == '{' && m_text[begin + 1] == ' ';
                if (newline == std::string::npos || siblingOnOneLine)
                    Format(*piece.wanted, indent, true, pad, out);
                else
                    Format(*piece.wanted, lead.substr(newline + 1), false, false, out);
            }
            if (k + 1 < m) {
                if (n >= 2) out.append(Span(items[std::min(k, n - 2)].end, items[std::min(k, n - 2)].after));
                out += ',';
            } else if (n > 0) {
                out.append(Span(items[n - 1].end, items[n - 1].after));
            } else if (!m_oneLine) {
                out += m_newline + indent;
            }
        }
        out += close;
    }

    std::string_view m_text;
    std::size_t m_start = 0, m_end = 0;  // the top value
    std::string m_newline, m_unit = "  ", m_colon = ": ";
    std::string m_space = " ";  // behind a comma on one line: none in a file written without blanks
    bool m_oneLine = false;
    std::size_t m_changes = 0;
};

}  // namespace

std::size_t EditJson(std::string_view source, const nlohmann::ordered_json& before,
                     const nlohmann::ordered_json& wanted, std::string& text) {
    return Editor(source).Edit(before, wanted, text);
}

}  // namespace kelmartool
