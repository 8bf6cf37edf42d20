#include "Shared/RecordingContainer.h"

#include "Shared/Util/Hex.h"
#include "Shared/Util/Json.h"
#include "Shared/Util/Text.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <utility>
#include <vector>

namespace ZorvaTouch {
namespace {

constexpr std::string_view kVersionKey = "Version";
constexpr std::string_view kFramesKey = "Frames";
constexpr std::string_view kReportsKey = "Reports"; // version 0
constexpr std::string_view kTypeKey = "Type";
constexpr std::string_view kTimestampKey = "Timestamp";
constexpr std::string_view kKeyKey = "Key";
constexpr std::string_view kValueKey = "Value";
constexpr std::string_view kDataKey = "Data";
constexpr std::string_view kReportKey = "Report";         // version 1
constexpr std::string_view kReportDataKey = "ReportData"; // version 0
constexpr std::uint64_t kCurrentVersion = 2;
constexpr std::size_t kValueDepth = 4; // container, frames, frame, value

struct TypeName {
    std::string_view name;
    FrameType type;
};
constexpr std::array<TypeName, 3> kTypeNames{{{"State", FrameType::State},
                                              {"InputReport", FrameType::InputReport},
                                              {"Metadata", FrameType::Metadata}}};
constexpr std::string_view kInputReportName = kTypeNames[1].name;

// --- Writing

bool hasName(FrameType type) { return static_cast<std::size_t>(type) < kTypeNames.size(); }

std::string_view nameOf(FrameType type) { return kTypeNames[static_cast<std::size_t>(type)].name; }

void appendFrame(std::string &text, const FrameView &frame) {
    text.append(R"({"Type":")").append(nameOf(frame.type)).append(R"(","Timestamp":)");
    Util::appendUnsigned(text, frame.timestampNs);
    if (frame.type == FrameType::InputReport) {
        text.append(R"(,"Data":")");
        Util::appendHexString(text, frame.data);
        text.append("\"}");
        return;
    }
    text.append(R"(,"Key":)");
    Util::appendJsonString(text, frame.key);
    if (!frame.value
             .isNull()) { // a null value leaves no "Value" behind, and such a frame cannot be read again
        text.append(R"(,"Value":)");
        Util::appendJson(text, frame.value, kValueDepth);
    }
    text.push_back('}');
}

/// A little more than a frame with an image report takes.
constexpr std::size_t kTypicalFrameLength = 300;

// --- Reading the current version

using Member = std::optional<Util::JsonValue>;

/// A frame object's members, by name. Of equal names the last one holds.
struct FrameMembers {
    Member type, timestamp, key, value, data;
};

struct MemberName {
    std::string_view name;
    Member FrameMembers::*member;
};
constexpr std::array<MemberName, 5> kMemberNames{{{kTypeKey, &FrameMembers::type},
                                                  {kTimestampKey, &FrameMembers::timestamp},
                                                  {kDataKey, &FrameMembers::data},
                                                  {kKeyKey, &FrameMembers::key},
                                                  {kValueKey, &FrameMembers::value}}};

FrameMembers readMembers(Util::JsonValue frame) {
    FrameMembers members;
    if (frame.kind() != Util::JsonValue::Kind::Object)
        return members; // lacks everything
    Util::JsonObjectReader reader(frame);
    std::string_view name;
    Util::JsonValue value;
    while (reader.next(name, value))
        for (const MemberName &entry : kMemberNames)
            if (entry.name == name)
                members.*entry.member = value;
    return members;
}

std::optional<std::string_view> stringOf(const Member &member) {
    return member ? member->asString() : std::nullopt;
}

std::optional<FrameType> typeOf(const FrameMembers &members) {
    const auto name = stringOf(members.type);
    const auto entry = std::find_if(kTypeNames.begin(), kTypeNames.end(),
                                    [&name](const TypeName &candidate) { return name == candidate.name; });
    return entry == kTypeNames.end() ? std::nullopt : std::optional(entry->type);
}

/// Turns frame objects into frames, one after the other, and says what is wrong with one and which it is.
class FrameReader {
public:
    FrameList takeFrames() { return std::move(_frames); }

    void read(Util::JsonValue value) {
        const FrameMembers members = readMembers(value);
        const auto type = typeOf(members);
        require(type.has_value(), "invalid frame type");
        const auto timestampNs = members.timestamp ? members.timestamp->asUnsigned() : std::nullopt;
        require(timestampNs.has_value(), "invalid frame timestamp");
        switch (*type) {
        case FrameType::InputReport:
            readReport(*timestampNs, members);
            break;
        case FrameType::State:
            readKeyed(*type, *timestampNs, members, "invalid state key", "invalid state value class");
            break;
        case FrameType::Metadata:
            readKeyed(*type, *timestampNs, members, "invalid metadata key", "invalid metadata value class");
            break;
        }
    }

private:
    void require(bool condition, const char *message) const {
        if (!condition)
            throw FrameError(message, _frames.size());
    }

    void readReport(std::uint64_t timestampNs, const FrameMembers &members) {
        const auto text = stringOf(members.data);
        require(text.has_value(), "invalid report");
        try {
            Util::bytesFromHexString(*text, _report);
        } catch (const std::invalid_argument &error) {
            throw FrameError(error.what(), _frames.size());
        }
        _frames.appendReport(timestampNs, _report);
    }

    void readKeyed(FrameType type, std::uint64_t timestampNs, const FrameMembers &members,
                   const char *keyMessage, const char *valueMessage) {
        const auto key = stringOf(members.key);
        require(key.has_value(), keyMessage);
        require(members.value.has_value(), valueMessage);
        _frames.append({type, timestampNs, std::string(*key), members.value->toPropertyValue(), {}});
    }

    FrameList _frames;
    std::vector<std::uint8_t> _report; ///< kept for its capacity
};

/// The members of a container object that count; of equal names the last one.
struct ContainerMembers {
    Member version, frames;
};

ContainerMembers readContainerMembers(Util::JsonValue root) {
    ContainerMembers members;
    if (root.kind() != Util::JsonValue::Kind::Object)
        return members;
    Util::JsonObjectReader reader(root);
    std::string_view name;
    Util::JsonValue value;
    while (reader.next(name, value)) {
        if (name == kVersionKey)
            members.version = value;
        else if (name == kFramesKey)
            members.frames = value;
    }
    return members;
}

FrameList readFrames(const Member &frames) {
    if (!frames || frames->kind() != Util::JsonValue::Kind::Array)
        throw std::invalid_argument("invalid frames");
    FrameReader reader;
    Util::JsonArrayReader elements(*frames);
    Util::JsonValue element;
    while (elements.next(element))
        reader.read(element);
    return reader.takeFrames();
}

// --- Migration

/// A container's version if it is one that is known.
std::optional<std::uint64_t> knownVersion(const PropertyValue &version) {
    for (std::uint64_t known = 0; known <= kCurrentVersion; ++known) {
        const bool same = version.asUnsigned()
                              ? *version.asUnsigned() == known
                              : version.asDouble() && *version.asDouble() == static_cast<double>(known);
        if (same)
            return known;
    }
    return std::nullopt;
}

/// The number as it stands in the text. Negative whole numbers read as floating point and are shown without
/// ".0".
std::string versionText(const PropertyValue &version) {
    const double *number = version.asDouble();
    const bool isNegativeInteger =
        number && *number < 0.0 && *number >= -9.0e15 && *number == std::trunc(*number);
    if (!isNegativeInteger)
        return Util::jsonText(version);
    std::string text;
    Util::appendInteger(text, static_cast<std::int64_t>(*number));
    return text;
}

std::uint64_t versionOf(const PropertyValue &object) {
    if (!object.asDictionary())
        throw std::invalid_argument("invalid container");
    const PropertyValue *version = object.find(kVersionKey);
    if (!version || !(version->asUnsigned() || version->asDouble())) // a boolean is no number here
        throw std::invalid_argument("invalid version");
    const auto known = knownVersion(*version);
    if (!known)
        throw std::invalid_argument("invalid container version: " + versionText(*version));
    return *known;
}

PropertyValue containerOf(std::uint64_t version, PropertyValue frames) {
    return PropertyValue::Dictionary{{std::string(kVersionKey), version},
                                     {std::string(kFramesKey), std::move(frames)}};
}

const PropertyValue &requireMember(const PropertyValue &frame, std::string_view name, std::size_t index) {
    const PropertyValue *member = frame.find(name);
    if (!member)
        throw FrameError("frame lacks " + std::string(name), index);
    return *member;
}

/// A version-0 report as a version-1 frame.
PropertyValue frameFromReport(const PropertyValue &report, std::size_t index) {
    const PropertyValue &timestamp = requireMember(report, kTimestampKey, index);
    const PropertyValue &data = requireMember(report, kReportDataKey, index);
    return PropertyValue::Dictionary{{std::string(kTimestampKey), timestamp},
                                     {std::string(kTypeKey), kInputReportName},
                                     {std::string(kReportKey), data}};
}

/// A version-1 frame as a version-2 frame.
PropertyValue frameWithData(const PropertyValue &frame, std::size_t index) {
    const std::string *type = requireMember(frame, kTypeKey, index).asString();
    if (!type)
        throw FrameError("frame Type isn't a string", index);
    if (*type != kInputReportName)
        return frame;
    const PropertyValue &report = requireMember(frame, kReportKey, index);
    PropertyValue::Dictionary migrated = *frame.asDictionary();
    migrated.insert_or_assign(std::string(kDataKey), report);
    migrated.erase(migrated.find(kReportKey));
    return migrated;
}

/// Migrates the elements of a container's list. No list is an empty one; anything else that is no array is
/// passed on for the reader to refuse.
PropertyValue migrateList(const PropertyValue &object, std::string_view listKey,
                          PropertyValue (*migrateElement)(const PropertyValue &element, std::size_t index)) {
    const PropertyValue *list = object.find(listKey);
    if (!list)
        return PropertyValue::Array();
    if (!list->asArray())
        return *list;
    PropertyValue::Array migrated;
    migrated.reserve(list->asArray()->size());
    for (const PropertyValue &element : *list->asArray())
        migrated.push_back(migrateElement(element, migrated.size()));
    return migrated;
}

} // namespace

PropertyValue migrateRecordingContainer(const PropertyValue &object) {
    switch (versionOf(object)) {
    case 0:
        return migrateRecordingContainer(containerOf(1, migrateList(object, kReportsKey, frameFromReport)));
    case 1:
        return containerOf(kCurrentVersion, migrateList(object, kFramesKey, frameWithData));
    default:
        return object;
    }
}

namespace {

constexpr const char *kMigrationFailed = "migrateSerializedContainer failed: ";

Util::JsonDocument parseContainer(std::string_view jsonText) {
    std::string reason;
    auto document = Util::JsonDocument::parse(jsonText, &reason);
    if (!document)
        throw ContainerError(std::string(kMigrationFailed) + "invalid container", std::nullopt,
                             std::move(reason));
    return std::move(*document);
}

PropertyValue migrateForReading(const PropertyValue &object) {
    try {
        return migrateRecordingContainer(object);
    } catch (const FrameError &error) {
        throw ContainerError(kMigrationFailed + std::string(error.what()), error.frameIndex, {});
    } catch (const std::invalid_argument &error) {
        throw ContainerError(kMigrationFailed + std::string(error.what()), std::nullopt, {});
    }
}

} // namespace

RecordingContainer readRecordingContainer(std::string_view jsonText) {
    const Util::JsonDocument document = parseContainer(jsonText);
    const ContainerMembers members = readContainerMembers(document.root());
    if (members.version && knownVersion(members.version->toPropertyValue()) == kCurrentVersion)
        return {kCurrentVersion, readFrames(members.frames)};

    // An older container is migrated as a whole and then read like any other; that keeps one road for frames.
    const PropertyValue object = document.root().toPropertyValue();
    const std::string migrated = Util::jsonText(migrateForReading(object));
    const Util::JsonDocument current = parseContainer(migrated);
    return {versionOf(object), readFrames(readContainerMembers(current.root()).frames)};
}

std::string writeRecordingContainer(const FrameList &frames) {
    std::string text = R"({"Version":2,"Frames":[)";
    text.reserve(text.size() + frames.size() * kTypicalFrameLength);
    const char *separator = "";
    for (const FrameView &frame : frames) {
        if (!hasName(frame.type)) // a kind that the format does not know
            continue;
        text.append(separator);
        appendFrame(text, frame);
        separator = ",";
    }
    text.append("]}");
    return text;
}

} // namespace ZorvaTouch
