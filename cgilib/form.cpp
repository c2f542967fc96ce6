// Reading the parsed form: field values, upload names, and moving uploads into place.
#include "platform/cgic.h"

#include <algorithm>
#include <cstring>

#include "cgilib/request.h"

namespace {

// Copies `text` as a C string (up to its first NUL) into `result`: at most max-1
// bytes, always terminated; a size of 0 or less writes nothing.
cgiFormResultType copy_out(std::string_view text, char* result, int max)
{
    text = text.substr(0, text.find('\0'));
    const std::size_t room = max > 0 ? static_cast<std::size_t>(max) - 1 : 0;
    if (max > 0 && result != nullptr) {
        const std::size_t count = std::min(text.size(), room);
        if (count > 0)
            std::memcpy(result, text.data(), count);
        result[count] = '\0';
    }
    if (text.empty())
        return cgiFormEmpty;
    return text.size() > room ? cgiFormTruncated : cgiFormSuccess;
}

cgilib::FormField* field_named(const char* name)
{
    return name != nullptr ? cgilib::find_field(name) : nullptr;
}

} // namespace

extern "C" cgiFormResultType cgiFormString(const char* name, char* result, int max)
{
    const cgilib::FormField* field = field_named(name);
    if (field == nullptr) {
        copy_out({}, result, max);
        return cgiFormNotFound;
    }
    return copy_out(field->value, result, max);
}

extern "C" cgiFormResultType cgiFormFileName(const char* name, char* result, int max)
{
    const cgilib::FormField* field = field_named(name);
    if (field == nullptr || !field->upload) {
        copy_out({}, result, max);
        return field == nullptr ? cgiFormNotFound : cgiFormNotAFile;
    }
    return copy_out(field->upload->client_name, result, max);
}

// A second rename of the same upload fails with cgiFormIO: the file has gone.
extern "C" cgiFormResultType cgiFormFileRename(const char* name, const char* path)
{
    cgilib::FormField* field = field_named(name);
    if (field == nullptr)
        return cgiFormNotFound;
    if (!field->upload)
        return cgiFormNotAFile;
    if (path == nullptr || !field->upload->file.move_to(path))
        return cgiFormIO;
    return cgiFormSuccess;
}
