// The config store over "/etc/NAS_CFG/config.xml". The file is read and parsed at most
// once per process (config_document.h); changes stay in that document until
// xml_write_file saves them. Reads are not events of the device; changes are recorded
// in the journal.
//
// Two requests may change different keys at the same time. So a change is also kept
// in this process's list of changes, and xml_write_file takes the store's lock, reads
// the file as it is now, applies this process's changes to it in their order, and
// replaces the file atomically before it lets the lock go: a key another request
// stored meanwhile is kept, and readers see the old or the new file, never a part.
#include "platform/config_store.h"

#include <algorithm>
#include <cerrno>
#include <climits>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <unistd.h>
#include <vector>

#include "cgi/atomic_file.h"
#include "cgi/file_lock.h"
#include "config_document.h"
#include "journal.h"

namespace {

constexpr const char* kConfigFile = "/etc/NAS_CFG/config.xml";

// The file's document: an empty store when there is no file, nothing when the file is
// there but cannot be read or is no document.
std::optional<ConfigDocument> read_document(const char* file)
{
    ConfigDocument document;
    std::string text;
    if (!read_whole_file(file, text)) {
        if (::access(file, F_OK) == 0 || errno != ENOENT)
            return std::nullopt;
        document.reset("config");
    } else if (!document.parse(std::move(text))) {
        return std::nullopt;
    }
    return document;
}

// The store as this process read it first, and changed it since; a file it cannot
// read serves as an empty store.
ConfigDocument& document()
{
    static ConfigDocument store = [] {
        std::optional<ConfigDocument> read = read_document(kConfigFile);
        if (read)
            return std::move(*read);
        ConfigDocument empty;
        empty.reset("config");
        return empty;
    }();
    return store;
}

// The keys this process set since its last save, with their values, in order.
std::vector<std::pair<std::string, std::string>>& changes()
{
    static std::vector<std::pair<std::string, std::string>> list;
    return list;
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
    const std::optional<std::string_view> text = document().value(path);
    if (!text || size <= 0)
        return -1;
    const std::size_t n = std::min(text->size(), static_cast<std::size_t>(size - 1));
    text->copy(buffer, n);
    buffer[n] = '\0';
    return 0;
}

extern "C" int xml_get_int(const char* path)
{
    const std::optional<std::string_view> text = document().value(path);
    const std::optional<long> value = text ? decimal(*text) : std::nullopt;
    return value ? static_cast<int>(*value) : -1;
}

extern "C" int xml_set_str(const char* path, const char* value)
{
    journal_record("xml_set_str", {path, value});
    if (!document().set(path, value))
        return -1;
    changes().emplace_back(path, value);
    return 0;
}

extern "C" int xml_write_file(const char* file)
{
    journal_record("xml_write_file", {file});
    const auto lock = FileLock::acquire("config");
    if (!lock)
        return -1;
    // A file that is there but cannot be read, or is no document, is not replaced by
    // this process's changes alone: the save fails, and the changes stay for the next.
    std::optional<ConfigDocument> current = read_document(file);
    if (!current)
        return -1;
    for (const auto& [path, value] : changes())
        current->set(path, value);
    if (!replace_file(file, current->text()))
        return -1;
    document() = std::move(*current);
    changes().clear();
    return 0;
}
