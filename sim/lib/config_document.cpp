#include "config_document.h"

#include <algorithm>
#include <cstdint>
#include <span>
#include <utility>

namespace {

constexpr std::size_t kNone = std::string_view::npos;

bool is_blank(char c)
{
    return c == ' ' || c == '\t' || c == '\n' || c == '\r';
}

bool only_blanks(std::string_view text)
{
    for (const char c : text) {
        if (!is_blank(c))
            return false;
    }
    return true;
}

// Names start with a letter, "_", ":" or a byte of a multibyte character.
bool is_name_start(char c)
{
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_' || c == ':' || static_cast<unsigned char>(c) >= 0x80;
}

bool is_name_char(char c)
{
    return is_name_start(c) || (c >= '0' && c <= '9') || c == '-' || c == '.';
}

// The name at `at`, which then points past it; empty when there is none.
std::string_view read_name(std::string_view text, std::size_t& at)
{
    const std::size_t start = at;
    if (at < text.size() && is_name_start(text[at])) {
        while (at < text.size() && is_name_char(text[at]))
            ++at;
    }
    return text.substr(start, at - start);
}

// Skips blanks from `at`; true when there was one.
bool skip_blanks(std::string_view text, std::size_t& at)
{
    const std::size_t start = at;
    while (at < text.size() && is_blank(text[at]))
        ++at;
    return at > start;
}

// The next name of a slash path ("/system_mgr/nfs/enable"), taken off it; empty at the
// path's end. Empty components are skipped.
std::string_view next_name(std::string_view& path)
{
    while (path.starts_with('/'))
        path.remove_prefix(1);
    const std::string_view name = path.substr(0, path.find('/'));
    path.remove_prefix(name.size());
    return name;
}

int digit_value(char c, bool hex)
{
    if (c >= '0' && c <= '9')
        return c - '0';
    if (hex && c >= 'a' && c <= 'f')
        return c - 'a' + 10;
    if (hex && c >= 'A' && c <= 'F')
        return c - 'A' + 10;
    return -1;
}

struct Reference {
    std::size_t length;
    std::uint32_t code;
};

// A character reference ("&#65;", "&#x41;") at the start of `text`. Its number is
// taken modulo 2^32, as the common readers take it.
std::optional<Reference> character_reference(std::string_view text)
{
    if (!text.starts_with("&#"))
        return std::nullopt;
    std::size_t at = 2;
    const bool hex = at < text.size() && text[at] == 'x';
    if (hex)
        ++at;
    const std::size_t digits = at;
    std::uint32_t code = 0;
    for (int digit = 0; at < text.size() && (digit = digit_value(text[at], hex)) >= 0; ++at)
        code = code * (hex ? 16u : 10u) + static_cast<std::uint32_t>(digit);
    if (at == digits || at == text.size() || text[at] != ';')
        return std::nullopt;
    return Reference{at + 1, code};
}

// A code point in UTF-8. One past the last of Unicode still takes four bytes, its lead
// byte the low eight bits of what the pattern gives: the bytes the common readers make.
void append_utf8(std::string& out, std::uint32_t code)
{
    const auto byte = [&out](std::uint32_t bits) { out += static_cast<char>(static_cast<unsigned char>(bits & 0xFF)); };
    if (code < 0x80) {
        byte(code);
    } else if (code < 0x800) {
        byte(0xC0 | code >> 6);
        byte(0x80 | (code & 0x3F));
    } else if (code < 0x10000) {
        byte(0xE0 | code >> 12);
        byte(0x80 | (code >> 6 & 0x3F));
        byte(0x80 | (code & 0x3F));
    } else {
        byte(0xF0 | code >> 18);
        byte(0x80 | (code >> 12 & 0x3F));
        byte(0x80 | (code >> 6 & 0x3F));
        byte(0x80 | (code & 0x3F));
    }
}

enum class Content { Text, Cdata, Attribute };

// The value of a piece of the file: a line end (CR LF, or CR alone) is LF; in texts and
// attributes the five named references and character references are replaced (any
// other "&" stays as it is); in an attribute every blank is a space.
std::string decode(std::string_view raw, Content content)
{
    static constexpr std::pair<std::string_view, char> kNamed[] = {
        {"&lt;", '<'}, {"&gt;", '>'}, {"&amp;", '&'}, {"&quot;", '"'}, {"&apos;", '\''}};
    std::string value;
    value.reserve(raw.size());
    for (std::size_t at = 0; at < raw.size();) {
        const char c = raw[at];
        if (c == '\r' || ((c == '\n' || c == '\t') && content == Content::Attribute)) {
            value += content == Content::Attribute ? ' ' : '\n';
            at += c == '\r' && raw.substr(at + 1).starts_with('\n') ? 2 : 1;
            continue;
        }
        if (c == '&' && content != Content::Cdata) {
            const std::string_view rest = raw.substr(at);
            if (const auto reference = character_reference(rest)) {
                append_utf8(value, reference->code);
                at += reference->length;
                continue;
            }
            bool named = false;
            for (const auto& [reference, character] : kNamed) {
                if (rest.starts_with(reference)) {
                    value += character;
                    at += reference.size();
                    named = true;
                    break;
                }
            }
            if (named)
                continue;
        }
        value += c;
        ++at;
    }
    return value;
}

// Whether the piece reads as its own bytes.
bool reads_as_itself(std::string_view raw, Content content)
{
    const std::string_view special = content == Content::Cdata ? std::string_view("\r")
                                     : content == Content::Text ? std::string_view("\r&")
                                                                : std::string_view("\r&\n\t");
    return raw.find_first_of(special) == kNone;
}

// A text or attribute as the file holds it: what would read as something else is
// written as a reference. A control character other than a tab or line end of a text
// is one too, and so is the first character of a text of blanks only, which would not
// be read as a text at all: the value reads back as it was.
void append_escaped(std::string& out, std::string_view value, Content content)
{
    const bool blank = content == Content::Text && !value.empty() && value.find_first_not_of(" \t\n") == kNone;
    for (std::size_t at = 0; at < value.size(); ++at) {
        const char c = value[at];
        const auto code = static_cast<unsigned char>(c);
        const bool first = at == 0;
        if (c == '&')
            out += "&amp;";
        else if (c == '<')
            out += "&lt;";
        else if (c == '>')
            out += "&gt;";
        else if (c == '"' && content == Content::Attribute)
            out += "&quot;";
        else if ((code < 0x20 && (content == Content::Attribute || (c != '\t' && c != '\n'))) || (blank && first)) {
            out += "&#";
            out += static_cast<char>('0' + code / 10);
            out += static_cast<char>('0' + code % 10);
            out += ';';
        } else {
            out += c;
        }
    }
}

// Past a document type, from after its "<!DOCTYPE" to after its ">": past its quoted
// strings, comments, processing instructions, conditional sections (up to their "]]>",
// nested ones too) and the declarations within it. False when it does not end so.
bool skip_document_type(std::string_view text, std::size_t& at)
{
    int depth = 0;
    for (;;) {
        const std::string_view inside = text.substr(at);
        std::size_t end = kNone;
        if (inside.starts_with("<!--")) {
            end = text.find("-->", at + 4);
            at = end + 3;
        } else if (inside.starts_with("<![")) {
            at += 3;
            for (int sections = 1; sections > 0 && at < text.size();) {
                const std::string_view section = text.substr(at);
                sections += section.starts_with("<![") ? 1 : section.starts_with("]]>") ? -1 : 0;
                at += section.starts_with("<![") || section.starts_with("]]>") ? 3 : 1;
                if (sections == 0)
                    end = at;
            }
        } else if (inside.starts_with("<!-")) {
            return false;
        } else if (inside.starts_with("<?")) {
            end = text.find("?>", at + 2);
            at = end + 2;
        } else if (inside.starts_with("<!")) {
            ++depth;
            end = at += 2;
        } else if (inside.starts_with('"') || inside.starts_with('\'')) {
            end = text.find(inside.front(), at + 1);
            at = end + 1;
        } else if (inside.starts_with('>')) {
            ++at;
            if (depth-- == 0)
                return true;
            end = at;
        } else if (!inside.empty() && inside.front() != '<') {
            end = ++at;
        }
        if (end == kNone)
            return false;
    }
}

} // namespace

std::string_view ConfigDocument::keep(std::string text)
{
    return m_kept.emplace_front(std::move(text));
}

int ConfigDocument::add(Node node, int parent)
{
    const int added = static_cast<int>(m_nodes.size());
    node.parent = parent;
    m_nodes.push_back(std::move(node));
    if (parent >= 0) {
        Node& above = node_at(parent);
        if (above.last_child >= 0)
            node_at(above.last_child).next_sibling = added;
        else
            above.first_child = added;
        above.last_child = added;
    }
    return added;
}

void ConfigDocument::clear()
{
    m_nodes.clear();
    m_attributes.clear();
    m_kept.clear();
}

bool ConfigDocument::parse(std::string source)
{
    clear();
    std::string_view text = keep(std::move(source));
    // The file is text: it ends at a NUL.
    text = text.substr(0, text.find('\0'));
    if (text.starts_with("\xEF\xBB\xBF"))
        text.remove_prefix(3);
    const auto piece = [this](std::string_view raw, Content content) {
        return reads_as_itself(raw, content) ? raw : keep(decode(raw, content));
    };
    const auto fail = [this] {
        clear();
        return false;
    };

    // A node for about every "<" (an element has one or two, a text follows one), as
    // far as a config file's few hundred; a larger file grows the room as it goes.
    const auto tags = static_cast<std::size_t>(std::count(text.begin(), text.end(), '<'));
    m_nodes.reserve(std::min<std::size_t>(tags + 1, 1024));
    m_nodes.push_back({.kind = Kind::Document});
    int open = 0;   // the node whose content is being read
    std::size_t at = 0;
    while (at < text.size()) {
        const std::size_t tag = text.find('<', at);
        // A text outside the root element, and one of blanks only, is no part of the tree.
        const std::string_view chunk = text.substr(at, tag == kNone ? kNone : tag - at);
        if (open != 0 && !only_blanks(chunk))
            add({.kind = Kind::Text, .text = piece(chunk, Content::Text)}, open);
        if (tag == kNone)
            break;
        at = tag + 1;
        const std::string_view rest = text.substr(at);
        if (rest.starts_with('?')) {
            // A declaration or processing instruction: a name, then anything up to "?>".
            ++at;
            const std::size_t end = read_name(text, at).empty() ? kNone : text.find("?>", at);
            if (end == kNone)
                return fail();
            at = end + 2;
        } else if (rest.starts_with("!--")) {
            const std::size_t end = text.find("-->", at + 3);
            if (end == kNone)
                return fail();
            at = end + 3;
        } else if (rest.starts_with("![CDATA[")) {
            const std::size_t end = text.find("]]>", at + 8);
            if (end == kNone)
                return fail();
            add({.kind = Kind::Cdata, .text = piece(text.substr(at + 8, end - at - 8), Content::Cdata)}, open);
            at = end + 3;
        } else if (rest.starts_with("!DOCTYPE") && open == 0) {
            at += 8;
            if (!skip_document_type(text, at))
                return fail();
        } else if (rest.starts_with('/')) {
            ++at;
            const std::string_view name = read_name(text, at);
            skip_blanks(text, at);
            if (open == 0 || name != node_at(open).text || at == text.size() || text[at] != '>')
                return fail();
            open = node_at(open).parent;
            ++at;
        } else {
            Node element{.kind = Kind::Element,
                         .first_attribute = static_cast<int>(m_attributes.size()),
                         .text = read_name(text, at)};
            if (element.text.empty())
                return fail();
            // Attributes, each after a blank, up to ">" or "/>".
            for (;;) {
                const bool blank = skip_blanks(text, at);
                if (text.substr(at).starts_with("/>")) {
                    add(std::move(element), open);
                    at += 2;
                    break;
                }
                if (text.substr(at).starts_with('>')) {
                    open = add(std::move(element), open);
                    at += 1;
                    break;
                }
                Attribute attribute{.name = read_name(text, at)};
                if (!blank || attribute.name.empty())
                    return fail();
                skip_blanks(text, at);
                if (!text.substr(at).starts_with('='))
                    return fail();
                ++at;
                skip_blanks(text, at);
                const char quote = at < text.size() ? text[at] : '\0';
                const std::size_t end = quote == '"' || quote == '\'' ? text.find(quote, at + 1) : kNone;
                if (end == kNone)
                    return fail();
                attribute.value = piece(text.substr(at + 1, end - at - 1), Content::Attribute);
                m_attributes.push_back(attribute);
                ++element.attribute_count;
                at = end + 1;
            }
        }
    }
    if (open != 0 || root() < 0)
        return fail();
    return true;
}

void ConfigDocument::reset(std::string_view name)
{
    std::string root(name);
    clear();
    m_nodes.push_back({.kind = Kind::Document});
    add({.kind = Kind::Element, .text = keep(std::move(root))}, 0);
}

int ConfigDocument::root() const
{
    return m_nodes.empty() ? -1 : child_element(0, {});
}

// The first element below `node` with the name, or with any name when `name` is empty.
int ConfigDocument::child_element(int node, std::string_view name) const
{
    for (int child = node_at(node).first_child; child >= 0;) {
        const Node& found = node_at(child);
        if (found.kind == Kind::Element && (name.empty() || found.text == name))
            return child;
        child = found.next_sibling;
    }
    return -1;
}

int ConfigDocument::first_text(int node) const
{
    for (int child = node_at(node).first_child; child >= 0;) {
        const Node& found = node_at(child);
        if (found.kind == Kind::Text || found.kind == Kind::Cdata)
            return child;
        child = found.next_sibling;
    }
    return -1;
}

std::optional<std::string_view> ConfigDocument::value(std::string_view path) const
{
    int node = root();
    for (std::string_view name; node >= 0 && !(name = next_name(path)).empty();)
        node = child_element(node, name);
    if (node < 0)
        return std::nullopt;
    const int text = first_text(node);
    const std::string_view value = text >= 0 ? node_at(text).text : std::string_view("");
    return value.substr(0, value.find('\0'));
}

bool ConfigDocument::set(std::string_view path, std::string_view value)
{
    // Every name of the path must be one that the file can hold.
    for (std::string_view rest = path, name; !(name = next_name(rest)).empty();) {
        std::size_t end = 0;
        if (read_name(name, end).size() != name.size())
            return false;
    }
    int node = root();
    for (std::string_view name; !(name = next_name(path)).empty();) {
        const int child = child_element(node, name);
        node = child >= 0 ? child : add({.kind = Kind::Element, .text = keep(std::string(name))}, node);
    }
    // A CDATA section that takes the value becomes a text: a value may hold "]]>".
    const std::string_view kept = keep(std::string(value));
    if (const int text = first_text(node); text >= 0)
        node_at(text) = {.kind = Kind::Text, .parent = node,
                                                   .next_sibling = node_at(text).next_sibling,
                                                   .text = kept};
    else
        add({.kind = Kind::Text, .text = kept}, node);
    return true;
}

std::string ConfigDocument::text() const
{
    std::string out = "<?xml version=\"1.0\"?>\n";
    if (m_nodes.empty())
        return out;
    // Whether each open element has its children on lines of their own, indented by
    // their depth: an element with a text among its children has them all on its line,
    // so that no indentation joins its texts, and so has one nested so deep that the
    // indentation would outgrow the file. A stack of its own rather than calls: a file
    // may nest deeper than calls can go.
    constexpr std::size_t kDeepestIndented = 64;
    std::vector<bool> lines{true};
    for (int index = node_at(0).first_child; index >= 0;) {
        const Node& node = node_at(index);
        const bool indented = lines.back();
        if (indented)
            out.append(lines.size() - 1, '\t');
        if (node.kind == Kind::Element && node.first_child >= 0) {
            write_start(out, node);
            out += '>';
            const bool children_on_lines = indented && first_text(index) < 0 && lines.size() < kDeepestIndented;
            if (children_on_lines)
                out += '\n';
            lines.push_back(children_on_lines);
            index = node.first_child;
            continue;
        }
        if (node.kind == Kind::Element) {
            write_start(out, node);
            out += " />";
        } else if (node.kind == Kind::Text) {
            append_escaped(out, node.text, Content::Text);
            // Two texts in a row would read back as one.
            if (node.next_sibling >= 0 && node_at(node.next_sibling).kind == Kind::Text)
                out += "<!---->";
        } else {
            // "]]>" would end the section: it ends one and starts the next within it.
            out += "<![CDATA[";
            std::string_view rest = node.text;
            for (std::size_t end; (end = rest.find("]]>")) != kNone; rest.remove_prefix(end + 2)) {
                out += rest.substr(0, end + 2);
                out += "]]><![CDATA[";
            }
            out += rest;
            out += "]]>";
        }
        if (indented)
            out += '\n';
        // On to the next node, ending each element whose last child was written.
        while (node_at(index).next_sibling < 0 && node_at(index).parent > 0) {
            index = node_at(index).parent;
            const bool children_on_lines = lines.back();
            lines.pop_back();
            if (children_on_lines)
                out.append(lines.size() - 1, '\t');
            out += "</";
            out += node_at(index).text;
            out += '>';
            if (lines.back())
                out += '\n';
        }
        index = node_at(index).next_sibling;
    }
    return out;
}

// "<name" and the element's attributes.
void ConfigDocument::write_start(std::string& out, const Node& element) const
{
    out += '<';
    out += element.text;
    const auto first = m_attributes.begin() + element.first_attribute;
    for (const Attribute& attribute : std::span(first, first + element.attribute_count)) {
        out += ' ';
        out += attribute.name;
        out += "=\"";
        append_escaped(out, attribute.value, Content::Attribute);
        out += '"';
    }
}
