// The config store over "/etc/NAS_CFG/config.xml". The file is parsed at most once
// per process; changes stay in the loaded document until xml_write_file saves it.
// Reads are not events of the device; changes are recorded in the journal.
//
// Two requests may change different keys at the same time. So a change is also kept
// in this process's list of changes, and xml_write_file takes the store's lock, loads
// the file as it is now, applies this process's changes to it in their order, and
// replaces the file atomically before it lets the lock go: a key another request
// stored meanwhile is kept, and readers see the old or the new file, never a part.
#include "platform/config_store.h"

#include <array>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <pugixml.hpp>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "cgi/atomic_file.h"
#include "cgi/file_lock.h"
#include "journal.h"

namespace {

constexpr const char* kConfigFile = "/etc/NAS_CFG/config.xml";

// pugixml's memory comes from one block of the process first: a request's store is a
// few KiB, and a heap page of 32 KiB for it would touch more memory than it uses.
alignas(16) std::array<unsigned char, 64 * 1024> arena;
std::size_t arena_used = 0;

void* arena_allocate(std::size_t size)
{
    const std::size_t rounded = (size + 15) & ~std::size_t{15};
    if (rounded > arena.size() - arena_used)
        return std::malloc(size);
    void* block = arena.data() + arena_used;
    arena_used += rounded;
    return block;
}

void arena_deallocate(void* block)
{
    const auto* byte = static_cast<const unsigned char*>(block);
    const std::less<const unsigned char*> before;
    if (before(byte, arena.data()) || !before(byte, arena.data() + arena.size()))
        std::free(block);
}

void load(pugi::xml_document& doc, const char* file)
{
    pugi::set_memory_management_functions(arena_allocate, arena_deallocate);
    std::string text;
    if (!read_whole_file(file, text) || !doc.load_buffer(text.data(), text.size()))
        doc.reset();
    if (!doc.document_element())
        doc.append_child("config");
}

pugi::xml_document& document()
{
    static pugi::xml_document doc;
    static bool loaded = false;
    if (!loaded) {
        loaded = true;
        load(doc, kConfigFile);
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
    load(current, file);
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
