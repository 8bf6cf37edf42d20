#include "Tools/Cli/LiveJson.h"

#include "Shared/Util/Json.h"
#include "Shared/Util/Text.h"

namespace ZorvaTouch::Tools {

void LiveJson::print(const LiveGesture &gesture) {
    std::string &text = _output.text();
    Util::appendJsonString(text.append(R"({"gesture":)"), nameOf(gesture.gesture));
    text.append(R"(,"region":)");
    if (gesture.region == kPixelRegionNone)
        text.append("null");
    else
        Util::appendJsonString(text, nameOf(gesture.region));
    Util::appendUnsigned(text.append(R"(,"timeNs":)"), gesture.timeNs);
    Util::appendJsonString(text.append(R"(,"action":)"), nameOf(gesture.action));
    text.append("}\n");
    _output.wrote();
}

} // namespace ZorvaTouch::Tools
