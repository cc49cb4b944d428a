#pragma once

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>

#include <string>
#include <vector>

/// The values of the attributes of one frame: those of the frame's own functional groups first, then those of the
/// shared groups, then those of the data set. A single-frame image has only the last.
class FrameValues {
public:
    /// `frame` counts from 0. The data set stays the caller's.
    FrameValues(DcmItem& dataSet, unsigned long frame);

    /// Null if no group and not the data set has the attribute, or if it is empty.
    DcmElement* find(const DcmTagKey& tag) const;
    bool has(const DcmTagKey& tag) const { return find(tag) != nullptr; }

    /// All values, separated by backslashes, without padding; empty if there are none.
    std::string text(const DcmTagKey& tag) const;
    /// The first `n` values. False, and `out` as it was, if one of them is missing or not a finite number.
    bool reals(const DcmTagKey& tag, double* out, unsigned long n) const;
    double real(const DcmTagKey& tag, double otherwise) const;
    int integer(const DcmTagKey& tag, int otherwise) const;

    DcmItem& dataSet() const { return dataSet_; }

private:
    DcmItem& dataSet_;
    DcmItem* own_ = nullptr;
    DcmItem* shared_ = nullptr;
};

/// The text of an element, all values. Binary numbers are written as the shortest text that reads back to the same
/// bits.
std::string textOf(DcmElement& element);

/// Value `i` of an element, exactly as written; false if it is missing or not a finite number.
bool realOf(DcmElement& element, unsigned long i, double& out);

/// The element `offset` of the private block of `creator` in `group`; null if there is none.
DcmElement* findPrivate(DcmItem& item, Uint16 group, const char* creator, Uint16 offset);
