#include "Shared/RecordingContainer.h"

#include "Shared/Util/Hex.h"
#include "Shared/Util/Json.h"
#include "Shared/Util/Text.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <initializer_list>
#include <utility>
#include <vector>

namespace ZorvaTouch {
namespace {

constexpr const char *kMigrationFailed = "migrateSerializedContainer failed: ";
constexpr const char *kInvalidContainer = "invalid container";

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

/// Turns frame objects of the current version into frames, one after the other.
class FrameReader {
public:
    FrameList takeFrames() { return std::move(_frames); }

    /// @throws FrameError
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

/// The number in decimal. A negative whole number is floating point, whether it was written so or not, and is
/// shown without ".0".
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

/// The known version that a container's member gives; null if the member is missing.
/// @param written  The number as it is written in the text; empty if it is only known as a value.
std::uint64_t versionFrom(const PropertyValue *version, std::string_view written = {}) {
    if (!version || !(version->asUnsigned() || version->asDouble())) // a boolean is no number here
        throw std::invalid_argument("invalid version");
    const auto known = knownVersion(*version);
    if (!known)
        throw std::invalid_argument("invalid container version: " +
                                    (written.empty() ? versionText(*version) : std::string(written)));
    return *known;
}

std::uint64_t versionOf(const PropertyValue &object) {
    if (!object.asDictionary())
        throw std::invalid_argument(kInvalidContainer);
    return versionFrom(object.find(kVersionKey));
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

// --- Reading

ContainerError::ContainerError(const Util::JsonError &error) : ContainerError(kInvalidContainer) {
    reason = error.what();
    offset = error.offset;
}

ContainerError::ContainerError(const std::string &statedProblem, std::optional<std::size_t> index)
    : std::runtime_error(kMigrationFailed + statedProblem), problem(statedProblem), frameIndex(index) {}

namespace {

PropertyValue currentFrameFromReport(const PropertyValue &report, std::size_t index) {
    return frameWithData(frameFromReport(report, index), index);
}

/// The list of frames as one version of the container reads it.
///
/// A text must be JSON up to its end, and its version may stand behind its frames, before anything can be
/// wrong with a frame. So failures are kept until the frames are asked for.
class FramesMember {
public:
    /// @param migrate  One element into a frame of the current version; null for the current version.
    using Migrate = PropertyValue (*)(const PropertyValue &element, std::size_t index);
    explicit FramesMember(Migrate migrate) : _migrate(migrate) {}

    /// The container has the member. Of equal names the last one holds.
    void begin(bool isArray) { *this = FramesMember(_migrate, isArray); }

    void read(Util::JsonValue element) {
        const std::size_t index = _count++;
        if (_migrationFailure)
            return;
        if (!_migrate)
            return readCurrent(element);
        PropertyValue migrated;
        try {
            migrated = _migrate(element.toPropertyValue(), index);
        } catch (const FrameError &error) {
            _migrationFailure = error;
            _reader = {};
            return;
        }
        readCurrent(*_parser.parse(Util::jsonText(migrated)));
    }

    /// @throws FrameError, ContainerError  The first failure.
    [[nodiscard]] FrameList take() {
        if (_migrationFailure)
            throw ContainerError(_migrationFailure->what(), _migrationFailure->frameIndex);
        const bool mayBeMissing = _migrate; // in older versions that is an empty list
        if (!_isArray.value_or(mayBeMissing))
            throw std::invalid_argument("invalid frames");
        if (_failure)
            throw FrameError(*_failure);
        return _reader.takeFrames();
    }

private:
    FramesMember(Migrate migrate, bool isArray) : _migrate(migrate), _isArray(isArray) {}

    void readCurrent(Util::JsonValue element) {
        if (_failure)
            return;
        try {
            _reader.read(element);
        } catch (const FrameError &error) {
            _failure = error;
            _reader = {};
        }
    }

    Migrate _migrate;
    std::optional<bool> _isArray; ///< nothing: the member is missing
    std::size_t _count = 0;       ///< of elements
    FrameReader _reader;
    Util::JsonParser _parser; ///< of migrated elements
    std::optional<FrameError> _migrationFailure, _failure;
};

/// Reads a container while its text arrives. What is read depends on the version, and that may come last: the
/// frames are read as each version has them. A list of another version fails at its first report, so that
/// costs next to nothing.
class ContainerReader {
public:
    explicit ContainerReader(Util::TextPieces pieces) : _stream(std::move(pieces)) {}

    [[nodiscard]] RecordingContainer read() {
        const bool isObject = _stream.isAtObject();
        if (isObject)
            readMembers();
        else
            static_cast<void>(_stream.value());
        _stream.finish();
        if (!isObject)
            throw ContainerError(kInvalidContainer);
        const std::uint64_t version = requireVersion();
        return {version, framesOf(version).take()};
    }

private:
    void readMembers() {
        _stream.enter();
        std::string name;
        while (_stream.nextMember(name)) {
            if (name == kFramesKey)
                readList({&_current, &_version1});
            else if (name == kReportsKey)
                readList({&_version0});
            else if (const Util::JsonValue value = _stream.value(); name == kVersionKey) {
                _version = value.toPropertyValue();
                if (value.kind() == Util::JsonValue::Kind::Number)
                    _writtenVersion = _stream.lastText();
            }
        }
    }

    void readList(std::initializer_list<FramesMember *> members) {
        const bool isArray = _stream.isAtArray();
        for (FramesMember *member : members)
            member->begin(isArray);
        if (!isArray) {
            static_cast<void>(_stream.value());
            return;
        }
        _stream.enter();
        while (_stream.nextElement()) {
            const Util::JsonValue element = _stream.value();
            for (FramesMember *member : members)
                member->read(element);
        }
    }

    [[nodiscard]] std::uint64_t requireVersion() const {
        try {
            return versionFrom(_version ? &*_version : nullptr, _writtenVersion);
        } catch (const std::invalid_argument &error) {
            throw ContainerError(error.what());
        }
    }

    [[nodiscard]] FramesMember &framesOf(std::uint64_t version) {
        if (version == kCurrentVersion)
            return _current;
        return version == 0 ? _version0 : _version1;
    }

    Util::JsonStream _stream;
    std::optional<PropertyValue> _version;
    std::string _writtenVersion;
    FramesMember _current{nullptr};
    FramesMember _version1{frameWithData};
    FramesMember _version0{currentFrameFromReport};
};

} // namespace

RecordingContainer readRecordingContainer(Util::TextPieces pieces) {
    try {
        return ContainerReader(std::move(pieces)).read();
    } catch (const Util::JsonError &error) {
        throw ContainerError(error);
    }
}

RecordingContainer readRecordingContainer(std::string_view jsonText) {
    return readRecordingContainer(Util::piecesOf(jsonText));
}

ContainerWriter::ContainerWriter() : _text(R"({"Version":2,"Frames":[)") {}

void ContainerWriter::append(const FrameView &frame) {
    if (!hasName(frame.type))
        return;
    if (!std::exchange(_isFirst, false))
        _text.push_back(',');
    appendFrame(_text, frame);
}

void ContainerWriter::finish() { _text.append("]}"); }

std::string writeRecordingContainer(const FrameList &frames) {
    ContainerWriter writer;
    writer.text().reserve(writer.text().size() + frames.size() * kTypicalFrameLength);
    for (const FrameView &frame : frames)
        writer.append(frame);
    writer.finish();
    return std::move(writer.text());
}

} // namespace ZorvaTouch
