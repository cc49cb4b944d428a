#pragma once

#include <kplib/geometry/KpMat3f.h>
#include <kplib/geometry/KpMat4f.h>

#include <array>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>

namespace kplib::test {

/// Numbers from -2 to 2 from a fixed seed; a `special` one mixes in zeros, infinities, NaN, tiny and huge numbers.
class Random {
public:
    explicit Random(unsigned seed, bool special = false) : engine_(seed), special_(special) {}

    float number()
    {
        using Limits = std::numeric_limits<float>;
        const float specials[] = {0,     -0.0F,   Limits::infinity(),  -Limits::infinity(), Limits::quiet_NaN(),
                                  1e30F, -1e-30F, Limits::denorm_min()};
        const unsigned choice = special_ ? engine_() % 32 : 8;
        return choice < 8 ? specials[choice] : static_cast<float>(engine_()) * 0x1p-30F - 2;
    }
    KpVec3f vector()
    {
        const float x = number(), y = number();
        return {x, y, number()};
    }
    KpMat3f matrix3()
    {
        const KpVec3f x = vector(), y = vector();
        return {x, y, vector()};
    }
    KpMat4f matrix4()
    {
        KpMat4f matrix;
        for (int i = 0; i < 16; ++i)
            matrix[i / 4][i % 4] = number();
        return matrix;
    }
    KpMat4f affine()
    {
        KpMat4f matrix = matrix4();
        for (int i = 0; i < 4; ++i)
            matrix[i][3] = i == 3;
        return matrix;
    }

private:
    std::mt19937 engine_;
    bool special_;
};

/// The floats of an object as words, all NaN alike: which one of two comes out is left open by the processor.
template <typename Object>
std::array<std::uint32_t, sizeof(Object) / 4> bits(const Object& object)
{
    std::array<std::uint32_t, sizeof(Object) / 4> words;
    std::memcpy(words.data(), &object, sizeof object);
    for (std::uint32_t& word : words) {
        float value;
        std::memcpy(&value, &word, 4);
        if (std::isnan(value))
            word = 0x7FC00000;
    }
    return words;
}

}  // namespace kplib::test
