// Compares JSON libraries on one full recording held in memory: reading its text into frames and
// writing frames back to text. Every road is checked against the generated frames before it is timed.

#include <benchmark/benchmark.h>

#include <boost/json.hpp>
#include <nlohmann/json.hpp>
#include <rapidjson/document.h>
#include <rapidjson/memorystream.h>
#include <rapidjson/reader.h>
#include <rapidjson/stringbuffer.h>
#include <rapidjson/writer.h>
#include <simdjson.h>

#include <array>
#include <charconv>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace ZorvaTouch {
namespace {

constexpr std::size_t kFrameCount = 8699;
constexpr std::size_t kReportSize = 73;
constexpr std::size_t kStateFrameEvery = 500;
constexpr std::uint64_t kFormatVersion = 2;
constexpr std::uint64_t kFirstTimestamp = 123456789;
constexpr std::string_view kStateKey = "Algs.ActivationThreshold";

enum class FrameType { InputReport, State };

struct Frame {
    FrameType type = FrameType::InputReport;
    std::uint64_t timestamp = 0;
    std::string key;
    std::vector<std::uint8_t> bytes;
    double value = 0.0;

    bool operator==(const Frame &) const = default;
};

using Frames = std::vector<Frame>;

// Hex bytes, shared by all roads: two lower-case digits and one space per byte.

constexpr std::string_view kHexDigits = "0123456789abcdef";
constexpr std::uint8_t kNoNibble = 0xff;

constexpr std::array<std::uint8_t, 256> makeNibbleTable() {
    std::array<std::uint8_t, 256> table{};
    table.fill(kNoNibble);
    for (std::size_t nibble = 0; nibble < kHexDigits.size(); ++nibble)
        table[static_cast<unsigned char>(kHexDigits[nibble])] = static_cast<std::uint8_t>(nibble);
    return table;
}

constexpr std::array<std::uint8_t, 256> kNibbles = makeNibbleTable();

bool decodeHex(std::string_view text, std::vector<std::uint8_t> &bytes) {
    if (text.size() % 3 != 0)
        return false;
    const std::size_t count = text.size() / 3;
    bytes.resize(count);
    const char *next = text.data();
    for (std::size_t index = 0; index < count; ++index, next += 3) {
        const unsigned high = kNibbles[static_cast<unsigned char>(next[0])];
        const unsigned low = kNibbles[static_cast<unsigned char>(next[1])];
        if ((high | low) == kNoNibble || next[2] != ' ')
            return false;
        bytes[index] = static_cast<std::uint8_t>((high << 4) | low);
    }
    return true;
}

void appendHex(const std::vector<std::uint8_t> &bytes, std::string &text) {
    const std::size_t start = text.size();
    text.resize(start + bytes.size() * 3);
    char *next = text.data() + start;
    for (const std::uint8_t byte : bytes) {
        next[0] = kHexDigits[byte >> 4];
        next[1] = kHexDigits[byte & 0x0f];
        next[2] = ' ';
        next += 3;
    }
}

// The members of frames, and one frame under construction, shared by all reading roads.

enum class Field { Type, Timestamp, Data, Key, Value, Unknown };

Field fieldOf(std::string_view name) {
    if (name == "Type")
        return Field::Type;
    if (name == "Timestamp")
        return Field::Timestamp;
    if (name == "Data")
        return Field::Data;
    if (name == "Key")
        return Field::Key;
    if (name == "Value")
        return Field::Value;
    return Field::Unknown;
}

class FrameDraft {
public:
    bool setText(Field field, std::string_view text) {
        mark(field);
        switch (field) {
        case Field::Type:
            if (text == "InputReport") {
                _frame.type = FrameType::InputReport;
                return true;
            }
            if (text == "State") {
                _frame.type = FrameType::State;
                return true;
            }
            return false;
        case Field::Data:
            return decodeHex(text, _frame.bytes);
        case Field::Key:
            _frame.key.assign(text);
            return true;
        default:
            return false;
        }
    }

    bool setUnsigned(Field field, std::uint64_t number) {
        if (field == Field::Timestamp) {
            mark(field);
            _frame.timestamp = number;
            return true;
        }
        return setReal(field, static_cast<double>(number));
    }

    bool setReal(Field field, double number) {
        mark(field);
        _frame.value = number;
        return field == Field::Value;
    }

    // Moves the finished frame away and leaves an empty draft, if the needed fields were there.
    bool finish(Frames &frames) {
        const unsigned needed =
            _frame.type == FrameType::InputReport
                ? bit(Field::Type) | bit(Field::Timestamp) | bit(Field::Data)
                : bit(Field::Type) | bit(Field::Timestamp) | bit(Field::Key) | bit(Field::Value);
        const bool complete = (_seen & needed) == needed;
        frames.push_back(std::move(_frame));
        _frame = Frame{};
        _seen = 0;
        return complete;
    }

private:
    static constexpr unsigned bit(Field field) { return 1U << static_cast<unsigned>(field); }

    void mark(Field field) { _seen |= bit(field); }

    Frame _frame;
    unsigned _seen = 0;
};

// The made recording.

// Hand-assembled text: the known keys, hex and shortest numbers appended to one string. The keys of
// State frames come from a fixed list of plain names and need no escapes.
void writeByHand(const Frames &frames, std::string &text) {
    const auto appendNumber = [&text](auto number) {
        std::array<char, 32> digits;
        const auto end = std::to_chars(digits.data(), digits.data() + digits.size(), number).ptr;
        text.append(digits.data(), end);
    };

    text.clear();
    text += R"({"Version":)";
    appendNumber(kFormatVersion);
    text += R"(,"Frames":[)";
    bool first = true;
    for (const Frame &frame : frames) {
        if (!first)
            text += ',';
        first = false;
        if (frame.type == FrameType::InputReport) {
            text += R"({"Type":"InputReport","Timestamp":)";
            appendNumber(frame.timestamp);
            text += R"(,"Data":")";
            appendHex(frame.bytes, text);
            text += R"("})";
        } else {
            text += R"({"Type":"State","Timestamp":)";
            appendNumber(frame.timestamp);
            text += R"(,"Key":")";
            text += frame.key;
            text += R"(","Value":)";
            const std::size_t numberStart = text.size();
            appendNumber(frame.value);
            if (text.find_first_of(".e", numberStart) == std::string::npos)
                text += ".0";
            text += '}';
        }
    }
    text += "]}";
}

Frames makeFrames() {
    Frames frames;
    frames.reserve(kFrameCount);
    std::uint64_t state = 0x9e3779b97f4a7c15ULL;
    const auto nextRandom = [&state] {
        state ^= state << 13;
        state ^= state >> 7;
        state ^= state << 17;
        return state;
    };

    std::uint64_t timestamp = kFirstTimestamp;
    for (std::size_t index = 0; index < kFrameCount; ++index) {
        Frame frame;
        timestamp += 7000 + nextRandom() % 2000;
        frame.timestamp = timestamp;
        if ((index + 1) % kStateFrameEvery == 0) {
            frame.type = FrameType::State;
            frame.key = kStateKey;
            frame.value = 200.0 + static_cast<double>(nextRandom() % 64) / 8.0;
        } else {
            frame.bytes.resize(kReportSize);
            for (std::uint8_t &byte : frame.bytes)
                byte = static_cast<std::uint8_t>(nextRandom() >> 32);
            frame.bytes[0] = 0x01;
        }
        frames.push_back(std::move(frame));
    }
    return frames;
}

class Recording {
public:
    static const Recording &instance() {
        static const Recording recording;
        return recording;
    }

    const Frames &frames() const { return _frames; }

    // Its capacity leaves the spare bytes that simdjson may read past the end.
    const std::string &text() const { return _text; }

private:
    Recording() : _frames(makeFrames()) {
        writeByHand(_frames, _text);
        _text.reserve(_text.size() + simdjson::SIMDJSON_PADDING);
    }

    Frames _frames;
    std::string _text;
};

// Reading: simdjson.

bool readSimdjsonElement(simdjson::dom::element root, Frames &frames) {
    frames.clear();
    simdjson::dom::object rootObject;
    if (root.get(rootObject) != simdjson::SUCCESS)
        return false;
    std::uint64_t version = 0;
    FrameDraft draft;
    for (const auto rootField : rootObject) {
        if (rootField.key == "Version") {
            if (rootField.value.get(version) != simdjson::SUCCESS)
                return false;
            continue;
        }
        simdjson::dom::array list;
        if (rootField.key != "Frames" || rootField.value.get(list) != simdjson::SUCCESS)
            return false;
        for (const simdjson::dom::element item : list) {
            simdjson::dom::object object;
            if (item.get(object) != simdjson::SUCCESS)
                return false;
            for (const auto member : object) {
                const Field field = fieldOf(member.key);
                bool taken = false;
                switch (member.value.type()) {
                case simdjson::dom::element_type::STRING:
                    taken = draft.setText(field, member.value.get_string().value_unsafe());
                    break;
                case simdjson::dom::element_type::INT64: {
                    const std::int64_t number = member.value.get_int64().value_unsafe();
                    taken = number < 0 ? draft.setReal(field, static_cast<double>(number))
                                       : draft.setUnsigned(field, static_cast<std::uint64_t>(number));
                    break;
                }
                case simdjson::dom::element_type::UINT64:
                    taken = draft.setUnsigned(field, member.value.get_uint64().value_unsafe());
                    break;
                case simdjson::dom::element_type::DOUBLE:
                    taken = draft.setReal(field, member.value.get_double().value_unsafe());
                    break;
                default:
                    break;
                }
                if (!taken)
                    return false;
            }
            if (!draft.finish(frames))
                return false;
        }
    }
    return version == kFormatVersion;
}

// A new parser that copies the text to pad it.
bool readSimdjsonDomCopied(const std::string &text, Frames &frames) {
    simdjson::dom::parser parser;
    simdjson::dom::element root;
    return parser.parse(text.data(), text.size(), true).get(root) == simdjson::SUCCESS &&
           readSimdjsonElement(root, frames);
}

// A new parser on text that has the spare bytes already.
bool readSimdjsonDom(const std::string &text, Frames &frames) {
    simdjson::dom::parser parser;
    simdjson::dom::element root;
    return parser.parse(text.data(), text.size(), false).get(root) == simdjson::SUCCESS &&
           readSimdjsonElement(root, frames);
}

// A parser kept between texts.
bool readSimdjsonDomKept(const std::string &text, Frames &frames) {
    static simdjson::dom::parser parser;
    simdjson::dom::element root;
    return parser.parse(text.data(), text.size(), false).get(root) == simdjson::SUCCESS &&
           readSimdjsonElement(root, frames);
}

bool readOnDemandFrame(simdjson::ondemand::object object, FrameDraft &draft, Frames &frames) {
    for (auto memberResult : object) {
        simdjson::ondemand::field member;
        std::string_view name;
        if (std::move(memberResult).get(member) != simdjson::SUCCESS ||
            member.unescaped_key().get(name) != simdjson::SUCCESS)
            return false;
        const Field field = fieldOf(name);
        bool taken = false;
        if (field == Field::Timestamp) {
            std::uint64_t number = 0;
            taken = member.value().get_uint64().get(number) == simdjson::SUCCESS &&
                    draft.setUnsigned(field, number);
        } else if (field == Field::Value) {
            double number = 0.0;
            taken =
                member.value().get_double().get(number) == simdjson::SUCCESS && draft.setReal(field, number);
        } else {
            std::string_view string;
            taken =
                member.value().get_string().get(string) == simdjson::SUCCESS && draft.setText(field, string);
        }
        if (!taken)
            return false;
    }
    return draft.finish(frames);
}

bool readOnDemandWith(simdjson::ondemand::parser &parser, const std::string &text, Frames &frames) {
    frames.clear();
    simdjson::ondemand::document document;
    simdjson::ondemand::object root;
    if (parser.iterate(text.data(), text.size(), text.size() + simdjson::SIMDJSON_PADDING).get(document) !=
            simdjson::SUCCESS ||
        document.get_object().get(root) != simdjson::SUCCESS)
        return false;
    std::uint64_t version = 0;
    FrameDraft draft;
    for (auto rootResult : root) {
        simdjson::ondemand::field rootField;
        std::string_view name;
        if (std::move(rootResult).get(rootField) != simdjson::SUCCESS ||
            rootField.unescaped_key().get(name) != simdjson::SUCCESS)
            return false;
        if (name == "Version") {
            if (rootField.value().get_uint64().get(version) != simdjson::SUCCESS)
                return false;
            continue;
        }
        simdjson::ondemand::array list;
        if (name != "Frames" || rootField.value().get_array().get(list) != simdjson::SUCCESS)
            return false;
        for (auto itemResult : list) {
            simdjson::ondemand::object object;
            if (itemResult.get_object().get(object) != simdjson::SUCCESS ||
                !readOnDemandFrame(object, draft, frames))
                return false;
        }
    }
    // Text left after the object is found only by asking for a place past it.
    return version == kFormatVersion && document.current_location().error() == simdjson::OUT_OF_BOUNDS;
}

bool readSimdjsonOnDemand(const std::string &text, Frames &frames) {
    simdjson::ondemand::parser parser;
    return readOnDemandWith(parser, text, frames);
}

bool readSimdjsonOnDemandKept(const std::string &text, Frames &frames) {
    static simdjson::ondemand::parser parser;
    return readOnDemandWith(parser, text, frames);
}

// Reading: event-driven roads. The collector follows the nesting of the one known layout.

class FrameCollector {
public:
    explicit FrameCollector(Frames &frames) : _frames(frames) { _frames.clear(); }

    bool startObject() {
        switch (_place) {
        case Place::Outside:
            _place = Place::Root;
            return true;
        case Place::List:
            _place = Place::Item;
            return true;
        default:
            return false;
        }
    }

    bool endObject() {
        if (_place == Place::Item) {
            _place = Place::List;
            return _draft.finish(_frames);
        }
        _place = Place::Done;
        return true;
    }

    bool startArray() {
        if (_place != Place::Root || !_nextIsFrames)
            return false;
        _place = Place::List;
        return true;
    }

    bool endArray() {
        _place = Place::Root;
        return true;
    }

    bool key(std::string_view name) {
        if (_place == Place::Item) {
            _field = fieldOf(name);
            return _field != Field::Unknown;
        }
        _nextIsFrames = name == "Frames";
        return _nextIsFrames || name == "Version";
    }

    bool text(std::string_view string) { return _place == Place::Item && _draft.setText(_field, string); }

    bool unsignedNumber(std::uint64_t number) {
        if (_place == Place::Item)
            return _draft.setUnsigned(_field, number);
        _version = number;
        return _place == Place::Root && !_nextIsFrames;
    }

    bool realNumber(double number) { return _place == Place::Item && _draft.setReal(_field, number); }

    bool done() const { return _place == Place::Done && _version == kFormatVersion; }

private:
    enum class Place { Outside, Root, List, Item, Done };

    Frames &_frames;
    FrameDraft _draft;
    Place _place = Place::Outside;
    Field _field = Field::Unknown;
    bool _nextIsFrames = false;
    std::uint64_t _version = 0;
};

// Reading: RapidJSON. The strict flags check UTF-8 and round every number correctly, as the other
// libraries do; the plain flags are the library's own default.

constexpr unsigned kRapidPlain = rapidjson::kParseDefaultFlags;
constexpr unsigned kRapidStrict = rapidjson::kParseValidateEncodingFlag | rapidjson::kParseFullPrecisionFlag;

// The reader calls these by their names.
// NOLINTBEGIN(readability-identifier-naming)
class RapidHandler {
public:
    explicit RapidHandler(Frames &frames) : _collector(frames) {}

    bool Null() { return false; }

    bool Bool(bool) { return false; }

    bool Int(int number) { return _collector.realNumber(number); }

    bool Uint(unsigned number) { return _collector.unsignedNumber(number); }

    bool Int64(std::int64_t number) { return _collector.realNumber(static_cast<double>(number)); }

    bool Uint64(std::uint64_t number) { return _collector.unsignedNumber(number); }

    bool Double(double number) { return _collector.realNumber(number); }

    bool RawNumber(const char *, rapidjson::SizeType, bool) { return false; }

    bool String(const char *text, rapidjson::SizeType size, bool) { return _collector.text({text, size}); }

    bool Key(const char *text, rapidjson::SizeType size, bool) { return _collector.key({text, size}); }

    bool StartObject() { return _collector.startObject(); }

    bool EndObject(rapidjson::SizeType) { return _collector.endObject(); }

    bool StartArray() { return _collector.startArray(); }

    bool EndArray(rapidjson::SizeType) { return _collector.endArray(); }

    bool done() const { return _collector.done(); }

private:
    FrameCollector _collector;
};
// NOLINTEND(readability-identifier-naming)

template <unsigned flags> bool readRapidSax(const std::string &text, Frames &frames) {
    rapidjson::StringStream stream(text.c_str());
    RapidHandler handler(frames);
    rapidjson::Reader reader;
    return !reader.Parse<flags>(stream, handler).IsError() && handler.done();
}

template <unsigned flags> bool readRapidDom(const std::string &text, Frames &frames) {
    frames.clear();
    rapidjson::Document document;
    if (document.Parse<flags>(text.c_str()).HasParseError() || !document.IsObject())
        return false;
    std::uint64_t version = 0;
    FrameDraft draft;
    // By place, as the library's member iterators compare ambiguously in C++20.
    for (rapidjson::SizeType rootPlace = 0; rootPlace < document.MemberCount(); ++rootPlace) {
        const auto &rootMember = document.MemberBegin()[rootPlace];
        const std::string_view rootName(rootMember.name.GetString(), rootMember.name.GetStringLength());
        if (rootName == "Version" && rootMember.value.IsUint64()) {
            version = rootMember.value.GetUint64();
            continue;
        }
        if (rootName != "Frames" || !rootMember.value.IsArray())
            return false;
        for (const auto &item : rootMember.value.GetArray()) {
            if (!item.IsObject())
                return false;
            for (rapidjson::SizeType place = 0; place < item.MemberCount(); ++place) {
                const auto &member = item.MemberBegin()[place];
                const Field field = fieldOf({member.name.GetString(), member.name.GetStringLength()});
                const auto &value = member.value;
                const bool taken = value.IsString()
                                       ? draft.setText(field, {value.GetString(), value.GetStringLength()})
                                   : value.IsUint64() ? draft.setUnsigned(field, value.GetUint64())
                                   : value.IsNumber() ? draft.setReal(field, value.GetDouble())
                                                      : false;
                if (!taken)
                    return false;
            }
            if (!draft.finish(frames))
                return false;
        }
    }
    return version == kFormatVersion;
}

// Reading: Boost.JSON.

bool readBoostWith(boost::json::storage_ptr storage, const std::string &text, Frames &frames) {
    frames.clear();
    boost::json::error_code error;
    const boost::json::value root = boost::json::parse(text, error, std::move(storage));
    if (error || !root.is_object())
        return false;
    std::uint64_t version = 0;
    FrameDraft draft;
    for (const auto &rootMember : root.get_object()) {
        if (rootMember.key() == "Version" && rootMember.value().is_int64()) {
            version = static_cast<std::uint64_t>(rootMember.value().get_int64());
            continue;
        }
        if (rootMember.key() != "Frames" || !rootMember.value().is_array())
            return false;
        for (const boost::json::value &item : rootMember.value().get_array()) {
            if (!item.is_object())
                return false;
            for (const auto &member : item.get_object()) {
                const Field field = fieldOf({member.key().data(), member.key().size()});
                const boost::json::value &value = member.value();
                bool taken = false;
                switch (value.kind()) {
                case boost::json::kind::string:
                    taken = draft.setText(field, {value.get_string().data(), value.get_string().size()});
                    break;
                case boost::json::kind::int64:
                    taken = value.get_int64() < 0
                                ? draft.setReal(field, static_cast<double>(value.get_int64()))
                                : draft.setUnsigned(field, static_cast<std::uint64_t>(value.get_int64()));
                    break;
                case boost::json::kind::uint64:
                    taken = draft.setUnsigned(field, value.get_uint64());
                    break;
                case boost::json::kind::double_:
                    taken = draft.setReal(field, value.get_double());
                    break;
                default:
                    break;
                }
                if (!taken)
                    return false;
            }
            if (!draft.finish(frames))
                return false;
        }
    }
    return version == kFormatVersion;
}

bool readBoostDom(const std::string &text, Frames &frames) { return readBoostWith({}, text, frames); }

bool readBoostDomMonotonic(const std::string &text, Frames &frames) {
    boost::json::monotonic_resource resource;
    return readBoostWith(&resource, text, frames);
}

// Reading: nlohmann.

bool readNlohmannDom(const std::string &text, Frames &frames) {
    frames.clear();
    const nlohmann::json root = nlohmann::json::parse(text, nullptr, false);
    if (root.is_discarded() || !root.is_object())
        return false;
    std::uint64_t version = 0;
    FrameDraft draft;
    for (const auto &rootMember : root.items()) {
        if (rootMember.key() == "Version" && rootMember.value().is_number_unsigned()) {
            version = rootMember.value().get<std::uint64_t>();
            continue;
        }
        if (rootMember.key() != "Frames" || !rootMember.value().is_array())
            return false;
        for (const nlohmann::json &item : rootMember.value()) {
            if (!item.is_object())
                return false;
            for (auto member = item.begin(); member != item.end(); ++member) {
                const Field field = fieldOf(member.key());
                const nlohmann::json &value = member.value();
                const bool taken =
                    value.is_string()            ? draft.setText(field, value.get_ref<const std::string &>())
                    : value.is_number_unsigned() ? draft.setUnsigned(field, value.get<std::uint64_t>())
                    : value.is_number()          ? draft.setReal(field, value.get<double>())
                                                 : false;
                if (!taken)
                    return false;
            }
            if (!draft.finish(frames))
                return false;
        }
    }
    return version == kFormatVersion;
}

// The parser calls these by their names.
// NOLINTBEGIN(readability-identifier-naming)
class NlohmannHandler {
public:
    explicit NlohmannHandler(Frames &frames) : _collector(frames) {}

    bool null() { return false; }

    bool boolean(bool) { return false; }

    bool number_integer(std::int64_t number) { return _collector.realNumber(static_cast<double>(number)); }

    bool number_unsigned(std::uint64_t number) { return _collector.unsignedNumber(number); }

    bool number_float(double number, const std::string &) { return _collector.realNumber(number); }

    bool string(const std::string &text) { return _collector.text(text); }

    bool binary(const nlohmann::json::binary_t &) { return false; }

    bool start_object(std::size_t) { return _collector.startObject(); }

    bool end_object() { return _collector.endObject(); }

    bool start_array(std::size_t) { return _collector.startArray(); }

    bool end_array() { return _collector.endArray(); }

    bool key(const std::string &name) { return _collector.key(name); }

    bool parse_error(std::size_t, const std::string &, const nlohmann::json::exception &) { return false; }

    bool done() const { return _collector.done(); }

private:
    FrameCollector _collector;
};
// NOLINTEND(readability-identifier-naming)

bool readNlohmannSax(const std::string &text, Frames &frames) {
    NlohmannHandler handler(frames);
    return nlohmann::json::sax_parse(text, &handler) && handler.done();
}

// Writing.

void writeRapid(const Frames &frames, std::string &text) {
    rapidjson::StringBuffer buffer;
    rapidjson::Writer<rapidjson::StringBuffer> writer(buffer);
    const auto putKey = [&writer](std::string_view name) {
        writer.Key(name.data(), static_cast<rapidjson::SizeType>(name.size()));
    };
    const auto putText = [&writer](std::string_view string) {
        writer.String(string.data(), static_cast<rapidjson::SizeType>(string.size()));
    };

    std::string hex;
    writer.StartObject();
    putKey("Version");
    writer.Uint64(kFormatVersion);
    putKey("Frames");
    writer.StartArray();
    for (const Frame &frame : frames) {
        writer.StartObject();
        putKey("Type");
        putText(frame.type == FrameType::InputReport ? "InputReport" : "State");
        putKey("Timestamp");
        writer.Uint64(frame.timestamp);
        if (frame.type == FrameType::InputReport) {
            hex.clear();
            appendHex(frame.bytes, hex);
            putKey("Data");
            putText(hex);
        } else {
            putKey("Key");
            putText(frame.key);
            putKey("Value");
            writer.Double(frame.value);
        }
        writer.EndObject();
    }
    writer.EndArray();
    writer.EndObject();
    text.assign(buffer.GetString(), buffer.GetSize());
}

void writeBoost(const Frames &frames, std::string &text) {
    boost::json::monotonic_resource resource;
    const boost::json::storage_ptr storage(&resource);
    boost::json::array list(storage);
    list.reserve(frames.size());
    std::string hex;
    for (const Frame &frame : frames) {
        boost::json::object object(4, storage);
        if (frame.type == FrameType::InputReport) {
            hex.clear();
            appendHex(frame.bytes, hex);
            object.emplace("Type", "InputReport");
            object.emplace("Timestamp", frame.timestamp);
            object.emplace("Data", boost::json::string_view(hex));
        } else {
            object.emplace("Type", "State");
            object.emplace("Timestamp", frame.timestamp);
            object.emplace("Key", boost::json::string_view(frame.key));
            object.emplace("Value", frame.value);
        }
        list.emplace_back(std::move(object));
    }
    boost::json::object root(storage);
    root.emplace("Version", kFormatVersion);
    root.emplace("Frames", std::move(list));
    text = boost::json::serialize(root);
}

void writeNlohmann(const Frames &frames, std::string &text) {
    using Json = nlohmann::ordered_json;
    Json list = Json::array();
    list.get_ref<Json::array_t &>().reserve(frames.size());
    for (const Frame &frame : frames) {
        Json object = Json::object();
        object["Type"] = frame.type == FrameType::InputReport ? "InputReport" : "State";
        object["Timestamp"] = frame.timestamp;
        if (frame.type == FrameType::InputReport) {
            std::string hex;
            appendHex(frame.bytes, hex);
            object["Data"] = std::move(hex);
        } else {
            object["Key"] = frame.key;
            object["Value"] = frame.value;
        }
        list.push_back(std::move(object));
    }
    Json root = Json::object();
    root["Version"] = kFormatVersion;
    root["Frames"] = std::move(list);
    text = root.dump();
}

// Timing.

using ReadRoad = bool (*)(const std::string &text, Frames &frames);
using WriteRoad = void (*)(const Frames &frames, std::string &text);

void setBytes(benchmark::State &state, std::size_t bytesPerRound) {
    state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(bytesPerRound));
}

void benchRead(benchmark::State &state, ReadRoad read) {
    const Recording &recording = Recording::instance();
    Frames checked;
    if (!read(recording.text(), checked) || checked != recording.frames()) {
        state.SkipWithError("the frames read differ from the frames made");
        return;
    }
    for (auto _ : state) {
        Frames frames;
        const bool taken = read(recording.text(), frames);
        benchmark::DoNotOptimize(taken);
        benchmark::DoNotOptimize(frames.data());
    }
    setBytes(state, recording.text().size());
}

void benchWrite(benchmark::State &state, WriteRoad write) {
    const Recording &recording = Recording::instance();
    std::string checkedText;
    Frames checked;
    write(recording.frames(), checkedText);
    if (!readSimdjsonDomCopied(checkedText, checked) || checked != recording.frames()) {
        state.SkipWithError("the text written does not read back as the frames made");
        return;
    }
    for (auto _ : state) {
        std::string text;
        write(recording.frames(), text);
        benchmark::DoNotOptimize(text.data());
    }
    setBytes(state, checkedText.size());
}

// The part of every reading road that no library can save: the frames themselves and their hex.
// The rate is stated against the whole text so that it stands beside the roads above it.
void benchFramesOnly(benchmark::State &state) {
    const Recording &recording = Recording::instance();
    std::vector<std::string> hexTexts;
    for (const Frame &frame : recording.frames()) {
        std::string hex;
        appendHex(frame.bytes, hex);
        hexTexts.push_back(std::move(hex));
    }
    for (auto _ : state) {
        Frames frames;
        for (const std::string &hex : hexTexts) {
            Frame frame;
            const bool taken = decodeHex(hex, frame.bytes);
            benchmark::DoNotOptimize(taken);
            frames.push_back(std::move(frame));
        }
        benchmark::DoNotOptimize(frames.data());
    }
    setBytes(state, recording.text().size());
}

// What padding a text by one copy costs on its own.
void benchPaddingCopy(benchmark::State &state) {
    const Recording &recording = Recording::instance();
    for (auto _ : state) {
        const simdjson::padded_string padded(recording.text());
        benchmark::DoNotOptimize(padded.data());
        benchmark::ClobberMemory();
    }
    setBytes(state, recording.text().size());
}

// Parsing alone, without making frames.
void benchSimdjsonParseOnly(benchmark::State &state) {
    const Recording &recording = Recording::instance();
    simdjson::dom::parser parser;
    for (auto _ : state) {
        const auto error = parser.parse(recording.text().data(), recording.text().size(), false).error();
        benchmark::DoNotOptimize(error);
    }
    setBytes(state, recording.text().size());
}

BENCHMARK_CAPTURE(benchRead, SimdjsonDom, &readSimdjsonDom)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchRead, SimdjsonDomCopied, &readSimdjsonDomCopied)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchRead, SimdjsonDomKept, &readSimdjsonDomKept)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchRead, SimdjsonOnDemand, &readSimdjsonOnDemand)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchRead, SimdjsonOnDemandKept, &readSimdjsonOnDemandKept)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchRead, RapidSax, &readRapidSax<kRapidPlain>)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchRead, RapidSaxStrict, &readRapidSax<kRapidStrict>)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchRead, RapidDom, &readRapidDom<kRapidPlain>)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchRead, RapidDomStrict, &readRapidDom<kRapidStrict>)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchRead, BoostDom, &readBoostDom)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchRead, BoostDomMonotonic, &readBoostDomMonotonic)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchRead, NlohmannDom, &readNlohmannDom)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchRead, NlohmannSax, &readNlohmannSax)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchWrite, RapidWriter, &writeRapid)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchWrite, BoostSerialize, &writeBoost)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchWrite, NlohmannDump, &writeNlohmann)->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(benchWrite, ByHand, &writeByHand)->Unit(benchmark::kMicrosecond);
BENCHMARK(benchFramesOnly)->Unit(benchmark::kMicrosecond);
BENCHMARK(benchPaddingCopy)->Unit(benchmark::kMicrosecond);
BENCHMARK(benchSimdjsonParseOnly)->Unit(benchmark::kMicrosecond);

} // namespace
} // namespace ZorvaTouch

BENCHMARK_MAIN();
