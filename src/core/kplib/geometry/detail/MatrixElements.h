#pragma once

#include <cmath>
#include <string>

namespace kplib::detail {

// Whether no element differs by strictly more than `tolerance`; NaN does not.
template <int Count>
bool elementsEqual(const float* a, const float* b, float tolerance)
{
    for (int i = 0; i < Count; ++i) {
        if (std::abs(a[i] - b[i]) > tolerance)
            return false;
    }
    return true;
}

// {"m00":"1.000000", ... } of a square matrix, row by row.
template <int Size>
std::string dumpElements(const float* elements)
{
    std::string text = "{";
    for (int i = 0; i < Size * Size; ++i) {
        text += i == 0 ? "\"m" : ",\"m";
        text += std::to_string(i / Size) + std::to_string(i % Size) + "\":\"" + std::to_string(elements[i]) + '"';
    }
    return text + '}';
}

}  // namespace kplib::detail
