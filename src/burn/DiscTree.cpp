// The data disc's tree: nodes owned by the tree, linked as parent, first child, next sibling.
#include "burn/DiscTree.h"

#include <sys/stat.h>

#include <algorithm>
#include <functional>

namespace ac::burn {

std::unique_ptr<DiscItem> CreateFileItem(const std::string& name, const std::string& path) {
    struct stat info;
    if (::stat(path.c_str(), &info) != 0 || !S_ISREG(info.st_mode))
        return nullptr;
    auto item = std::make_unique<DiscItem>();
    item->kind = ItemKind::File;
    item->name = name;
    item->path = path;
    item->modified = info.st_mtime;
    item->size = info.st_size;
    return item;
}

std::unique_ptr<DiscItem> CreateDirItem(const std::string& name) {
    auto item = std::make_unique<DiscItem>();
    item->kind = ItemKind::Directory;
    item->name = name;
    return item;
}

void SetItemFileName(DiscItem& item, const std::string& name) {
    item.name = name;
}

DiscTree::DiscTree() {
    m_root = NewNode();
    m_root->item = CreateDirItem("");
}

DiscTree::~DiscTree() = default;

DiscTree::Node* DiscTree::NewNode() {
    m_nodes.push_back(std::make_unique<Node>());
    return m_nodes.back().get();
}

DiscTree::Node* DiscTree::AddChild(const std::string& name, std::unique_ptr<DiscItem> item,
                                   Node* parent) {
    if (!parent)
        parent = m_root;
    Node* node = NewNode();
    node->name = name;
    node->item = std::move(item);
    node->parent = parent;
    Node** link = &parent->firstChild;
    while (*link)
        link = &(*link)->nextSibling;
    *link = node;
    return node;
}

void DiscTree::FreeNode(Node* node) {
    if (!node || node == m_root)
        return;
    Node** link = &node->parent->firstChild;
    while (*link && *link != node)
        link = &(*link)->nextSibling;
    if (*link)
        *link = node->nextSibling;
    std::vector<const Node*> gone;
    std::function<void(const Node*)> collect = [&](const Node* at) {
        gone.push_back(at);
        for (const Node* child = at->firstChild; child; child = child->nextSibling)
            collect(child);
    };
    collect(node);
    std::erase_if(m_nodes, [&](const std::unique_ptr<Node>& owned) {
        return std::find(gone.begin(), gone.end(), owned.get()) != gone.end();
    });
}

void DiscTree::Clear() {
    while (m_root->firstChild)
        FreeNode(m_root->firstChild);
}

std::vector<std::pair<std::string, const DiscItem*>> DiscTree::Files() const {
    std::vector<std::pair<std::string, const DiscItem*>> files;
    std::function<void(const Node*, const std::string&)> walk = [&](const Node* at,
                                                                    const std::string& prefix) {
        for (const Node* child = at->firstChild; child; child = child->nextSibling) {
            const std::string path = prefix.empty() ? child->name : prefix + "/" + child->name;
            if (child->item && child->item->kind == ItemKind::File) {
                files.emplace_back(path, child->item.get());
            } else {
                walk(child, path);
            }
        }
    };
    walk(m_root, "");
    return files;
}

}  // namespace ac::burn
