// The config store's index against pugixml on any file content: whatever the index
// takes, pugixml reads too, and every key of pugixml's document (and one below each)
// has the same text, or is missing, in both.
#include <cstddef>
#include <cstdint>
#include <pugixml.hpp>
#include <string>
#include <string_view>

#include "fuzz_check.h"
#include "sim/lib/config_index.h"

namespace {

// The element at a slash path below the root, as the store looks it up.
pugi::xml_node find_key(const pugi::xml_document& doc, const std::string& path)
{
    pugi::xml_node node = doc.document_element();
    std::string_view rest(path);
    while (!rest.empty() && node) {
        if (rest.front() == '/') {
            rest.remove_prefix(1);
            continue;
        }
        const std::string name(rest.substr(0, rest.find('/')));
        rest.remove_prefix(name.size());
        node = node.child(name.c_str());
    }
    return node;
}

void compare(const ConfigIndex& index, const pugi::xml_document& doc, const std::string& path)
{
    const std::optional<std::string_view> value = index.value(path);
    const pugi::xml_node key = find_key(doc, path);
    fuzz_check(value.has_value() == static_cast<bool>(key), "a key is found by both or by neither");
    if (value)
        fuzz_check(*value == key.child_value(), "a key has the same text in both");
}

void compare_below(const ConfigIndex& index, const pugi::xml_document& doc, pugi::xml_node node, const std::string& path)
{
    compare(index, doc, path);
    compare(index, doc, path + "/missing");
    for (pugi::xml_node child = node.first_child(); child; child = child.next_sibling()) {
        if (child.type() == pugi::node_element)
            compare_below(index, doc, child, path + "/" + child.name());
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const std::string text(reinterpret_cast<const char*>(data), size);
    ConfigIndex index;
    if (!index.index(text))
        return 0;
    pugi::xml_document doc;
    fuzz_check(static_cast<bool>(doc.load_buffer(text.data(), text.size())), "pugixml reads what the index takes");
    fuzz_check(static_cast<bool>(doc.document_element()), "the document has its root");
    compare_below(index, doc, doc.document_element(), "");
    return 0;
}
