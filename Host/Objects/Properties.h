#pragma once

#include "Host/Interface/Mutex.h"
#include "Plugin/Ref.h"
#include "Shared/Util/PropertyValue.h"

#include <functional>
#include <set>
#include <string>
#include <string_view>

namespace ZorvaTouch::Host {

/// Named values, as a device or a service of the host has them. A name without a value reads as null.
///
/// Threads: any.
class Properties {
public:
    explicit Properties(PropertyValue::Dictionary values = {});

    // The host's own side. @throws std::bad_alloc

    [[nodiscard]] PropertyValue get(std::string_view key) const;
    /// Sets a value, read-only or not; null takes it away.
    void set(std::string_view key, PropertyValue value);
    /// From now on the other side's writes are refused.
    void makeReadOnly(std::string_view key);
    /// Whether all entries of `wanted` are here with equal values: kind and content. An empty dictionary asks
    /// for nothing; what is no dictionary matches nothing.
    [[nodiscard]] bool match(const PropertyValue &wanted) const;

    // The other side, as the tables of the boundary say it.

    /// @return A reference for the caller, or null: no such value, or no memory.
    [[nodiscard]] const ZorvaValue *copyForOther(const char *key) const noexcept;
    /// @return Whether the value was taken: not if the key is read-only or null, or without memory.
    [[nodiscard]] bool setFromOther(const char *key, const ZorvaValue *value) noexcept;

private:
    void store(std::string_view key, PropertyValue value) ZORVA_REQUIRES(_lock);

    mutable Mutex _lock;
    PropertyValue::Dictionary _values ZORVA_GUARDED_BY(_lock);
    std::set<std::string, std::less<>> _readOnly ZORVA_GUARDED_BY(_lock);
};

} // namespace ZorvaTouch::Host
