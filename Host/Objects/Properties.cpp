#include "Host/Objects/Properties.h"

#include "Plugin/Guarded.h"
#include "Plugin/ValueObject.h"

#include <algorithm>
#include <utility>

namespace ZorvaTouch::Host {

Properties::Properties(PropertyValue::Dictionary values) : _values(std::move(values)) {}

PropertyValue Properties::get(std::string_view key) const {
    MutexLock lock(_lock);
    const auto found = _values.find(key);
    return found == _values.end() ? PropertyValue() : found->second;
}

void Properties::set(std::string_view key, PropertyValue value) {
    MutexLock lock(_lock);
    store(key, std::move(value));
}

void Properties::makeReadOnly(std::string_view key) {
    MutexLock lock(_lock);
    _readOnly.emplace(key);
}

bool Properties::match(const PropertyValue &wanted) const {
    const PropertyValue::Dictionary *const entries = wanted.asDictionary();
    return entries && std::all_of(entries->begin(), entries->end(),
                                  [this](const auto &entry) { return get(entry.first) == entry.second; });
}

const ZorvaValue *Properties::copyForOther(const char *key) const noexcept {
    return guarded<const ZorvaValue *>(nullptr, [&]() -> const ZorvaValue * {
        const PropertyValue value = key ? get(key) : PropertyValue();
        return value.isNull() ? nullptr : makeValue(value).release();
    });
}

bool Properties::setFromOther(const char *key, const ZorvaValue *value) noexcept {
    return guarded(false, [&] {
        if (!key)
            return false;
        PropertyValue read = readValue(value); // not under the lock: it is the other side that is asked
        MutexLock lock(_lock);
        if (_readOnly.contains(key))
            return false;
        store(key, std::move(read));
        return true;
    });
}

void Properties::store(std::string_view key, PropertyValue value) {
    if (!value.isNull())
        _values.insert_or_assign(std::string(key), std::move(value));
    else if (const auto found = _values.find(key); found != _values.end())
        _values.erase(found);
}

} // namespace ZorvaTouch::Host
