#pragma once

#include <string>
#include <string_view>

namespace ZorvaTouch::Util {

/// Removes one leading domain and its dot from a dotted state key: "Algs.Algs.x" in "Algs" becomes "Algs.x".
///
/// @param key     Changed in place, only when the function returns true.
/// @param domain  Without the dot. Compared byte by byte, case-sensitively.
/// @return Whether `key` began with `domain` followed by a dot. A key equal to the domain is not stripped.
[[nodiscard]] bool stripDomainFromKey(std::string &key, std::string_view domain);

} // namespace ZorvaTouch::Util
