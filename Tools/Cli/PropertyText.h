#pragma once

#include "Shared/Util/PropertyValue.h"

#include <string>

namespace ZorvaTouch::Tools {

/// Appends a value for people: JSON, indented by two blanks a level; a string on its own as it is.
void appendReadable(std::string &text, const PropertyValue &value);

} // namespace ZorvaTouch::Tools
