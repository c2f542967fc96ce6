// The config store's document against pugixml on any file content, read as UTF-8 (the
// store's files are; pugixml would otherwise guess from the first bytes): a file reads as a
// document in both or in neither, and every key of it (and one below each) has the same
// value, or is missing, in both; what the store writes reads back the same in both, with
// every key's value as it was; a value that is set reads back as it was set.
#include <cstddef>
#include <cstdint>
#include <pugixml.hpp>
#include <string>
#include <string_view>

#include "fuzz_check.h"
#include "sim/lib/config_document.h"

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

void compare(const ConfigDocument& document, const pugi::xml_document& doc, const std::string& path)
{
    const std::optional<std::string_view> value = document.value(path);
    const pugi::xml_node key = find_key(doc, path);
    fuzz_check(value.has_value() == static_cast<bool>(key), "a key is found by both or by neither");
    if (value)
        fuzz_check(*value == key.child_value(), "a key has the same value in both");
}

void compare_below(const ConfigDocument& document, const pugi::xml_document& doc, pugi::xml_node node,
                   const std::string& path)
{
    compare(document, doc, path);
    compare(document, doc, path + "/missing");
    for (pugi::xml_node child = node.first_child(); child; child = child.next_sibling()) {
        if (child.type() == pugi::node_element)
            compare_below(document, doc, child, path + "/" + child.name());
    }
}

pugi::xml_parse_result load(pugi::xml_document& doc, const std::string& text)
{
    return doc.load_buffer(text.data(), text.size(), pugi::parse_default, pugi::encoding_utf8);
}

// The document against pugixml's reading of `text`, which must be a document.
void compare_with(const ConfigDocument& document, const std::string& text)
{
    pugi::xml_document doc;
    fuzz_check(static_cast<bool>(load(doc, text)), "pugixml reads the text");
    fuzz_check(static_cast<bool>(doc.document_element()), "the document has its root");
    compare_below(document, doc, doc.document_element(), "");
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const std::string text(reinterpret_cast<const char*>(data), size);
    ConfigDocument document;
    pugi::xml_document doc;
    const bool read = document.parse(text);
    const bool pugixml_read = load(doc, text) && doc.document_element();
    fuzz_check(read == pugixml_read, "a file is a document to both or to neither");
    if (!read)
        document.reset("config");
    else
        compare_with(document, text);

    const std::string written = document.text();
    ConfigDocument again;
    fuzz_check(again.parse(written), "the store reads what it writes");
    compare_with(again, written);
    // Every key keeps its value through the store's writing: a save changes no key that
    // it was not asked to.
    if (read)
        compare_below(again, doc, doc.document_element(), "");

    // A value of any bytes but NUL, set below the root and read back through the file;
    // the first key of the file takes one too, in place of its text or CDATA section.
    std::string value = text.substr(text.size() / 2);
    std::erase(value, '\0');
    fuzz_check(document.set("/fuzz/key", value), "a key of names is set");
    const char* first = read ? doc.document_element().first_child().name() : "";
    const std::string first_key = *first ? std::string("/") + first : "";
    fuzz_check(document.set(first_key, value), "a key of the file is set");
    const std::string saved = document.text();
    fuzz_check(again.parse(saved), "the store reads what it writes after a change");
    fuzz_check(again.value("/fuzz/key") == value, "a value reads back as it was set");
    fuzz_check(again.value(first_key) == value, "a value set in place reads back as it was set");
    compare_with(again, saved);
    return 0;
}
