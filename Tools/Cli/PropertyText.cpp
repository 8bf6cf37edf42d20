#include "Tools/Cli/PropertyText.h"

#include "Shared/Util/Json.h"

#include <algorithm>
#include <cstddef>
#include <string_view>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::size_t kIndent = 2; // blanks a level

void appendIndented(std::string &text, const PropertyValue &value, std::size_t level);

void startLine(std::string &text, std::size_t level) { text.append("\n").append(level * kIndent, ' '); }

bool isScalar(const PropertyValue &value) { return !value.asArray() && !value.asDictionary(); }

void appendDictionary(std::string &text, const PropertyValue::Dictionary &entries, std::size_t level) {
    std::string_view opening = "{";
    for (const auto &[key, value] : entries) {
        startLine(text.append(opening), level + 1);
        Util::appendJsonString(text, key);
        appendIndented(text.append(": "), value, level + 1);
        opening = ",";
    }
    startLine(text, level);
    text.append("}");
}

void appendArray(std::string &text, const PropertyValue::Array &elements, std::size_t level) {
    std::string_view opening = "[";
    for (const PropertyValue &element : elements) {
        startLine(text.append(opening), level + 1);
        appendIndented(text, element, level + 1);
        opening = ",";
    }
    startLine(text, level);
    text.append("]");
}

void appendIndented(std::string &text, const PropertyValue &value, std::size_t level) {
    const PropertyValue::Array *const array = value.asArray();
    const PropertyValue::Dictionary *const dictionary = value.asDictionary();
    if (dictionary && !dictionary->empty())
        appendDictionary(text, *dictionary, level);
    else if (array && !std::all_of(array->begin(), array->end(), isScalar))
        appendArray(text, *array, level);
    else // a list of plain things is best read in one line
        Util::appendJson(text, value, level + 1);
}

} // namespace

void appendReadable(std::string &text, const PropertyValue &value) {
    if (const std::string *const string = value.asString())
        text.append(*string);
    else
        appendIndented(text, value, 0);
}

} // namespace ZorvaTouch::Tools
