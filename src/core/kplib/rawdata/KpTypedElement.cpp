#include <kplib/rawdata/KpTypedElement.h>

#include <kplib/cpu/Loose.h>
#include <kplib/foundation/KpPrimTypeVisit.h>

#include <cmath>
#include <type_traits>

namespace {

using kplib::detail::Loose;

// What arithmetic on T is done in: unsigned for integers, since that wraps where signed overflow is undefined.
template <typename T>
struct Arithmetic : std::type_identity<std::uint32_t> {
};
template <>
struct Arithmetic<float> : std::type_identity<float> {
};
template <>
struct Arithmetic<double> : std::type_identity<double> {
};

template <typename Operation>
void combine(const KpTypedElement& target, const KpTypedElement& other, Operation operation)
{
    kpVisitNumberType(target.type(), [&]<typename T>(KpElementTag<T>) {
        using Number = typename Arithmetic<T>::type;
        auto* left = static_cast<Loose<T>*>(target.data());
        auto* right = static_cast<const Loose<T>*>(other.data());
        for (std::int32_t i = 0; i < target.n(); ++i)
            left[i].value = static_cast<T>(operation(static_cast<Number>(left[i]), static_cast<Number>(right[i])));
    });
}

}  // namespace

KpTypedElement& KpTypedElement::operator+=(const KpTypedElement& other)
{
    combine(*this, other, [](auto a, auto b) { return a + b; });
    return *this;
}

KpTypedElement& KpTypedElement::operator-=(const KpTypedElement& other)
{
    combine(*this, other, [](auto a, auto b) { return a - b; });
    return *this;
}

double KpTypedElement::length() const
{
    double sum = 0.0;
    kpVisitNumberType(type_, [&]<typename T>(KpElementTag<T>) {
        auto* components = static_cast<const Loose<T>*>(data_);
        for (std::int32_t i = 0; i < n_; ++i) {
            const auto component = static_cast<double>(components[i].value);
            sum += component * component;
        }
    });
    return std::sqrt(sum);
}
