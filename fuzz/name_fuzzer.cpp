// The one name rule. Whatever the bytes, an accepted name has no control character
// and no "/", is not "." or "..", and does not begin with "-": it stays one entry
// below the folder it is put in, one field of a line-based file, and never a
// tool's option. And every name without those is accepted (the rule refuses
// nothing else).
#include <cctype>
#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <string_view>

#include "fuzz_check.h"
#include "volumes/names.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    // The view ends exactly where the fuzzer's buffer ends: a read past it shows.
    const std::string_view name(reinterpret_cast<const char*>(data), size);
    const bool accepted = is_acceptable_name(name);

    bool control = false;
    for (const unsigned char c : name)
        control = control || std::iscntrl(c) != 0;
    const bool slash = name.find('/') != std::string_view::npos;
    const bool dots = name == "." || name == "..";
    const bool option = name.starts_with('-');
    fuzz_check(accepted == !(control || slash || dots || option), "the rule is exactly its four refusals");

    if (accepted && !name.empty()) {
        const std::filesystem::path base("/shares");
        const std::filesystem::path joined = (base / name).lexically_normal();
        fuzz_check(joined.parent_path() == base, "an accepted name stays below its folder");
        fuzz_check(joined.filename() == name, "an accepted name is one path entry");
        fuzz_check(name.find_first_of("\n\r\t") == std::string_view::npos, "an accepted name is one field of a line");
    }
    return 0;
}
