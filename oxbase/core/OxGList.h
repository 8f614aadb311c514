// OxGList.h: the growable array used throughout OxBase.
//
// An OxGList<T> holds values of T in insertion order with capacity doubling
// from 4. It owns its array and never what pointer elements point to: the
// class that holds the list releases those itself before letting it go.
//
//   OxGList<char *> names;
//   names.append(OxString::dup("part.xml"));
//   for (unsigned int i = 0; i < names.getLength(); i++) delete[] names[i];
#ifndef OXBASE_CORE_OXGLIST_H
#define OXBASE_CORE_OXGLIST_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxTypes.h"

#include <new>

#include <cstdio>

namespace oxbase {
namespace detail {
/// Writes the out-of-range report of an element access to standard output.
OXBASE_API void reportListRange(unsigned int index, unsigned int length);
} // namespace detail
} // namespace oxbase

/// Growable array with capacity 0 or a power of two and indices from 0.
///
/// Element access beyond `length` writes
/// "Ooops, trying to access element <i> in OxList of length <n>\n" to standard
/// output and goes on; callers keep indices below `length`.
template <class T> class OxGList {
public:
    T* data = nullptr;         ///< the array, null while the list has no storage
    unsigned int capacity = 0; ///< slots in `data`
    unsigned int length = 0;   ///< slots in use

    /// An empty list with capacity 4.
    OxGList() { reserve(4); }

    /// An empty list with `initialCapacity` slots as reserve rounds them (0:
    /// no storage until the first append). For owners that know their lists
    /// stay short, such as the attribute lists of document elements.
    explicit OxGList(unsigned int initialCapacity) {
        if (initialCapacity > 0) {
            reserve(initialCapacity);
        }
    }

    /// A copy with the same elements (the same pointees for pointer elements).
    OxGList(const OxGList<T>& other) {
        reserve(other.capacity);
        copyElements(other);
    }

    OxGList<T>& operator=(const OxGList<T>& other) {
        if (this != &other) {
            length = 0;
            reserve(other.capacity);
            copyElements(other);
        }
        return *this;
    }

    virtual ~OxGList() {
        delete[] data;
        data = nullptr;
    }

    unsigned int getLength() const { return length; }

    /// Grows the array to the smallest power of two not below `count`
    /// (1 for a count below 2). A count within the capacity changes nothing.
    /// Without memory, or for a count above 2^31, std::bad_alloc and the list
    /// is unchanged.
    void reserve(unsigned int count) {
        if (count <= capacity) {
            return;
        }
        unsigned int newCapacity = 1;
        while (newCapacity < count && newCapacity != 0) {
            newCapacity <<= 1;
        }
        if (newCapacity == 0) {
            // No power of two holds `count`: the array cannot grow, which is
            // told as exhausted memory is.
            throw std::bad_alloc();
        }
        T* grown = new T[newCapacity];
        if (length != 0 && data != nullptr) {
            for (unsigned int i = 0; i < length; i++) {
                grown[i] = data[i];
            }
        }
        delete[] data;
        data = grown;
        capacity = newCapacity;
    }

    /// Stores `value` behind the last element; returns the index it got.
    /// `value` may be an element of this list: it is copied before the array
    /// grows. Without memory std::bad_alloc, and the list is unchanged.
    unsigned int append(const T& value) {
        if (capacity <= length) {
            T copy = value;
            reserve(length + 1);
            data[length] = copy;
        } else {
            data[length] = value;
        }
        return length++;
    }

    /// The slot at `index`, after the range report when `index` > `length`.
    /// An index with no slot in the array (at or beyond the capacity, or any
    /// index of a list without storage) yields a spare slot that holds a
    /// value-initialised T, so that such a mistake never touches memory
    /// outside the array.
    T& operator[](unsigned int index) {
        checkRange(index);
        return index < capacity && data != nullptr ? data[index] : spareSlot();
    }
    const T& operator[](unsigned int index) const {
        checkRange(index);
        return index < capacity && data != nullptr ? data[index] : spareSlot();
    }

    /// Stores `value` in the slot at `index`, after the same range report; an
    /// index with no slot stores nothing.
    void set(unsigned int index, const T& value) {
        checkRange(index);
        if (index < capacity && data != nullptr) {
            data[index] = value;
        }
    }

    /// Releases the array (not the pointees): capacity 0, length 0.
    void makeEmpty() {
        delete[] data;
        data = nullptr;
        capacity = 0;
        length = 0;
    }

    /// For pointer elements: packs the non-null elements to the front in order; capacity stays.
    void removeNulls() {
        unsigned int kept = 0;
        for (unsigned int i = 0; i < length; i++) {
            if (!(data[i] == T())) {
                data[kept++] = data[i];
            }
        }
        length = kept;
    }

    /// Ascending in-place sort: quicksort with median of three, insertion sort
    /// for ranges of fewer than 10 elements.
    void sort() {
        if (data == nullptr || length < 2) {
            return;
        }
        quickSort(0, static_cast<long long>(length) - 1);
    }

    /// On a sorted list: keeps the first of each run of equal values.
    void removeDuplicates() {
        if (data == nullptr || length < 2) {
            return;
        }
        unsigned int kept = 1;
        for (unsigned int i = 1; i < length; i++) {
            if (data[i] != data[kept - 1]) {
                data[kept++] = data[i];
            }
        }
        length = kept;
    }

private:
    /// One slot per element type for indices outside the array, cleared
    /// at every use (the library runs on one thread at a time).
    static T& spareSlot() {
        static T slot{};
        slot = T();
        return slot;
    }

    void checkRange(unsigned int index) const {
        if (index > length) {
            oxbase::detail::reportListRange(index, length);
        }
    }

    void copyElements(const OxGList<T>& other) {
        for (unsigned int i = 0; i < other.length; i++) {
            data[i] = other.data[i];
        }
        length = other.length;
    }

    void swapAt(long long a, long long b) {
        T tmp = data[a];
        data[a] = data[b];
        data[b] = tmp;
    }

    // Indices are signed 64-bit so that `i - 1` below a range start is harmless.
    void quickSort(long long left, long long right) {
        while (right > left) {
            if (left + 9 > right) {
                for (long long p = left + 1; p <= right; p++) {
                    T value = data[p];
                    long long j = p;
                    for (; j > left && value < data[j - 1]; j--) {
                        data[j] = data[j - 1];
                    }
                    data[j] = value;
                }
                return;
            }
            long long center = (left + right) / 2;
            if (data[center] < data[left]) {
                swapAt(left, center);
            }
            if (data[right] < data[left]) {
                swapAt(left, right);
            }
            if (data[right] < data[center]) {
                swapAt(center, right);
            }
            T pivot = data[center];
            swapAt(center, right - 1);
            long long i = left;
            long long j = right - 1;
            for (;;) {
                while (data[++i] < pivot) {
                }
                while (pivot < data[--j]) {
                }
                if (i >= j) {
                    break;
                }
                swapAt(i, j);
            }
            swapAt(i, right - 1);
            quickSort(left, i - 1);
            left = i + 1;
        }
    }
};

#endif
