#include "Shared/Util/StateKey.h"

namespace ZorvaTouch::Util {

bool stripDomainFromKey(std::string &key, std::string_view domain) {
    const std::string_view text = key;
    if (!text.starts_with(domain) || !text.substr(domain.size()).starts_with('.'))
        return false;
    key.erase(0, domain.size() + 1);
    return true;
}

} // namespace ZorvaTouch::Util
