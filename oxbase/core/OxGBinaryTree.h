// OxGBinaryTree.h: an AA tree from an unsigned 32-bit key to a value.
//
// Keys are unique; inserting a key twice keeps the first value. The tree owns
// its nodes, not what a pointer value points to. `find` answers the node or
// the tree's own terminal node `nullNode`, which callers compare against.
//
//   OxGBinaryTree<OxMsgRecord_s *> tree;
//   tree.insert(12, record);
//   if (tree.find(12) != tree.nullNode) use(tree.find(12)->value);
#ifndef OXBASE_CORE_OXGBINARYTREE_H
#define OXBASE_CORE_OXGBINARYTREE_H

#include "oxbase/core/OxTypes.h"

#include <ios>
#include <vector>

/// A node of OxGBinaryTree: smaller keys on the left, larger on the right.
template <class T> struct OxBinaryNode {
    unsigned int key = 0;
    T value{};
    OxBinaryNode* left = nullptr;
    OxBinaryNode* right = nullptr;
    unsigned int level = 0; ///< 1 for a new leaf, 0 for the terminal node
};

template <class T> class OxGBinaryTree {
public:
    using Node = OxBinaryNode<T>;

    Node* root;
    Node* nullNode;

    OxGBinaryTree() {
        nullNode = new Node;
        nullNode->left = nullNode;
        nullNode->right = nullNode;
        root = nullNode;
    }
    OxGBinaryTree(const OxGBinaryTree&) = delete;
    OxGBinaryTree& operator=(const OxGBinaryTree&) = delete;

    ~OxGBinaryTree() {
        makeEmpty();
        delete nullNode;
    }

    /// The node holding `key`, or `nullNode` when there is none.
    Node* find(unsigned int key) {
        nullNode->key = key; // sentinel: the descent needs no end test
        Node* node = root;
        while (node->key != key) {
            node = key < node->key ? node->left : node->right;
        }
        return node;
    }

    /// Adds `key` with `value`; a key already present leaves the tree as it is.
    void insert(unsigned int key, const T& value) { insert(key, value, root); }

    /// Deletes every node; the tree is empty afterwards.
    void makeEmpty() {
        // Post-order release with an explicit stack: depth is logarithmic in an
        // AA tree, but no recursion is needed for it either.
        std::vector<Node*> pending;
        if (root != nullNode) {
            pending.push_back(root);
        }
        while (!pending.empty()) {
            Node* node = pending.back();
            pending.pop_back();
            if (node->left != nullNode) {
                pending.push_back(node->left);
            }
            if (node->right != nullNode) {
                pending.push_back(node->right);
            }
            delete node;
        }
        root = nullNode;
    }

    /// Diagnostic text of the subtree at `node`, pre-order: addresses in
    /// hexadecimal, keys in decimal.
    std::ostrstream* dump(std::ostrstream* stream, Node* node) const {
        if (node == nullptr) {
            *stream << "Warning: current node is NULL."
                    << "\n";
            return stream;
        }
        if (node == nullNode) {
            *stream << "Current node is a terminal node."
                    << "\n";
            return stream;
        }
        *stream << "Current node = " << std::hex << static_cast<const void*>(node) << std::dec
                << ", key = " << node->key << "\n";
        if (node->left == nullNode) {
            *stream << "  Left child is a terminal node";
        } else {
            *stream << "  Left child = " << std::hex << static_cast<const void*>(node->left);
        }
        if (node->right == nullNode) {
            *stream << ", Right child is a terminal node";
        } else {
            *stream << ", Right child = " << std::hex << static_cast<const void*>(node->right);
        }
        *stream << std::dec << "\n";
        if (node->left != nullNode) {
            dump(stream, node->left);
        }
        if (node->right != nullNode) {
            dump(stream, node->right);
        }
        return stream;
    }

private:
    void insert(unsigned int key, const T& value, Node*& node) {
        if (node == nullNode) {
            node = new Node;
            node->key = key;
            node->value = value;
            node->left = nullNode;
            node->right = nullNode;
            node->level = 1;
            return;
        }
        if (key < node->key) {
            insert(key, value, node->left);
        } else if (node->key < key) {
            insert(key, value, node->right);
        } else {
            return;
        }
        skew(node);
        split(node);
    }

    void skew(Node*& node) {
        if (node->left->level == node->level) {
            Node* child = node->left;
            node->left = child->right;
            child->right = node;
            node = child;
        }
    }

    void split(Node*& node) {
        if (node->right->right->level == node->level) {
            Node* child = node->right;
            node->right = child->left;
            child->left = node;
            child->level++;
            node = child;
        }
    }
};

#endif
