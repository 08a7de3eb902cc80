#include "Foundation/Date.h"

#include "Foundation/Clock.h"
#include "Foundation/GregorianDate.h"
#include "Foundation/String.h"

#include <cmath>
#include <functional>

namespace Foundation {

DateReturner Date::date(double absoluteTime) {
    if (absoluteTime == 0.0 || std::isnan(absoluteTime)) return nullptr;
    return DateReturner(new Date(absoluteTime));
}

DateReturner Date::now() {
    return nowPlus(0);
}

DateReturner Date::nowPlus(double seconds) {
    return date(Clock::current().now() + seconds);
}

DateReturner Date::addTime(double seconds) const {
    return date(mAbsoluteTime + seconds);
}

double Date::getTimeAgo(const Date* date) {
    return Clock::current().now() - getAbsoluteTime(date);
}

int Date::compare(const Date& other) const {
    return (mAbsoluteTime > other.mAbsoluteTime) - (mAbsoluteTime < other.mAbsoluteTime);
}

std::size_t Date::getHash() const {
    return std::hash<double>()(mAbsoluteTime);
}

bool Date::isEqual(const PFRefCounted* other) const {
    const auto* date = dynamic_cast<const Date*>(other);
    return date && date->mAbsoluteTime == mAbsoluteTime;
}

StringReturner Date::toString() const {
    const GregorianDate d = GregorianDate::inGMT(mAbsoluteTime);
    return String::stringWithFormat("%04d-%02d-%02d %02d:%02d:%02d +0000", d.year, d.month, d.day,
                                    d.hour, d.minute, static_cast<int>(d.second));
}

}  // namespace Foundation
