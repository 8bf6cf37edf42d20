#pragma once

#include "Plugin/Ref.h"
#include "Shared/Util/PropertyValue.h"

namespace ZorvaTouch {

/// A value for the other side of the boundary. Null makes a value of kind null, not a null pointer.
///
/// Threads: any.
/// @throws std::bad_alloc
[[nodiscard]] Ref<const ZorvaValue> makeValue(const PropertyValue &value);

/// Reads a value of the other side into one of ours, whole.
///
/// @param value  Borrowed. Null reads as null, as does an unknown kind. What a careless or hostile maker can
///               do is bounded: below 64 levels everything is null, and a value of a million parts or more
///               (one that contains itself, say) is null as a whole.
/// @throws std::bad_alloc, std::length_error
[[nodiscard]] PropertyValue readValue(const ZorvaValue *value);

} // namespace ZorvaTouch
