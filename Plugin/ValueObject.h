#pragma once

#include "Plugin/Ref.h"
#include "Shared/Util/PropertyValue.h"

namespace ZorvaTouch {

/// A value for the other side of the boundary. Null makes a value of kind null, not a null pointer.
///
/// Threads: any.
/// @throws std::length_error  The value has more than `ZORVA_VALUE_MAX_LEVELS` levels or
///                            `ZORVA_VALUE_MAX_PARTS` parts.
/// @throws std::bad_alloc
[[nodiscard]] Ref<const ZorvaValue> makeValue(const PropertyValue &value);

/// Reads a value of the other side into one of ours, whole.
///
/// @param value  Borrowed. Null reads as null, as does an unknown kind.
/// @throws std::length_error  The value is beyond the limits that hold for `makeValue` (it contains itself,
///                            say), or claims a text longer than memory.
/// @throws std::bad_alloc
[[nodiscard]] PropertyValue readValue(const ZorvaValue *value);

} // namespace ZorvaTouch
