// The config store over "/etc/NAS_CFG/config.xml". The file is parsed at most once
// per process; changes stay in the loaded document until xml_write_file saves it.
// Reads are not events of the device; changes are recorded in the journal.
#include "platform/config_store.h"

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <pugixml.hpp>
#include <string>
#include <string_view>

#include "journal.h"

namespace {

constexpr const char* kConfigFile = "/etc/NAS_CFG/config.xml";

pugi::xml_document& document()
{
    static pugi::xml_document doc;
    static bool loaded = false;
    if (!loaded) {
        loaded = true;
        if (!doc.load_file(kConfigFile))
            doc.reset();
        if (!doc.document_element())
            doc.append_child("config");
    }
    return doc;
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

pugi::xml_node find_or_create_key(const char* path)
{
    pugi::xml_node node = document().document_element();
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

} // namespace

extern "C" int xml_get_str(const char* path, int size, char* buffer)
{
    const pugi::xml_node key = find_key(path);
    if (!key || size <= 0)
        return -1;
    const char* text = key.child_value();
    const std::size_t n = std::min(std::strlen(text), static_cast<std::size_t>(size - 1));
    std::memcpy(buffer, text, n);
    buffer[n] = '\0';
    return 0;
}

extern "C" int xml_get_int(const char* path)
{
    const pugi::xml_node key = find_key(path);
    if (!key)
        return -1;
    const char* text = key.child_value();
    char* end = nullptr;
    errno = 0;
    const long value = std::strtol(text, &end, 10);
    if (end == text || errno != 0)
        return -1;
    return static_cast<int>(value);
}

extern "C" int xml_set_str(const char* path, const char* value)
{
    journal_record("xml_set_str", {path, value});
    pugi::xml_node key = find_or_create_key(path);
    key.text().set(value);
    return 0;
}

extern "C" int xml_write_file(const char* file)
{
    journal_record("xml_write_file", {file});
    return document().save_file(file, "\t") ? 0 : -1;
}
