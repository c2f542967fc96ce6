// The listing of an uploaded import file, on any file content. The answer is one
// <info> element with one <item> line per listed record; an item's text is escaped
// (no raw "<", ">" or quote, every "&" an entity), holds no line break, is not a
// comment, and is text of the file, in the file's order.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>
#include <string_view>

#include "bulk/import_listing.h"
#include "fuzz_check.h"
#include "platform/cgic.h"

namespace {

struct FileCloser {
    void operator()(FILE* file) const { std::fclose(file); }
};
using UniqueFile = std::unique_ptr<FILE, FileCloser>;

struct FreeBuffer {
    void operator()(char* buffer) const { std::free(buffer); }
};

// The entity text back to the bytes it stands for; false for an "&" that is no entity.
bool unescape(std::string_view text, std::string& plain)
{
    static constexpr std::pair<std::string_view, char> kEntities[] = {
        {"&amp;", '&'}, {"&lt;", '<'}, {"&gt;", '>'}, {"&quot;", '"'}};
    plain.clear();
    while (!text.empty()) {
        if (text.front() != '&') {
            plain += text.front();
            text.remove_prefix(1);
            continue;
        }
        const auto entity = std::find_if(std::begin(kEntities), std::end(kEntities),
                                         [&](const auto& e) { return text.starts_with(e.first); });
        if (entity == std::end(kEntities))
            return false;
        plain += entity->second;
        text.remove_prefix(entity->first.size());
    }
    return true;
}

void check_listing(std::string_view listing, std::string_view input)
{
    constexpr std::string_view kOpen = "<info>\n";
    constexpr std::string_view kClose = "</info>\n";
    constexpr std::string_view kItem = "<item>";
    constexpr std::string_view kItemEnd = "</item>";
    fuzz_check(listing.starts_with(kOpen) && listing.ends_with(kClose), "one info element");
    listing = listing.substr(kOpen.size(), listing.size() - kOpen.size() - kClose.size());

    std::string plain;
    std::size_t read_up_to = 0;     // items come in file order
    while (!listing.empty()) {
        const std::size_t end = listing.find('\n');
        fuzz_check(end != std::string_view::npos, "every item ends its line");
        const std::string_view line = listing.substr(0, end);
        listing.remove_prefix(end + 1);
        fuzz_check(line.starts_with(kItem) && line.ends_with(kItemEnd), "a line is one item");
        const std::string_view text = line.substr(kItem.size(), line.size() - kItem.size() - kItemEnd.size());
        fuzz_check(text.find_first_of("<>\"\r") == std::string_view::npos, "item text is escaped, without CR");
        fuzz_check(unescape(text, plain), "every & in an item is an entity");
        fuzz_check(!plain.empty() && plain.front() != '#', "comments and empty lines are not listed");
        fuzz_check(plain.size() < 12288, "an item is one reader piece at most");
        const std::size_t found = input.find(plain, read_up_to);
        fuzz_check(found != std::string_view::npos, "an item is text of the file, in file order");
        read_up_to = found + plain.size();
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const UniqueFile file(size > 0 ? fmemopen(const_cast<std::uint8_t*>(data), size, "r")
                                   : std::fopen("/dev/null", "r"));
    fuzz_check(file != nullptr, "the input opens as a file");

    char* buffer = nullptr;
    std::size_t length = 0;
    {
        const UniqueFile response(open_memstream(&buffer, &length));
        fuzz_check(response != nullptr, "a response stream in memory");
        cgiOut = response.get();
        write_import_items(file.get());
        cgiOut = stdout;
    }
    const std::unique_ptr<char, FreeBuffer> owned(buffer);
    check_listing({buffer, length}, {reinterpret_cast<const char*>(data), size});
    return 0;
}
