#include "Digest.h"

#include <kplib/foundation/KpString.h>

namespace kplib::probe {

Digest& Digest::add(const void* data, std::size_t size)
{
    const auto* const bytes = static_cast<const unsigned char*>(data);
    for (std::size_t i = 0; i < size; ++i)
        value_ = (value_ ^ bytes[i]) * 1099511628211U;
    return *this;
}

Digest& Digest::operator<<(const KpString& text)
{
    return *this << std::string_view(text);
}

}  // namespace kplib::probe
