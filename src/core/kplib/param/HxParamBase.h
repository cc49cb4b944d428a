#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

#include <cstddef>
#include <cstdint>

namespace kplib::detail {
class NameKey;
}

/// A named node of the parameter tree: an HxParameter with a value, or an HxParamBundle with children.
///
/// A node is created without a parent. The bundle into which it is inserted owns it from then on.
/// Names follow the rules of setName(). Nodes are allocated by kpmalloc().
///
/// Errors: exhausted memory throws KpMemoryException and leaves the node unchanged.
///
/// Threads: one thread at a time uses a tree; for the one exception see HxParamBundle.
class KPLIB_API HxParamBase {
public:
    /// The two kinds of nodes.
    enum Type : std::uint8_t {
        TypeParameter = 0,  ///< an HxParameter
        TypeBundle = 1,     ///< an HxParamBundle
    };

    /// Restrictions of a node. Except as stated here, the setters of the tree ignore them: they
    /// are for editors, by way of HxParamEditCheck.
    enum Flag : int {
        FlagNoSave = 1,          ///< left out when a tree is written to a file
        FlagNoCopy = 2,          ///< left out by HxParamBundle::copy()
        FlagNoDelete = 4,        ///< HxParamBundle::remove() refuses
        FlagNoInsertBundle = 8,  ///< the bundle takes no further sub-bundles
        FlagNoInsertParam = 16,  ///< the bundle takes no further parameters
        FlagNoRename = 32,       ///< for editors: the name is fixed
        FlagNoSetValue = 64,     ///< for editors: the value is fixed
        FlagHidden = 128,        ///< never part of the text form
    };

    /// What changed in a node or below it. For clients: the tree itself does not read it.
    enum TouchMask : int {
        TouchName = 1,        ///< the name of the node
        TouchValue = 2,       ///< of a bundle: its list of children
        TouchChildName = 4,   ///< the name of a node below
        TouchChildValue = 8,  ///< the value of a node below
        TouchAny = 16,        ///< set with each of the others
    };

    /// A new node with the same content, outside any tree, owned by the caller.
    virtual HxParamBase* duplicate() const = 0;

    /// Destroys the node; its parent is not notified.
    virtual ~HxParamBase();

    /// Copies flags and name. The record of changes is cleared before a change of the name is
    /// recorded. Kind, parent and edit check stay.
    HxParamBase& operator=(const HxParamBase& other);

    /// Sets the name. A leading digit is prefixed with `_`; letters, digits and `-` stay; some
    /// Latin-1 letters lose their accents; any other byte becomes `_`. A bundle keeps only the
    /// part before the first blank; the rest becomes its title, the parameter `Name`, which never
    /// repeats the name. For null or empty text a name is generated from a process-wide, unlocked
    /// counter. Records TouchName if the name differs from the old one.
    void setName(const char* name);

    /// Records a change in this node and, as a change of a child, in all bundles above.
    void touch(int mask);

    /// Sets (`on` not 0) or clears the bits of `mask` in flags().
    void setFlag(int mask, int on);

    /// Sets the edit check of this node and of all nodes below it that have none. Null removes it.
    /// Not owned.
    void setEditCheck(HxParamEditCheck* check) { editCheck_ = check; }

    /// The edit check of this node or of the nearest node above that has one, else
    /// HxParamEditCheck::defaultEditCheck(). Never null.
    HxParamEditCheck* editCheck() const;

    /// The bundle that holds the node, null outside a tree.
    HxParamBundle* parent() const { return parent_; }
    /// The kind of the node.
    Type type() const { return type_; }
    /// Whether the node is an HxParamBundle.
    bool isBundle() const { return type_ == TypeBundle; }
    int touched() const { return touched_; }    ///< bits of TouchMask
    int flags() const { return flags_; }        ///< bits of Flag
    const char* name() const { return name_; }  ///< valid until the name changes

    /// @{
    /// Nodes live in blocks of kpmalloc(); placement works as usual.
    static void* operator new(std::size_t size);
    static void* operator new(std::size_t, void* where) noexcept { return where; }
    static void operator delete(void* node) noexcept;
    static void operator delete(void*, void*) noexcept {}
    /// @}
protected:
    /// A node of that name outside any tree.
    HxParamBase(Type type, const char* name);
    /// A node outside any tree and without an edit check; marks and flags are copied.
    HxParamBase(const HxParamBase& other);

private:
    friend class HxParamBundle;
    friend class kplib::detail::NameKey;

    void adoptName(char* fresh);
    void retitle(const char* name, const char* rest);

    HxParamBundle* parent_ = nullptr;
    Type type_ = TypeParameter;
    std::uint8_t touched_ = 0;
    std::uint16_t flags_ = 0;
    std::uint32_t tag_ = 0;  // the name's tagNumber(), for quick comparison, in what is padding otherwise
    char* name_ = nullptr;
    HxParamEditCheck* editCheck_ = nullptr;
};
