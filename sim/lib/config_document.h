// The config file as a tree: its elements with their attributes, texts and CDATA
// sections, read the way XML tools commonly read such a file (comments, processing
// instructions and a document type are passed over, so is a text of blanks only), and
// written back as the store writes it: a declaration, then one element a line, indented
// with tabs.
//
// A request reads a few keys of a file of a few kilobytes: the tree keeps the file's own
// bytes and points into them, and only a text with a reference, or one that is set, is
// held apart. The store parses the file once per process.
#pragma once

#include <cstddef>
#include <forward_list>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

class ConfigDocument {
public:
    ConfigDocument() = default;
    // The tree points into its own storage: it moves, but is not copied.
    ConfigDocument(ConfigDocument&&) = default;
    ConfigDocument& operator=(ConfigDocument&&) = default;
    ConfigDocument(const ConfigDocument&) = delete;
    ConfigDocument& operator=(const ConfigDocument&) = delete;

    // Reads `text` into the tree; false, and an empty tree, when it is not a
    // well-formed document with at least one element.
    bool parse(std::string text);
    // Makes the tree a document of one empty element named `name`.
    void reset(std::string_view name);

    // The value of the element at a slash path below the root element
    // ("/system_mgr/nfs/enable"; empty components are skipped), or nothing when there is
    // no such element. Its value is its first text or CDATA section, as far as its first
    // NUL; the empty text when it has none.
    std::optional<std::string_view> value(std::string_view path) const;
    // Gives the element at the path, made with what is missing of it, the value: its
    // first text or CDATA section becomes the value, or a text is added last. The tree
    // has a root element. False, and nothing changed, when a name of the path is not
    // one an element can have.
    bool set(std::string_view path, std::string_view value);

    // The document as the store writes it.
    std::string text() const;

private:
    enum class Kind { Document, Element, Text, Cdata };
    struct Attribute {
        std::string_view name;
        std::string_view value;
    };
    struct Node {
        Kind kind;
        int parent = -1;
        int first_child = -1;
        int last_child = -1;
        int next_sibling = -1;
        int first_attribute = 0;    // an element's attributes, in m_attributes
        int attribute_count = 0;
        std::string_view text;      // an element's name; a text's or CDATA section's value
    };

    Node& node_at(int index) { return m_nodes[static_cast<std::size_t>(index)]; }
    const Node& node_at(int index) const { return m_nodes[static_cast<std::size_t>(index)]; }
    void clear();
    int add(Node node, int parent);
    int root() const;
    int child_element(int node, std::string_view name) const;
    int first_text(int node) const;
    // Bytes that the tree holds for as long as it lives: the file, decoded texts, set
    // values and new names. The list's nodes never move, so views into them stay valid
    // when the document is moved.
    std::string_view keep(std::string text);
    void write_start(std::string& out, const Node& element) const;

    std::vector<Node> m_nodes;
    std::vector<Attribute> m_attributes;
    std::forward_list<std::string> m_kept;
};
