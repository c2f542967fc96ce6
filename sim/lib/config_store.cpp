// The config store over "/etc/NAS_CFG/config.xml". The file is read at most once per
// process; lookups use an index of it (config_index.h) until a key is set, then a
// pugixml document of it, where changes stay until xml_write_file saves them.
// Reads are not events of the device; changes are recorded in the journal.
//
// Two requests may change different keys at the same time. So a change is also kept
// in this process's list of changes, and xml_write_file takes the store's lock, loads
// the file as it is now, applies this process's changes to it in their order, and
// replaces the file atomically before it lets the lock go: a key another request
// stored meanwhile is kept, and readers see the old or the new file, never a part.
#include "platform/config_store.h"

#include <algorithm>
#include <climits>
#include <optional>
#include <pugixml.hpp>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "cgi/atomic_file.h"
#include "cgi/file_lock.h"
#include "config_index.h"
#include "journal.h"
#include "text_file.h"

namespace {

constexpr const char* kConfigFile = "/etc/NAS_CFG/config.xml";

// The file as this process read it first. Until a key is set, lookups go to its index;
// a file that is not in the plain form, and any change, go to a pugixml document of it.
const std::string& file_text()
{
    static const std::string text = read_text(kConfigFile);
    return text;
}

void load(pugi::xml_document& doc, const std::string& text)
{
    if (!doc.load_buffer(text.data(), text.size()))
        doc.reset();
    if (!doc.document_element())
        doc.append_child("config");
}

const ConfigIndex* file_index()
{
    static ConfigIndex index;
    static const bool plain = index.index(file_text());
    return plain ? &index : nullptr;
}

bool document_loaded = false;

pugi::xml_document& document()
{
    static pugi::xml_document doc;
    if (!document_loaded) {
        document_loaded = true;
        load(doc, file_text());
    }
    return doc;
}

// Collects a saved document's text.
class TextWriter final : public pugi::xml_writer {
public:
    void write(const void* data, std::size_t size) override { text.append(static_cast<const char*>(data), size); }
    std::string text;
};

// The keys this process set since its last save, with their values, in order.
std::vector<std::pair<std::string, std::string>>& changes()
{
    static std::vector<std::pair<std::string, std::string>> list;
    return list;
}

// The element at a slash path below the root element, or an empty node.
pugi::xml_node find_key(const char* path)
{
    pugi::xml_node node = document().document_element();
    std::string_view rest(path);
    while (!rest.empty() && node) {
        if (rest.front() == '/') {
            rest.remove_prefix(1);
            continue;
        }
        const auto slash = rest.find('/');
        const std::string name(rest.substr(0, slash));
        node = node.child(name.c_str());
        rest = slash == std::string_view::npos ? std::string_view{} : rest.substr(slash);
    }
    return node;
}

// The key's text, or nothing when the store has no such key.
std::optional<std::string_view> key_value(const char* path)
{
    if (!document_loaded) {
        if (const ConfigIndex* index = file_index())
            return index->value(path);
    }
    const pugi::xml_node key = find_key(path);
    return key ? std::optional<std::string_view>(key.child_value()) : std::nullopt;
}

pugi::xml_node find_or_create_key(pugi::xml_document& doc, const char* path)
{
    pugi::xml_node node = doc.document_element();
    std::string_view rest(path);
    while (!rest.empty()) {
        if (rest.front() == '/') {
            rest.remove_prefix(1);
            continue;
        }
        const auto slash = rest.find('/');
        const std::string name(rest.substr(0, slash));
        pugi::xml_node child = node.child(name.c_str());
        node = child ? child : node.append_child(name.c_str());
        rest = slash == std::string_view::npos ? std::string_view{} : rest.substr(slash);
    }
    return node;
}

// The number at the start of the text as strtol reads it in base 10 (blanks, a sign,
// digits), or nothing when there is none or it does not fit a long. Written out here
// because strtol's code and its character tables are two pages a request need not load.
std::optional<long> decimal(std::string_view text)
{
    const auto is_digit = [&] { return !text.empty() && text.front() >= '0' && text.front() <= '9'; };
    while (!text.empty() && (text.front() == ' ' || (text.front() >= '\t' && text.front() <= '\r')))
        text.remove_prefix(1);
    const bool negative = text.starts_with('-');
    if (negative || text.starts_with('+'))
        text.remove_prefix(1);
    if (!is_digit())
        return std::nullopt;
    unsigned long magnitude = 0;
    const unsigned long limit = negative ? 0ul - static_cast<unsigned long>(LONG_MIN) : LONG_MAX;
    for (; is_digit(); text.remove_prefix(1)) {
        const auto digit = static_cast<unsigned long>(text.front() - '0');
        if (magnitude > (limit - digit) / 10)
            return std::nullopt;
        magnitude = magnitude * 10 + digit;
    }
    return negative ? static_cast<long>(0ul - magnitude) : static_cast<long>(magnitude);
}

} // namespace

extern "C" int xml_get_str(const char* path, int size, char* buffer)
{
    const std::optional<std::string_view> text = key_value(path);
    if (!text || size <= 0)
        return -1;
    const std::size_t n = std::min(text->size(), static_cast<std::size_t>(size - 1));
    text->copy(buffer, n);
    buffer[n] = '\0';
    return 0;
}

extern "C" int xml_get_int(const char* path)
{
    const std::optional<std::string_view> text = key_value(path);
    const std::optional<long> value = text ? decimal(*text) : std::nullopt;
    return value ? static_cast<int>(*value) : -1;
}

extern "C" int xml_set_str(const char* path, const char* value)
{
    journal_record("xml_set_str", {path, value});
    find_or_create_key(document(), path).text().set(value);
    changes().emplace_back(path, value);
    return 0;
}

extern "C" int xml_write_file(const char* file)
{
    journal_record("xml_write_file", {file});
    const auto lock = FileLock::acquire("config");
    if (!lock)
        return -1;
    pugi::xml_document current;
    load(current, read_text(file));
    for (const auto& [path, value] : changes())
        find_or_create_key(current, path.c_str()).text().set(value.c_str());
    TextWriter saved;
    current.save(saved, "\t");
    if (!replace_file(file, saved.text))
        return -1;
    document().reset(current);
    changes().clear();
    return 0;
}
