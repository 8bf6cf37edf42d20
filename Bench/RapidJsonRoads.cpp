#include "Bench/RapidJsonRoads.h"

#include "Shared/Util/Hex.h"

// The library scans strings with the instructions that every machine of the kind has; it has to be told.
#if defined(__SSE4_2__)
#define RAPIDJSON_SSE42
#elif defined(__SSE2__)
#define RAPIDJSON_SSE2
#endif
#include <rapidjson/reader.h>
#include <rapidjson/stringbuffer.h>
#include <rapidjson/writer.h>

#include <cstdint>
#include <utility>
#include <vector>

namespace ZorvaTouch::Bench {
namespace {

constexpr std::uint64_t kVersion = 2;

enum class Member { Version, Frames, Type, Timestamp, Key, Value, Data, Unknown };

struct MemberName {
    std::string_view name;
    Member member;
};
constexpr std::array<MemberName, 7> kMemberNames{{{"Type", Member::Type},
                                                  {"Timestamp", Member::Timestamp},
                                                  {"Data", Member::Data},
                                                  {"Key", Member::Key},
                                                  {"Value", Member::Value},
                                                  {"Version", Member::Version},
                                                  {"Frames", Member::Frames}}};

Member memberNamed(std::string_view name) {
    for (const MemberName &entry : kMemberNames)
        if (entry.name == name)
            return entry.member;
    return Member::Unknown;
}

constexpr std::array<std::string_view, 3> kTypeNames{"State", "InputReport", "Metadata"};

/// Takes the library's events and makes frames of them: numbers as values, each member once.
class FrameHandler : public rapidjson::BaseReaderHandler<rapidjson::UTF8<>, FrameHandler> {
public:
    FrameList takeFrames() { return std::move(_frames); }
    [[nodiscard]] bool isComplete() const { return _version == kVersion && _depth == 0; }

    // The library calls these by their names.
    // NOLINTBEGIN(readability-identifier-naming)
    bool Default() { return false; } // what a recording of numbers does not have

    bool Key(const char *name, rapidjson::SizeType length, bool) {
        _member = memberNamed({name, length});
        return _member != Member::Unknown;
    }

    bool String(const char *text, rapidjson::SizeType length, bool) { return takeText({text, length}); }

    bool Uint(unsigned number) { return takeUnsigned(number); }
    bool Uint64(std::uint64_t number) { return takeUnsigned(number); }
    bool Double(double number) {
        _frame.value = number;
        return _member == Member::Value;
    }

    bool StartObject() {
        ++_depth;
        return _depth == kContainerDepth || _depth == kFrameDepth;
    }
    bool EndObject(rapidjson::SizeType) {
        if (_depth-- == kFrameDepth)
            finishFrame();
        return true;
    }
    bool StartArray() {
        ++_depth;
        return _member == Member::Frames;
    }
    bool EndArray(rapidjson::SizeType) {
        --_depth;
        return true;
    }
    // NOLINTEND(readability-identifier-naming)

private:
    static constexpr int kContainerDepth = 1; // the array of frames is level 2
    static constexpr int kFrameDepth = 3;

    bool takeText(std::string_view text) {
        switch (_member) {
        case Member::Type:
            return takeType(text);
        case Member::Key:
            _frame.key = text;
            return true;
        case Member::Data:
            Util::bytesFromHexString(text, _report);
            return true;
        default:
            return false;
        }
    }

    bool takeType(std::string_view name) {
        for (std::size_t i = 0; i < kTypeNames.size(); ++i) {
            if (kTypeNames[i] == name) {
                _frame.type = static_cast<FrameType>(i);
                return true;
            }
        }
        return false;
    }

    bool takeUnsigned(std::uint64_t number) {
        switch (_member) {
        case Member::Timestamp:
            _frame.timestampNs = number;
            return true;
        case Member::Version:
            _version = number;
            return true;
        case Member::Value:
            _frame.value = number;
            return true;
        default:
            return false;
        }
    }

    void finishFrame() {
        if (_frame.type == FrameType::InputReport)
            _frames.appendReport(_frame.timestampNs, _report);
        else
            _frames.append(std::exchange(_frame, {}));
    }

    FrameList _frames;
    Frame _frame;                      ///< in the making; of a report only type and time stamp
    std::vector<std::uint8_t> _report; ///< kept for its capacity
    Member _member = Member::Unknown;
    std::uint64_t _version = 0;
    int _depth = 0;
};

template <unsigned flags> std::optional<FrameList> readWith(const std::string &text) {
    rapidjson::StringStream stream(text.c_str());
    rapidjson::Reader reader;
    FrameHandler handler;
    if (reader.Parse<flags>(stream, handler).IsError() || !handler.isComplete())
        return std::nullopt;
    return handler.takeFrames();
}

using Writer = rapidjson::Writer<rapidjson::StringBuffer>;

void putKey(Writer &writer, std::string_view name) {
    writer.Key(name.data(), static_cast<rapidjson::SizeType>(name.size()));
}

void putText(Writer &writer, std::string_view text) {
    writer.String(text.data(), static_cast<rapidjson::SizeType>(text.size()));
}

/// @param hex  Kept for its capacity.
void putFrame(Writer &writer, const FrameView &frame, std::string &hex) {
    writer.StartObject();
    putKey(writer, "Type");
    putText(writer, kTypeNames[static_cast<std::size_t>(frame.type)]);
    putKey(writer, "Timestamp");
    writer.Uint64(frame.timestampNs);
    if (frame.type == FrameType::InputReport) {
        hex.clear();
        Util::appendHexString(hex, frame.data);
        putKey(writer, "Data");
        putText(writer, hex);
    } else {
        putKey(writer, "Key");
        putText(writer, frame.key);
        putKey(writer, "Value");
        if (const std::uint64_t *number = frame.value.asUnsigned())
            writer.Uint64(*number);
        else if (const double *real = frame.value.asDouble())
            writer.Double(*real);
    }
    writer.EndObject();
}

} // namespace

std::optional<FrameList> readWithRapidJson(const std::string &text, RapidJsonChecks checks) {
    constexpr unsigned kSame = rapidjson::kParseValidateEncodingFlag | rapidjson::kParseFullPrecisionFlag;
    return checks == RapidJsonChecks::Same ? readWith<kSame>(text)
                                           : readWith<rapidjson::kParseDefaultFlags>(text);
}

struct RapidJsonText::Buffer {
    rapidjson::StringBuffer text;
};

RapidJsonText::RapidJsonText(const FrameList &frames, std::size_t expectedLength)
    : _buffer(std::make_unique<Buffer>()) {
    _buffer->text.Reserve(expectedLength);
    Writer writer(_buffer->text);
    std::string hex;
    writer.StartObject();
    putKey(writer, "Version");
    writer.Uint64(kVersion);
    putKey(writer, "Frames");
    writer.StartArray();
    for (const FrameView &frame : frames)
        putFrame(writer, frame, hex);
    writer.EndArray();
    writer.EndObject();
}

RapidJsonText::~RapidJsonText() = default;

std::string_view RapidJsonText::text() const { return {_buffer->text.GetString(), _buffer->text.GetSize()}; }

} // namespace ZorvaTouch::Bench
