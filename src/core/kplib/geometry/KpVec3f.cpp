#include <kplib/geometry/KpVec3f.h>

#include <initializer_list>

KpVec3f KpVec3f::getClosestAxis() const
{
    KpVec3f closest(0, 0, 0);
    float best = -1;
    for (int axis = 0; axis < 3; ++axis) {
        for (const float sign : {1.0F, -1.0F}) {
            KpVec3f candidate(0, 0, 0);
            candidate[axis] = sign;
            const float score = candidate.dot(*this);
            if (score > best) {
                best = score;
                closest = candidate;
            }
        }
    }
    return closest;
}

std::string KpVec3f::dump() const
{
    return R"({"x":")" + std::to_string(x()) + R"(","y":")" + std::to_string(y()) + R"(","z":")" + std::to_string(z()) +
           R"("})";
}
