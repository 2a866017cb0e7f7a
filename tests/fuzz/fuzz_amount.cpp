// Typed and imported amounts: whatever the text, reading it, rounding it to
// cents and showing it as money stays defined behaviour.
#include "component/money.h"

#include <cmath>
#include <cstdint>
#include <cstdlib>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    static const QLocale locales[] = {QLocale::c(), QLocale(QLocale::Portuguese, QLocale::Portugal),
                                      QLocale(QLocale::German, QLocale::Germany), QLocale(QLocale::English, QLocale::UnitedStates)};
    const QString text = QString::fromUtf8(reinterpret_cast<const char*>(data), qsizetype(size));
    const std::optional<double> value = quotas::parseDecimal(text);
    if (!value)
        return 0;
    for (const QLocale& locale : locales) {
        if (!std::isfinite(*value))
            std::abort();
        const double cents = quotas::roundCents(*value);
        if (quotas::formatMoney(cents, locale).isEmpty())
            std::abort();
    }
    return 0;
}
