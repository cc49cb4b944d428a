#pragma once

namespace kplib::detail {

// What a code of KpResult says by itself; null where it has no such text.
struct KpResultTexts {
    const char* shortText;
    const char* defaultData;
};
KpResultTexts resultTexts(int code);

}  // namespace kplib::detail
