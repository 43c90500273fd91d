#pragma once
// The file tree of a data disc: what the disc will hold, built by the burn driver from the
// converted files and read by the recorder that writes the ISO image. The root's item carries
// the volume label.
//
// Thread contract: built on one thread, then only read while a write runs.

#include <cstdint>
#include <ctime>
#include <memory>
#include <string>
#include <vector>

namespace ac::burn {

enum class ItemKind { File = 1, Directory = 2 };

struct DiscItem {
    ItemKind kind = ItemKind::File;
    std::string name;  // on the disc
    std::string path;  // on this machine; empty for a directory
    std::time_t modified = 0;
    std::int64_t size = 0;
};

// A file of the disc from a file on this machine; null when the file is gone or not a regular
// file.
std::unique_ptr<DiscItem> CreateFileItem(const std::string& name, const std::string& path);
std::unique_ptr<DiscItem> CreateDirItem(const std::string& name);
void SetItemFileName(DiscItem& item, const std::string& name);

class DiscTree {
public:
    struct Node {
        std::string name;
        std::unique_ptr<DiscItem> item;
        Node* parent = nullptr;
        Node* firstChild = nullptr;
        Node* nextSibling = nullptr;
    };

    DiscTree();
    ~DiscTree();
    DiscTree(const DiscTree&) = delete;
    DiscTree& operator=(const DiscTree&) = delete;

    Node* Root() const { return m_root; }
    static Node* Parent(const Node* node) { return node->parent; }
    static Node* FirstChild(const Node* node) { return node->firstChild; }
    static Node* NextSibling(const Node* node) { return node->nextSibling; }
    // A null parent is the root. The new node is the parent's last child.
    Node* AddChild(const std::string& name, std::unique_ptr<DiscItem> item, Node* parent = nullptr);
    static DiscItem* Item(const Node* node) { return node->item.get(); }
    static const std::string& Name(const Node* node) { return node->name; }
    // Takes the node and everything below it out of the tree.
    void FreeNode(Node* node);
    // Back to an empty root that keeps its label.
    void Clear();

    bool Empty() const { return m_root->firstChild == nullptr; }
    std::string VolumeLabel() const { return m_root->item->name; }
    // Every file of the tree with its path on the disc ("dir/name"), depth first.
    std::vector<std::pair<std::string, const DiscItem*>> Files() const;

private:
    Node* NewNode();
    std::vector<std::unique_ptr<Node>> m_nodes;
    Node* m_root = nullptr;
};

// Bytes of the ISO 9660 image (Joliet and Rock Ridge names) that the tree makes; -1 when the
// image cannot be built (a file went away).
std::int64_t CountISOLength(const DiscTree& tree);

}  // namespace ac::burn
