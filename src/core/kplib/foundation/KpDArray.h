#pragma once

#include <kplib/foundation/KpCheck.h>
#include <kplib/foundation/KpMemory.h>

#include <climits>
#include <concepts>
#include <cstddef>
#include <cstring>
#include <initializer_list>
#include <new>
#include <type_traits>
#include <utility>

/// How a KpDArray constructs, copies and destroys its elements. The kind does not affect how the
/// array grows.
enum class KpElementKind : int {
    Bytes,    ///< scalars and pointers: left uninitialised, copied as one block
    Plain,    ///< values without a destructor: left uninitialised (no constructor runs), copied one by one
    Managed,  ///< all others: constructed, copied and destroyed one by one
};

/// What the array requires of an element type. The default suits all types that may be moved as
/// bytes. Specialise it with `movesAsBytes` false for a type that points into itself.
template <typename T>
struct KpElementTraits {
    /// How elements of type T are treated.
    static constexpr KpElementKind kind = std::is_scalar_v<T>               ? KpElementKind::Bytes
                                          : std::is_trivially_copyable_v<T> ? KpElementKind::Plain
                                                                            : KpElementKind::Managed;
    /// Standard containers and strings may point into themselves: they are moved by move construction.
    static constexpr bool movesAsBytes = !requires { typename T::allocator_type; };
};

/// The growable array of the library: three words, no allocator, no virtual operations.
///
///     KpDArray<int> sizes = {512, 256};
///     sizes.append(128);
///     sizes.remove(0);
///     for (int size : sizes)
///         std::printf("%d ", size);  // prints: 256 128
///
/// Growth: if resize() or an insertion needs more capacity, the new capacity is one and a half
/// times the size, or what is needed if that is more. Only remax() and move assignment reduce the
/// capacity.
///
/// Addresses: growth and insertion move elements as bytes, or by move construction if
/// `movesAsBytes` of their KpElementTraits is false. An address of an element is valid only until
/// then.
///
/// Preconditions: positions are checked in Debug and sanitizer builds only. T may be incomplete
/// where an array is only declared, as within T itself.
///
/// Errors: exhausted memory throws KpMemoryException. If the storage cannot grow in insertMemory()
/// or a function that calls it, the capacity is already changed, and only the destructor may
/// follow. If copying an element throws in insert(), append() or insertSorted(), the elements are
/// as before. If constructing or copying one throws in resize(), remax() or copy assignment, the
/// array may hold fewer elements than requested, and after an assignment old ones among them. In
/// all these cases the capacity may have grown.
///
/// Threads: one thread at a time.
template <typename T>
class KpDArray {
public:
    /// As in standard containers.
    using value_type = T;
    /// As in standard containers.
    using iterator = T*;
    /// As in standard containers.
    using const_iterator = const T*;

    KpDArray() noexcept = default;
    /// Copies the elements, not the capacity.
    KpDArray(const KpDArray& other) : KpDArray() { insert(0, other.size_, other.data_); }
    /// Takes the storage; `other` is left empty.
    KpDArray(KpDArray&& other) noexcept { swap(other); }
    /// Copies the items.
    KpDArray(std::initializer_list<T> items) : KpDArray() { insert(0, static_cast<long>(items.size()), items.begin()); }
    /// Copies the elements of [first, last), which must not lie in this array.
    template <typename Iterator>
    requires requires(Iterator i)
    {
        {
            *i
            } -> std::convertible_to<T>;
        {
            ++i
            } -> std::same_as<Iterator&>;
    }
    KpDArray(Iterator first, Iterator last) : KpDArray()
    {
        for (; first != last; ++first)
            append(*first);
    }
    /// Copies the elements of a std::span, a std::vector or another contiguous range of T.
    template <typename Range>
    requires(!std::derived_from<Range, KpDArray>) && requires(const Range& range)
    {
        requires std::same_as<std::remove_cvref_t<decltype(*range.data())>, T>;
        {
            range.size()
            } -> std::convertible_to<std::size_t>;
    }
    explicit KpDArray(const Range& range) : KpDArray() { insert(0, static_cast<long>(range.size()), range.data()); }
    ~KpDArray()
    {
        clear();
        kpfree(data_);
    }

    /// Copies the elements one by one. Storage that is large enough is kept.
    KpDArray& operator=(const KpDArray& other);
    /// Destroys the elements, frees the storage, capacity included, and takes the storage of
    /// `other`, which is left empty.
    KpDArray& operator=(KpDArray&& other) noexcept
    {
        KpDArray(std::move(other)).swap(*this);
        return *this;
    }

    /// Sets the capacity to the larger of `newMax` and `newSize`, and the size to `newSize`. -1
    /// stands for the present size. Returns the old capacity less the new one.
    long remax(long newMax = -1, long newSize = -1);

    /// Sets the size and returns it. A negative size counts as 0. The capacity never shrinks.
    long resize(long newSize);

    /// Ensures capacity for one more element, growing as append() does. If memory runs out, throws
    /// KpMemoryException and leaves the elements unchanged, unlike an insertion: call this first
    /// for long-lived lists. T must be default-constructible.
    void reserveOne()
    {
        resize(size_ + 1);
        resize(size_ - 1);
    }

    /// Opens a gap of `count` raw elements at `pos`. The caller must fill them; managed elements
    /// must be constructed.
    void insertMemory(long pos, long count);

    /// Inserts copies of `count` elements at `pos`. `src` may point into this array if its range
    /// does not extend across `pos`.
    void insert(long pos, long count, const T* src);

    /// Appends a copy, in constant time on average. `item` may be an element of this array.
    void append(const T& item)
    {
        if (size_ >= capacity_) [[unlikely]] {
            insert(size_, 1, &item);
            return;
        }
        ::new (static_cast<void*>(data_ + size_)) T(item);
        ++size_;
    }

    /// Inserts a copy after all elements for which `compare` returns that they are less or equal,
    /// by binary search in ]lo, hi[. -1 and -1 search the whole array. Returns the index of the
    /// copy. O(log n) comparisons, and the move of the elements after it.
    long insertSorted(const T& item, int (*compare)(const T&, const T&), long lo = -1, long hi = -1);

    /// Removes the element at `pos`; those after it move down.
    void remove(long pos);

    /// Sets the size to 0. The capacity stays.
    void clear() noexcept { destroyFrom(0); }

    /// Exchanges the storage; no element is moved.
    void swap(KpDArray& other) noexcept
    {
        std::swap(size_, other.size_);
        std::swap(capacity_, other.capacity_);
        std::swap(data_, other.data_);
    }

    /// Whether both have as many elements, each equal to its counterpart.
    friend bool operator==(const KpDArray& a, const KpDArray& b) requires std::equality_comparable<T>
    {
        bool equal = a.size_ == b.size_;
        for (long i = 0; equal && i < a.size_; ++i)
            equal = a.data_[i] == b.data_[i];
        return equal;
    }

    /// Number of elements.
    long size() const noexcept { return size_; }
    /// Number of elements that the storage holds.
    long capacity() const noexcept { return capacity_; }
    /// The storage; null as long as nothing was allocated.
    T* data() noexcept { return data_; }
    /// The storage; null as long as nothing was allocated.
    const T* data() const noexcept { return data_; }
    /// The element at `i`, in [0, size()); unchecked in release builds.
    T& operator[](long i) noexcept
    {
        KPLIB_CHECK(i >= 0 && i < size_, "KpDArray: the index is not in [0, size())");
        return data_[i];
    }
    /// As above.
    const T& operator[](long i) const noexcept
    {
        KPLIB_CHECK(i >= 0 && i < size_, "KpDArray: the index is not in [0, size())");
        return data_[i];
    }
    /// The elements as a range; an insertion or a growth invalidates the iterators.
    T* begin() noexcept { return data_; }
    T* end() noexcept { return data_ + size_; }              ///< as begin()
    const T* begin() const noexcept { return data_; }        ///< as above
    const T* end() const noexcept { return data_ + size_; }  ///< as begin()

protected:
    /// For derived arrays that fill raw storage themselves.
    void setSize(long size) noexcept { size_ = size; }
    /// For derived arrays over storage that is owned elsewhere: overwrites the fields and frees
    /// nothing.
    void setStorage(T* data, long size, long capacity) noexcept
    {
        data_ = data;
        size_ = size;
        capacity_ = capacity;
    }

private:
    using Traits = KpElementTraits<T>;
    static constexpr bool isManaged = Traits::kind == KpElementKind::Managed;

    static unsigned long bytes(long count)
    {
        unsigned long size = 0;  // an impossible count asks for all there is, and so fails
        // NOLINTNEXTLINE(bugprone-sizeof-expression): the elements may be pointers
        return __builtin_mul_overflow(static_cast<unsigned long>(count), sizeof(T), &size) ? ULONG_MAX : size;
    }
    static long sum(long a, long b)
    {
        long result = 0;
        return __builtin_add_overflow(a, b, &result) ? LONG_MAX : result;
    }
    static long larger(long a, long b) { return a > b ? a : b; }
    long grown() const { return static_cast<long>(static_cast<double>(size_) * 1.5); }

    static void moveBytes(T* to, const T* from, long count)
    {
        if (count > 0)
            std::memmove(static_cast<void*>(to), static_cast<const void*>(from), bytes(count));
    }
    void relocate(long count);
    void moveElements(long to, long from, long count);
    void constructTo(long newSize);
    void destroyFrom(long newSize) noexcept;
    void copyIntoGap(long pos, long count, const T* src);

    long size_ = 0;
    long capacity_ = 0;
    T* data_ = nullptr;
};

template <typename T>
KpDArray<T>& KpDArray<T>::operator=(const KpDArray& other)
{
    if (this == &other)
        return *this;
    resize(other.size_);
    for (long i = 0; i < size_; ++i)
        data_[i] = other.data_[i];
    return *this;
}

template <typename T>
long KpDArray<T>::remax(long newMax, long newSize)
{
    const long oldCapacity = capacity_;
    const long size = newSize < 0 ? size_ : newSize;
    const long target = larger(newMax < 0 ? size_ : newMax, size);
    destroyFrom(size);
    if (target != capacity_) {
        if (target == 0) {
            kpfree(data_);
            data_ = nullptr;
        } else {
            relocate(target);
        }
        capacity_ = target;
    }
    constructTo(size);
    return oldCapacity - capacity_;
}

template <typename T>
long KpDArray<T>::resize(long newSize)
{
    newSize = larger(newSize, 0);
    destroyFrom(newSize);
    if (newSize > capacity_)
        remax(larger(grown(), newSize), newSize);
    constructTo(newSize);
    return size_;
}

template <typename T>
void KpDArray<T>::insertMemory(long pos, long count)
{
    KPLIB_CHECK(pos >= 0 && pos <= size_ && count >= 0,
                "KpDArray: the position is not in [0, size()], or the count is negative");
    const long needed = sum(size_, count);
    if (needed > capacity_) {
        capacity_ = larger(grown(), needed);
        relocate(capacity_);
    }
    if (pos < size_)
        moveElements(pos + count, pos, size_ - pos);
    size_ = needed;
}

template <typename T>
void KpDArray<T>::insert(long pos, long count, const T* src)
{
    if (count < 1)
        return;
    const bool isOwn = src >= data_ && src < data_ + size_;
    const long index = isOwn ? src - data_ : 0;
    insertMemory(pos, count);
    copyIntoGap(pos, count, !isOwn ? src : data_ + (index < pos ? index : index + count));
}

template <typename T>
long KpDArray<T>::insertSorted(const T& item, int (*compare)(const T&, const T&), long lo, long hi)
{
    for (;;) {
        if (hi == -1)
            hi = size_;
        if (hi - lo < 2)
            break;
        const long mid = (lo + hi) / 2;
        if (compare(item, data_[mid]) < 0)
            hi = mid;
        else
            lo = mid;
    }
    insert(lo + 1, 1, &item);
    return lo + 1;
}

template <typename T>
void KpDArray<T>::remove(long pos)
{
    KPLIB_CHECK(pos >= 0 && pos < size_, "KpDArray: the position is not in [0, size())");
    if constexpr (isManaged)
        data_[pos].~T();
    moveElements(pos, pos + 1, size_ - pos - 1);
    --size_;
}

/// Moves all live elements into storage for `count`.
template <typename T>
void KpDArray<T>::relocate(long count)
{
    static_assert(alignof(T) <= alignof(std::max_align_t), "the heap gives no larger alignment");
    if constexpr (Traits::movesAsBytes) {
        data_ = static_cast<T*>(kprealloc(data_, bytes(count)));
    } else {
        T* const old = data_;
        data_ = static_cast<T*>(kpmalloc(bytes(count)));
        for (long i = 0; i < size_; ++i) {
            ::new (static_cast<void*>(data_ + i)) T(std::move(old[i]));
            old[i].~T();
        }
        kpfree(old);
    }
}

/// Moves `count` live elements from one index to another that holds none; the ranges may overlap.
template <typename T>
void KpDArray<T>::moveElements(long to, long from, long count)
{
    if constexpr (Traits::movesAsBytes) {
        moveBytes(data_ + to, data_ + from, count);
    } else {
        for (long k = 0; k < count; ++k) {
            const long i = to < from ? k : count - 1 - k;
            ::new (static_cast<void*>(data_ + to + i)) T(std::move(data_[from + i]));
            data_[from + i].~T();
        }
    }
}

template <typename T>
void KpDArray<T>::constructTo(long newSize)
{
    if constexpr (isManaged) {
        for (; size_ < newSize; ++size_)  // the size follows each element, so that one that throws leaves no raw ones
            ::new (static_cast<void*>(data_ + size_)) T();
    } else {
        size_ = newSize;
    }
}

template <typename T>
void KpDArray<T>::destroyFrom(long newSize) noexcept
{
    if (size_ <= newSize)
        return;
    const long oldSize = size_;
    size_ = newSize;
    if constexpr (isManaged) {
        for (long i = newSize; i < oldSize; ++i)
            data_[i].~T();
    }
}

template <typename T>
void KpDArray<T>::copyIntoGap(long pos, long count, const T* src)
{
    if constexpr (Traits::kind == KpElementKind::Bytes) {
        moveBytes(data_ + pos, src, count);
    } else {
        long i = count;
        try {
            while (i > 0) {
                ::new (static_cast<void*>(data_ + pos + i - 1)) T(src[i - 1]);
                --i;
            }
        } catch (...) {
            for (; i < count; ++i)
                data_[pos + i].~T();
            moveElements(pos, pos + count, size_ - pos - count);
            size_ -= count;
            throw;
        }
    }
}

/// -1, 1 or 0 by operator<, for insertSorted; the order of KpString is that of strcmp.
template <typename T>
int kpStandardCompare(const T& a, const T& b)
{
    return a < b ? -1 : b < a ? 1 : 0;
}
