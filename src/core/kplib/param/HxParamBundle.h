#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/param/HxParamBase.h>

#include <atomic>
#include <cstdint>
#include <cstdio>
#include <utility>

/// The inner node of the parameter tree: a container that owns its children. Sub-bundles come
/// first, in the order of insertion, followed by the parameters.
///
///     HxParamBundle scan("Scan");
///     scan.set("Slices", 30);
///     scan.setTag("G0008-0060", "CT");
///     int slices = 0;
///     if (scan.findNum("Slices", 1, &slices))
///         std::printf("%s, %d slices\n", scan.findTag("G0008-0060", "?"), slices);
///         // prints: CT, 30 slices
///
/// Lookups ignore the case of ASCII letters and prefix a leading digit with `_`, as in names. A
/// name that contains a blank also matches nodes that are named by the part before the blank,
/// except for titles and sorted parameters. A bundle is found by its name and by the first 16
/// words of its title, the parameter `Name`. A missing node is not an error: lookups return null
/// or false and leave their output unchanged.
///
/// Threads: one thread at a time uses a tree, but any number may look parameters up by
/// findSorted() and the functions that use it. The first lookup sorts under a lock.
///
/// Errors: exhausted memory throws KpMemoryException. A node that could not be inserted is
/// deleted. Operations on many children, and operations that create bundles or reservations first,
/// stop at the failure and keep what was done before it; all others leave the tree unchanged.
class KPLIB_API HxParamBundle : public HxParamBase {
public:
    /// A new bundle, owned by the caller.
    static HxParamBundle* create(const char* name);

    /// See setName(): what follows a blank becomes the title.
    explicit HxParamBundle(const char* name);

    /// Copies flags, name and children, as copy() does.
    HxParamBundle(const HxParamBundle& other);
    /// As copy() into a bundle without children, with flags and name.
    HxParamBundle& operator=(const HxParamBundle& other);

    /// Copies flags and name and takes the children. Assignment leaves flags and name as they are.
    HxParamBundle(HxParamBundle&& other);  // NOLINT(performance-noexcept-move-constructor): the name needs memory
    /// Takes the children of the other bundle and deletes the present ones.
    HxParamBundle& operator=(HxParamBundle&& other) noexcept;

    HxParamBundle* duplicate() const override;
    ~HxParamBundle() override;

    /// Adds a copy of a parameter, or of a bundle's children; nothing with FlagNoCopy. If there are children already,
    /// sub-bundles that are found here by name are merged and parameters of the same name replaced.
    void copy(const HxParamBase& src);

    /// As copy(), but always merging and replacing, regardless of FlagNoCopy in `src` and in its
    /// children, with their edit checks. Copies of whole sub-bundles still leave out what has
    /// FlagNoCopy inside them, and those with the flag themselves come without children.
    void copyAll(const HxParamBase& src);

    /// Moves all children of `other` here; they replace children of the same name. O(1) if this
    /// bundle is empty.
    void move(HxParamBundle& other);

    /// Takes over `node`, which has no parent, as the last one of its kind; or, with `replace`, in the place of the
    /// first one of that name, whose flags are added to its own. A bundle named BoundaryIds gets the title
    /// BoundaryConditions and the other way round. The node is deleted if memory runs out.
    void insert(HxParamBase* node, int replace);

    /// Ensures capacity for `more` children, so that as many insertions allocate no memory for the
    /// list.
    void reserve(long more);

    /// Deletes a child, unless it has FlagNoDelete; the form with a name takes what findBase() finds.
    void remove(HxParamBase* node);
    /// Removes the child that findBase() finds.
    void remove(const char* name);

    /// Deletes all children, with FlagNoDelete too, and records no change.
    void removeAll();

    /// The sub-bundle of that name or title; if there is none, a new one when `create` is not 0, else null. O(n).
    HxParamBundle* bundle(const char* name, int create);
    /// As bundle(name, 0).
    HxParamBundle* bundle(const char* name) { return bundle(name, 0); }
    /// @{
    /// As bundle(name, 0).
    const HxParamBundle* bundle(const char* name) const;
    /// @}

    /// The sub-bundle at an index, null outside.
    HxParamBundle* bundle(int i) { return const_cast<HxParamBundle*>(std::as_const(*this).bundle(i)); }
    /// The sub-bundle at an index, null outside.
    const HxParamBundle* bundle(int i) const;
    /// Number of sub-bundles.
    int nBundles() const { return static_cast<int>(counts_.load(std::memory_order_relaxed) & ~sortedBit); }

    /// Sets the parameter of that name that find() gives, of whatever type, or adds one. Null text is empty text.
    void set(const char* name, const char* text);
    /// @{
    /// Sets a number or `n` numbers, as above.
    void set(const char* name, int v);
    void set(const char* name, double v);
    void set(const char* name, int n, const int* values);
    void set(const char* name, int n, const float* values);
    void set(const char* name, int n, const double* values);
    /// @}

    /// The values in decimal as one text; `values` needs one element, which is written, even if `n` is 0.
    void setAsString(const char* name, int n, const int* values);
    /// Three floats from 0 to 1, as the parameter `Color`.
    void setColor(const float* rgb);

    /// The first parameter of that name, if it has `dimension` values (any number if below 1) and
    /// a type that fits into one of `typeMask`: 1 byte, 2 short, 4 int, 8 float, 16 double, 64
    /// text. Complex, "uint" and "sbyte" are never found. O(n), O(log n) if sorted.
    HxParameter* find(const char* name, int dimension, int typeMask);
    /// As above.
    const HxParameter* find(const char* name, int dimension, int typeMask) const;

    /// The first child of that name, or else the sub-bundle of that title. O(n).
    HxParamBase* findBase(const char* name) { return const_cast<HxParamBase*>(std::as_const(*this).findBase(name)); }
    /// As above.
    const HxParamBase* findBase(const char* name) const;

    /// The parameter of exactly that name, by binary search, after sorting if need be. O(log n).
    /// Which one of equal names is found isn't defined.
    HxParameter* findSorted(const char* name)
    {
        return const_cast<HxParameter*>(std::as_const(*this).findSorted(name));
    }
    /// As above.
    const HxParameter* findSorted(const char* name) const;

    /// Sorts the parameters by name, once, until the next insertion. A new name doesn't move a parameter: lookups may
    /// miss those that were renamed in between.
    void sortParameters() const;
    /// Whether the parameters are sorted, so that findSorted() does not sort them.
    bool isSorted() const { return (counts() & sortedBit) != 0; }

    /// A text, or a single number as text, see HxParameter::getString().
    bool findString(const char* name, const char*& text) const;
    /// `n` integers: all values of a parameter, or the first ones in a text, where they are separated by blanks. A text
    /// that ends early gives false when `out` has been filled in part.
    bool findNum(const char* name, int n, int* out) const;
    /// `n` numbers: all values of a parameter, or the one number of a text. `n` below 1 asks for the parameter only.
    bool findReal(const char* name, int n, float* out) const;
    /// As above, in double precision.
    bool findReal(const char* name, int n, double* out) const;
    /// Three floats by KpColor::setValue().
    bool findColor(const char* name, float* rgb) const;
    bool findColor(float* rgb) const;  ///< the parameter `Color`

    /// Clears the bits of `mask` in touched(), here and in all below.
    void untouchAll(int mask);

    /// The reserved bundle Materials; it and its children are guarded against deletion.
    HxParamBundle* materials(int create);
    /// The reserved bundle BoundaryConditions, or else BoundaryIds; guarded against deletion.
    HxParamBundle* boundaryIds(int create);

    /// Appends the text form to `out`: a line "name {", the children one level of four blanks deeper, one a line, and a
    /// line "}". A null `name` stands for the bundle's own.
    void print(KpString& out, int indent = 0, const char* name = nullptr) const;
    /// Writes the text form without what has FlagNoSave, and with commas between parameters. Two threads that write at
    /// the same time affect each other.
    void print(FILE* stream, int indent = 0, const char* name = nullptr) const;

    // DICOM headers. A tag (gggg,eeee) is a parameter "Ggggg-eeee" in upper-case hexadecimal whose text is
    // "description: value"; a sequence is a bundle of that name with bundles Item_0, Item_1 ... All of it lies in the
    // bundle `All` in the bundle `DICOM`. Texts that are returned lie in the tree (see HxParameter::getString()).

    /// @{
    /// The bundle `All` in the bundle `DICOM`, null if there is none.
    HxParamBundle* dicomAll() { return const_cast<HxParamBundle*>(std::as_const(*this).dicomAll()); }
    const HxParamBundle* dicomAll() const;
    /// @}

    /// The same, made as needed.
    HxParamBundle* dicomAllCreate();

    /// Sets a tag of dicomAllCreate(), with an empty description.
    void setTag(const char* tag, const char* value);

    /// findTagInAll() of dicomAll(). The form with a number gives NaN when it gives false.
    const char* findTag(const char* tag, const char* defaultValue) const;
    /// @{
    /// As findTagInAll() or findPrivateTagInAll() of dicomAll().
    bool findTag(const char* tag, float& out) const;
    bool findTag(const char* tag, KpDArray<float>& out) const;
    const char* findPrivateTag(const char* creator, const char* tag, const char* defaultValue) const;
    /// @}

    // The rest is for the bundle `All` itself.

    /// The value of a tag. In an enhanced multi-frame object the tag is first looked for, mapped by replaceTag(), in
    /// the first items of the per-frame and then of the shared functional groups. A leaf without a value gives the
    /// default.
    const char* findTagInAll(const char* tag, const char* defaultValue) const;
    /// @{
    /// The first number of a value; false, and `out` stays, without one.
    bool findTagInAll(const char* tag, int& out) const;
    bool findTagInAll(const char* tag, float& out) const;
    /// @}

    /// All numbers of a value, separated by backslashes; false if one is missing. `out` stays if the tag is missing.
    bool findTagInAll(const char* tag, KpDArray<float>& out) const;

    /// Whether there are per-frame functional groups, which are given, and the shared ones if any; else nulls.
    bool isEnhancedDcm(const HxParamBundle** perFrame = nullptr, const HxParamBundle** shared = nullptr) const;

    /// The value of a tag, mapped by replaceTag(), by findRecursive() in one functional group.
    const char* findTagInEnhancedDicomBundle(const char* tag, const char* defaultValue) const;

    /// The parameter here or, depth first, in the standard sequences and first items below.
    HxParameter* findRecursive(const char* name)
    {
        return const_cast<HxParameter*>(std::as_const(*this).findRecursive(name));
    }
    /// As above.
    const HxParameter* findRecursive(const char* name) const;

    /// The tag that holds in enhanced objects what `tag` holds in classic ones; false, and `mapped` stays, if the tag
    /// is the same in both.
    static bool replaceTag(const KpString& tag, KpString& mapped);

    // Private tags. A creator reserves a block of its group; `tag` is a template of ten characters, of which the
    // positions 6 and 7 are replaced by the number of the block. The reservations are indexed in a bundle
    // PrivateCreators, made on first use, by lookups too: that first use belongs to one thread.

    /// The value of a private tag; without a creator, `tag` is a full tag name.
    const char* findPrivateTagInAll(const char* creator, const char* tag, const char* defaultValue) const;

    /// Sets a private tag, reserving the first free block from 16 on if the creator has none; null removes the tag.
    /// Nothing happens when the group is full.
    void setPrivateTagInAll(const char* creator, const char* tag, const char* value);

    /// Item `index` of a private sequence, with descriptions; made as needed if `create`, though a block is reserved in
    /// any case. Null if there is none or the group is full.
    HxParamBundle* privateSequenceItemInAll(const char* creator, const char* tag, const char* description, int index,
                                            bool create);
    /// The same, creating nothing.
    const HxParamBundle* privateSequenceItemInAll(const char* creator, const char* tag, int index) const;

    // The children as a container: sub-bundles first, then parameters.

    /// The children; valid until one is added or removed.
    const KpDArray<HxParamBase*>& children() const { return children_; }
    /// Number of children.
    long size() const { return children_.size(); }
    /// @{
    /// The child at an index in [0, size()).
    HxParamBase* operator[](long i) { return children_[i]; }
    const HxParamBase* operator[](long i) const { return children_[i]; }
    /// @}

    /// All children.
    HxParamBase* const* begin() { return children_.begin(); }
    /// As above.
    HxParamBase* const* end() { return children_.end(); }
    /// As above.
    const HxParamBase* const* begin() const { return children_.begin(); }
    /// As above.
    const HxParamBase* const* end() const { return children_.end(); }
    /// Position of a child, -1 for null and other nodes.
    int index(const HxParamBase* node) const;

private:
    friend class HxParamBase;

    struct Untitled {};
    HxParamBundle(const char* name, Untitled);
    HxParamBundle(const HxParamBase& other, Untitled);

    static constexpr std::uint32_t sortedBit = 0x80000000u;
    std::uint32_t counts() const { return counts_.load(std::memory_order_acquire); }
    bool hasParameters() const { return size() > nBundles(); }
    void setCounts(std::uint32_t counts) { counts_.store(counts, std::memory_order_release); }

    void swapChildren(HxParamBundle& other) noexcept;
    void insertTwin(const HxParamBase& node);
    void replaceAt(long i, HxParamBase* node);
    HxParamBase* takeAt(long i);

    bool isTitled(const kplib::detail::NameKey& key) const;
    const HxParamBundle* titled(const kplib::detail::NameKey& key) const;
    const HxParamBundle* bundle(const kplib::detail::NameKey& key) const;
    const HxParameter* parameter(const kplib::detail::NameKey& key) const;
    const HxParameter* findSorted(const kplib::detail::NameKey& key) const;
    const HxParameter* find(const kplib::detail::NameKey& key, int dimension, int typeMask) const;
    bool isShadowed(const char* name) const;
    template <typename... Value>
    void setOrAdd(const char* name, Value... value);
    const HxParameter* findInGroups(const char* tag) const;

    mutable KpDArray<HxParamBase*> children_;  // lookups sort the parameters among them
    mutable std::atomic<std::uint32_t> sortLock_ = 0;
    // The number of sub-bundles, and in the top bit whether the parameters are sorted: one word, atomic since threads
    // may ask it while another one sorts.
    mutable std::atomic<std::uint32_t> counts_ = 0;
};
