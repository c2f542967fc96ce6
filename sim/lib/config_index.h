// The config file as the store writes it, indexed for lookups without building a
// document: most requests only read a few keys, and parsing the whole file into
// pugixml's nodes is most of what such a request costs.
//
// Only the plain form is indexed: an optional "<?xml ...?>" declaration first, then one
// element tree of bare tags (no attributes, comments, CDATA, other declarations or
// carriage returns) whose texts use no references but &lt; &gt; &amp; &quot; &apos;.
// Anything else is left to pugixml (index() is false), so that every file reads exactly
// as pugixml reads it.
#pragma once

#include <forward_list>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

class ConfigIndex {
public:
    // Indexes `text`, which must outlive the index; false when it is not in the plain form.
    bool index(std::string_view text);

    // The value of the element at a slash path below the root element
    // ("/system_mgr/nfs/enable"; empty components are skipped), or nothing. Its value is
    // its first text that is not only blanks, as pugixml's child_value() gives it.
    std::optional<std::string_view> value(std::string_view path) const;

private:
    // Small, its text a piece of the file itself where it can be, so that the index of
    // a config file takes less memory than the file.
    struct Element {
        std::string_view name;
        std::string_view text;   // data() is null until the element has a text
        int first_child = -1;
        int last_child = -1;
        int next_sibling = -1;
        int parent = -1;
    };
    int open_element(std::string_view name, int parent);

    std::vector<Element> m_elements;
    std::forward_list<std::string> m_decoded;   // the texts that had references, decoded
};
