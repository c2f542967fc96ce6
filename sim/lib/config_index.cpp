#include "config_index.h"

#include <algorithm>
#include <array>
#include <utility>

namespace {

bool is_blank(char c)
{
    return c == ' ' || c == '\t' || c == '\n';
}

bool only_blanks(std::string_view text)
{
    for (const char c : text) {
        if (!is_blank(c))
            return false;
    }
    return true;
}

bool is_name_start(char c)
{
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_' || c == ':';
}

bool is_name_char(char c)
{
    return is_name_start(c) || (c >= '0' && c <= '9') || c == '-' || c == '.';
}

// The tag name at `at`, which then points past it; empty when there is none.
std::string_view read_name(std::string_view text, std::size_t& at)
{
    const std::size_t start = at;
    if (at < text.size() && is_name_start(text[at])) {
        while (at < text.size() && is_name_char(text[at]))
            ++at;
    }
    return text.substr(start, at - start);
}

// The inside of "<?xml ...?>": blanks and attributes of letters, digits and "=._-:" in
// quotes, as an ordinary declaration has them.
bool plain_declaration(std::string_view inside)
{
    for (const char c : inside) {
        if (!is_blank(c) && !is_name_char(c) && c != '=' && c != '"' && c != '\'')
            return false;
    }
    return true;
}

// The text with its five named references replaced; false on any other reference, a
// carriage return (pugixml turns line ends into LF) or a NUL byte (its end of text).
bool decode(std::string_view text, std::string& decoded)
{
    static constexpr std::array<std::pair<std::string_view, char>, 5> kReferences{{
        {"&lt;", '<'}, {"&gt;", '>'}, {"&amp;", '&'}, {"&quot;", '"'}, {"&apos;", '\''}}};
    decoded.clear();
    for (std::size_t at = 0; at < text.size();) {
        const char c = text[at];
        if (c == '\r' || c == '\0')
            return false;
        if (c != '&') {
            decoded += c;
            ++at;
            continue;
        }
        bool known = false;
        for (const auto& [reference, character] : kReferences) {
            if (text.substr(at, reference.size()) == reference) {
                decoded += character;
                at += reference.size();
                known = true;
                break;
            }
        }
        if (!known)
            return false;
    }
    return true;
}

} // namespace

int ConfigIndex::open_element(std::string_view name, int parent)
{
    const int added = static_cast<int>(m_elements.size());
    m_elements.push_back({.name = name, .parent = parent});
    if (parent >= 0) {
        Element& above = m_elements[static_cast<std::size_t>(parent)];
        if (above.last_child >= 0)
            m_elements[static_cast<std::size_t>(above.last_child)].next_sibling = added;
        else
            above.first_child = added;
        above.last_child = added;
    }
    return added;
}

bool ConfigIndex::index(std::string_view text)
{
    m_elements.clear();
    m_decoded.clear();
    // An element has a start tag, and mostly an end tag too.
    m_elements.reserve(static_cast<std::size_t>(std::count(text.begin(), text.end(), '<')) / 2 + 1);
    std::size_t at = 0;
    if (text.starts_with("<?xml")) {
        const std::size_t end = text.find("?>");
        if (end == std::string_view::npos || !plain_declaration(text.substr(5, end - 5)))
            return false;
        at = end + 2;
    }
    int open = -1;   // the element whose content is being read
    bool rooted = false;   // the root element has been read whole
    std::string decoded;
    for (;;) {
        const std::size_t tag = text.find('<', at);
        const std::string_view chunk = text.substr(at, tag == std::string_view::npos ? tag : tag - at);
        if (!only_blanks(chunk)) {
            // Most texts have no reference: their value is the file's own bytes.
            const bool plain = chunk.find_first_of(std::string_view("&\r\0", 3)) == std::string_view::npos;
            if (open < 0 || (!plain && !decode(chunk, decoded)))
                return false;
            Element& element = m_elements[static_cast<std::size_t>(open)];
            if (element.text.data() == nullptr)
                element.text = plain ? chunk : std::string_view(m_decoded.emplace_front(decoded));
        }
        if (tag == std::string_view::npos)
            break;
        at = tag + 1;
        const bool closing = at < text.size() && text[at] == '/';
        if (closing)
            ++at;
        const std::string_view name = read_name(text, at);
        while (at < text.size() && is_blank(text[at]))
            ++at;
        if (name.empty() || (open < 0 && rooted))
            return false;
        if (closing) {
            if (open < 0 || m_elements[static_cast<std::size_t>(open)].name != name || !text.substr(at).starts_with(">"))
                return false;
            open = m_elements[static_cast<std::size_t>(open)].parent;
            rooted = open < 0;
            at += 1;
        } else if (text.substr(at).starts_with("/>")) {
            open_element(name, open);
            rooted = open < 0;
            at += 2;
        } else if (text.substr(at).starts_with(">")) {
            open = open_element(name, open);
            at += 1;
        } else {
            return false;
        }
    }
    return rooted && open < 0;
}

std::optional<std::string_view> ConfigIndex::value(std::string_view path) const
{
    if (m_elements.empty())
        return std::nullopt;
    int node = 0;
    while (!path.empty() && node >= 0) {
        if (path.front() == '/') {
            path.remove_prefix(1);
            continue;
        }
        const std::string_view name = path.substr(0, path.find('/'));
        path.remove_prefix(name.size());
        int child = m_elements[static_cast<std::size_t>(node)].first_child;
        while (child >= 0 && m_elements[static_cast<std::size_t>(child)].name != name)
            child = m_elements[static_cast<std::size_t>(child)].next_sibling;
        node = child;
    }
    if (node < 0)
        return std::nullopt;
    // An element without a text has the empty one (never a null pointer to copy from).
    const std::string_view text = m_elements[static_cast<std::size_t>(node)].text;
    return text.data() ? text : std::string_view("");
}
