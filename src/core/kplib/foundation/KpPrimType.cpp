#include <kplib/foundation/KpPrimType.h>

#include <cstring>

const char* const KpPrimType::primTypeName[] = {"byte",    "short",  "int",    "float", "double",
                                                "complex", "string", "ushort", "uint",  "sbyte"};

const std::int32_t KpPrimType::primTypeSize[] = {1, 2, 4, 4, 8, 8, 8, 2, 4, 1};

bool KpPrimType::nameToType(const char* name, Type& type)
{
    for (int i = 0; i < NumTypes; ++i) {
        if (std::strcmp(name, primTypeName[i]) == 0) {
            type = static_cast<Type>(i);
            return true;
        }
    }
    return false;
}
