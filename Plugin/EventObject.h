#pragma once

#include "Plugin/Ref.h"
#include "Shared/HostEvent.h"

#include <memory>
#include <optional>

namespace ZorvaTouch {

/// An event for the other side of the boundary. It shares `event`, which no longer changes.
///
/// Threads: any.
/// @throws std::bad_alloc
[[nodiscard]] Ref<const ZorvaEvent> makeEvent(std::shared_ptr<const HostEvent> event);

/// Reads an event of the other side into one of ours, as far as ours goes: its type decides which fields are
/// asked for. Null for a null event and for a type that is none of `HostEventType`.
/// @throws std::bad_alloc
[[nodiscard]] std::shared_ptr<HostEvent> readEvent(const ZorvaEvent *event);

} // namespace ZorvaTouch
