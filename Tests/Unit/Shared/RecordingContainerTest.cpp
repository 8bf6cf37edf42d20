#include "Shared/RecordingContainer.h"

#include "Shared/PipelineRecording.h"
#include "Shared/Util/Json.h"
#include "Tests/Support/RecordingFakes.h"

#include <gtest/gtest.h>

#include <limits>
#include <stdexcept>

namespace ZorvaTouch {
namespace {

using Scripted::framesOf;
using Scripted::metadataFrame;
using Scripted::reportFrame;
using Scripted::stateFrame;

const std::string kMigrationFailed = "migrateSerializedContainer failed: ";
const double kInfinity = std::numeric_limits<double>::infinity();
const double kNan = std::numeric_limits<double>::quiet_NaN();

/// Why a text cannot be read: "invalid_argument: " or "runtime_error: " and the message; empty if it can.
std::string refusal(std::string_view text) {
    Scripted::FakeClock clock;
    try {
        const PipelineRecording recording(text, clock);
    } catch (const std::invalid_argument &error) {
        return std::string("invalid_argument: ") + error.what();
    } catch (const std::runtime_error &error) {
        return std::string("runtime_error: ") + error.what();
    }
    return "";
}

std::string migrationRefusal(const std::string &message) {
    return "runtime_error: " + kMigrationFailed + message;
}

std::string container(std::string_view version, std::string_view frames) {
    return R"({"Version":)" + std::string(version) + R"(,"Frames":[)" + std::string(frames) + "]}";
}

/// The frames of a version-2 container with these frame objects.
std::vector<Frame> read(std::string_view frames) {
    return framesOf(readRecordingContainer(container("2", frames)).frames);
}

/// The refusal of a version-2 container with these frame objects.
std::string frameRefusal(std::string_view frames) { return refusal(container("2", frames)); }

/// The text of a container with the one frame.
std::string written(const Frame &frame) {
    FrameList list;
    list.append(frame);
    return writeRecordingContainer(list);
}

/// A state frame's value as it is written, from the "Value" on; "}" alone if it is left out.
std::string writtenValue(const PropertyValue &value) {
    const std::string text = written(stateFrame(1, "k", value));
    const std::string head = R"({"Version":2,"Frames":[{"Type":"State","Timestamp":1,"Key":"k")";
    EXPECT_EQ(text.substr(0, head.size()), head);
    return text.substr(head.size(), text.size() - head.size() - 2);
}

// --- Writing -------------------------------------------------------------------------------------

TEST(RecordingContainer, WritesItsKeysInOrder) {
    FrameList list;
    list.append(stateFrame(5, "Algs.ActivationThreshold", 200.0));
    list.append(reportFrame(18446744073709551615u, {0x01, 0xAB, 0xFF}));
    list.append(metadataFrame(0, "Accel", PropertyValue::Array{1u, true, "x"}));
    list.append(reportFrame(7, {}));
    EXPECT_EQ(writeRecordingContainer(list),
              R"({"Version":2,"Frames":[)"
              R"({"Type":"State","Timestamp":5,"Key":"Algs.ActivationThreshold","Value":200.0},)"
              R"({"Type":"InputReport","Timestamp":18446744073709551615,"Data":"01 ab ff "},)"
              R"({"Type":"Metadata","Timestamp":0,"Key":"Accel","Value":[1,true,"x"]},)"
              R"({"Type":"InputReport","Timestamp":7,"Data":""}]})");
}

TEST(RecordingContainer, WritesNoFramesAsAnEmptyArray) {
    EXPECT_EQ(writeRecordingContainer(FrameList()), R"({"Version":2,"Frames":[]})");
}

TEST(RecordingContainer, WritesTheShortestNumbersThatReadBack) {
    const struct {
        PropertyValue value;
        const char *text;
    } cases[] = {
        {500u, R"(,"Value":500})"},
        {0u, R"(,"Value":0})"},
        {18446744073709551615u, R"(,"Value":18446744073709551615})"},
        {200.0, R"(,"Value":200.0})"},
        {0.0, R"(,"Value":0.0})"},
        {-0.0, R"(,"Value":-0.0})"},
        {-5.0, R"(,"Value":-5.0})"},
        {0.1, R"(,"Value":0.1})"},
        {0.1f, R"(,"Value":0.10000000149011612})"},
        {0.6667f, R"(,"Value":0.666700005531311})"},
        {0.4f, R"(,"Value":0.4000000059604645})"},
        {1e22, R"(,"Value":1e+22})"},
        {1.5e-9, R"(,"Value":1.5e-09})"},
        {5e-324, R"(,"Value":5e-324})"},
        {1.7976931348623157e308, R"(,"Value":1.7976931348623157e+308})"},
        {9007199254740993.0, R"(,"Value":9007199254740992.0})"},
    };
    for (const auto &[value, text] : cases)
        EXPECT_EQ(writtenValue(value), text);
}

TEST(RecordingContainer, WritesWholeDoublesAsDoubles) {
    // However it is spelled: a whole number of either kind must come back as the kind that it was.
    for (const double whole :
         {1.0, 100000.0, 1e15, 1e16, 1e17, 123456789012.0, 9007199254740992.0, 1e19, 1e20}) {
        const Frame frame = stateFrame(1, "k", whole);
        EXPECT_EQ(framesOf(readRecordingContainer(written(frame)).frames), std::vector<Frame>{frame})
            << whole;
    }
}

TEST(RecordingContainer, LeavesANullValueOut) {
    EXPECT_EQ(written(stateFrame(1, "k", PropertyValue())),
              R"({"Version":2,"Frames":[{"Type":"State","Timestamp":1,"Key":"k"}]})");
    EXPECT_EQ(written(metadataFrame(1, "k", PropertyValue())),
              R"({"Version":2,"Frames":[{"Type":"Metadata","Timestamp":1,"Key":"k"}]})");
    EXPECT_EQ(writtenValue(PropertyValue::Array{PropertyValue()}), R"(,"Value":[null]})")
        << "inside it stays";
}

TEST(RecordingContainer, ATextWithALeftOutValueCannotBeRead) {
    EXPECT_EQ(refusal(written(stateFrame(1, "k", PropertyValue()))),
              "invalid_argument: invalid state value class");
    EXPECT_EQ(refusal(written(metadataFrame(1, "k", PropertyValue()))),
              "invalid_argument: invalid metadata value class");
}

TEST(RecordingContainer, ANullThatWasReadIsLeftOut) {
    const auto text = container("2", R"({"Type":"State","Timestamp":1,"Key":"k","Value":null})");
    EXPECT_EQ(writeRecordingContainer(readRecordingContainer(text).frames),
              R"({"Version":2,"Frames":[{"Type":"State","Timestamp":1,"Key":"k"}]})");
}

TEST(RecordingContainer, WritesWhatJsonCannotHoldAsNull) {
    EXPECT_EQ(writtenValue(kNan), R"(,"Value":null})");
    EXPECT_EQ(writtenValue(-kNan), R"(,"Value":null})");
    EXPECT_EQ(writtenValue(kInfinity), R"(,"Value":null})");
    EXPECT_EQ(writtenValue(-kInfinity), R"(,"Value":null})");
    EXPECT_EQ(writtenValue(PropertyValue::Array{kNan, 1.0, kInfinity}), R"(,"Value":[null,1.0,null]})");
}

TEST(RecordingContainer, WritesBytesAsHexText) {
    EXPECT_EQ(writtenValue(PropertyValue::Bytes{0x00, 0x0F, 0xFF}), R"(,"Value":"00 0f ff "})");
    EXPECT_EQ(writtenValue(PropertyValue::Bytes{}), R"(,"Value":""})");
}

TEST(RecordingContainer, WritesDictionariesInTheOrderOfTheirKeys) {
    EXPECT_EQ(writtenValue(PropertyValue::Dictionary{
                  {"b", 1u}, {"a", PropertyValue::Dictionary{}}, {"", PropertyValue::Array{}}, {"B", false}}),
              R"(,"Value":{"":[],"B":false,"a":{},"b":1}})");
}

TEST(RecordingContainer, ReplacesMalformedText) {
    EXPECT_EQ(writtenValue(std::string("a\xFF"
                                       "b")),
              ",\"Value\":\"a\xEF\xBF\xBD"
              "b\"}");
    EXPECT_EQ(writtenValue(PropertyValue::Dictionary{{"\x80", 1u}}), ",\"Value\":{\"\xEF\xBF\xBD\":1}}");
    EXPECT_EQ(written(metadataFrame(1, "\xC3", 1u)),
              "{\"Version\":2,\"Frames\":[{\"Type\":\"Metadata\",\"Timestamp\":1,\"Key\":\"\xEF\xBF\xBD\","
              "\"Value\":1}]}");
}

TEST(RecordingContainer, CanAlwaysReadWhatItWrote) {
    const PropertyValue values[] = {
        kNan,
        PropertyValue::Bytes{1, 2},
        "\xFF\xFE\xC0\x80\xED\xA0\x80\xF4\x90\x80\x80",
        std::string("\0\x01\x1F\"\\/\x7F\xC2\x80", 9),
        PropertyValue::Dictionary{{"\xFF", 1u}, {"\xFE", 2u}, {"\xC3", 3u}},
        PropertyValue::Array{PropertyValue::Dictionary{{"x", kInfinity}}},
    };
    for (const PropertyValue &value : values) {
        EXPECT_EQ(refusal(written(stateFrame(1, "k", value))), "");
        EXPECT_EQ(refusal(written(metadataFrame(1, "\xF0\x9F", value))), "");
    }
}

/// `depth` arrays around a number.
PropertyValue nested(std::size_t depth) {
    PropertyValue value = 7u;
    for (std::size_t i = 0; i < depth; ++i)
        value = PropertyValue::Array{value};
    return value;
}

TEST(RecordingContainer, WritesSixtyFourLevelsAndNoMore) {
    // A value stands at level 4, below container, array and frame: 61 levels are left for it.
    EXPECT_EQ(writtenValue(nested(61)),
              R"(,"Value":)" + std::string(61, '[') + "7" + std::string(61, ']') + "}");
    EXPECT_EQ(writtenValue(nested(62)),
              R"(,"Value":)" + std::string(61, '[') + "null" + std::string(61, ']') + "}");
    EXPECT_EQ(writtenValue(nested(500)),
              R"(,"Value":)" + std::string(61, '[') + "null" + std::string(61, ']') + "}");
    for (const std::size_t depth : {61u, 62u, 500u})
        EXPECT_EQ(refusal(written(stateFrame(1, "k", nested(depth)))), "") << depth;
}

TEST(RecordingContainer, SkipsFramesOfAnyOtherKind) {
    FrameList list;
    list.append(reportFrame(1, {1}));
    list.append({static_cast<FrameType>(3), 2, "k", 1u, {2}});
    list.append(reportFrame(3, {3}));
    EXPECT_EQ(writeRecordingContainer(list), R"({"Version":2,"Frames":[)"
                                             R"({"Type":"InputReport","Timestamp":1,"Data":"01 "},)"
                                             R"({"Type":"InputReport","Timestamp":3,"Data":"03 "}]})");
}

// --- Reading -------------------------------------------------------------------------------------

TEST(RecordingContainer, AnEmptyContainerReadsAndWritesBack) {
    const RecordingContainer empty = readRecordingContainer(R"({"Version": 2, "Frames": []})");
    EXPECT_EQ(empty.version, 2u);
    EXPECT_TRUE(empty.frames.empty());
    EXPECT_EQ(writeRecordingContainer(empty.frames), R"({"Version":2,"Frames":[]})");
}

TEST(RecordingContainer, ReadsEveryKindInFileOrder) {
    EXPECT_EQ(read(R"({"Type":"State","Timestamp":9,"Key":"a","Value":1.5},)"
                   R"({"Type":"InputReport","Timestamp":8,"Data":"01 ab ff "},)"
                   R"({"Type":"Metadata","Timestamp":7,"Key":"m","Value":{"x":[1,-2,null,true,"t"]}})"),
              (std::vector<Frame>{
                  stateFrame(9, "a", 1.5), reportFrame(8, {0x01, 0xAB, 0xFF}),
                  metadataFrame(7, "m",
                                PropertyValue::Dictionary{
                                    {"x", PropertyValue::Array{1u, -2.0, PropertyValue(), true, "t"}}})}));
}

TEST(RecordingContainer, TheOrderOfKeysDoesNotMatter) {
    const char *text = R"({"Frames":[{"Value":false,"Key":"a","Timestamp":9,"Type":"State"},)"
                       R"({"Data":"07","Timestamp":3,"Type":"InputReport"}],"Version":2})";
    EXPECT_EQ(framesOf(readRecordingContainer(text).frames),
              (std::vector<Frame>{stateFrame(9, "a", false), reportFrame(3, {7})}));
}

TEST(RecordingContainer, KeysThatItDoesNotKnowAreIgnored) {
    const char *text =
        R"({"Author":{"Version":9},"Version":2,"Frames":[)"
        R"({"Type":"State","Timestamp":9,"Key":"a","Value":1,"Data":5,"Report":[{}],"type":"x"},)"
        R"({"Type":"InputReport","Timestamp":9,"Data":"07","Key":1,"Value":{}}],"Reports":7})";
    EXPECT_EQ(framesOf(readRecordingContainer(text).frames),
              (std::vector<Frame>{stateFrame(9, "a", 1u), reportFrame(9, {7})}));
}

TEST(RecordingContainer, EscapedKeysAreTheKeysTheyStandFor) {
    const char *text = R"({"\u0056ersion":2,"Fr\u0061mes":[{"T\u0079pe":"St\u0061te","Timest\u0061mp":1,)"
                       R"("\u004bey":"\u0061","V\u0061lue":"\ud83d\ude00"}]})";
    EXPECT_EQ(framesOf(readRecordingContainer(text).frames),
              (std::vector<Frame>{stateFrame(1, "a", "\xF0\x9F\x98\x80")}));
}

TEST(RecordingContainer, WhiteSpaceAroundTheTextIsAllowed) {
    EXPECT_EQ(refusal(" \t\r\n{ \"Version\" : 2 ,\r\n\t\"Frames\" : [ ] } \n\t\r "), "");
}

TEST(RecordingContainer, NumbersKeepTheirKind) {
    const auto value = [](const char *number) {
        return read(R"({"Type":"State","Timestamp":1,"Key":"k","Value":)" + std::string(number) + "}")
            .at(0)
            .value;
    };
    EXPECT_EQ(value("0"), PropertyValue(0u));
    EXPECT_EQ(value("2"), PropertyValue(2u));
    EXPECT_EQ(value("2.0"), PropertyValue(2.0));
    EXPECT_EQ(value("2e0"), PropertyValue(2.0));
    EXPECT_EQ(value("9223372036854775808"), PropertyValue(9223372036854775808u));
    EXPECT_EQ(value("18446744073709551615"), PropertyValue(18446744073709551615u));
    EXPECT_EQ(value("-5"), PropertyValue(-5.0));
    EXPECT_EQ(value("-9223372036854775808"), PropertyValue(-9223372036854775808.0));
    EXPECT_EQ(value("1e308"), PropertyValue(1e308));
    EXPECT_EQ(value("1e-400"), PropertyValue(0.0));
    EXPECT_EQ(value("0.666700005531311"), PropertyValue(0.6667f));
}

TEST(RecordingContainer, TimestampsAreReadAsUnsigned) {
    const auto timestamp = [](const char *number) {
        return read(R"({"Type":"InputReport","Data":"","Timestamp":)" + std::string(number) + "}")
            .at(0)
            .timestampNs;
    };
    EXPECT_EQ(timestamp("0"), 0u);
    EXPECT_EQ(timestamp("18446744073709551615"), 18446744073709551615u);
    EXPECT_EQ(timestamp("5.0"), 5u);
    EXPECT_EQ(timestamp("5.9"), 5u);
    EXPECT_EQ(timestamp("1e3"), 1000u);
    EXPECT_EQ(timestamp("-1"), 0u);
    EXPECT_EQ(timestamp("-9223372036854775808"), 0u);
    EXPECT_EQ(timestamp("-0.5"), 0u);
    EXPECT_EQ(timestamp("1e30"), 18446744073709551615u);
    EXPECT_EQ(timestamp("18446744073709551616.0"), 18446744073709551615u);
}

TEST(RecordingContainer, ReportsAreHexText) {
    const auto data = [](const std::string &text) {
        return read(R"({"Type":"InputReport","Timestamp":1,"Data":")" + text + R"("})").at(0).data;
    };
    using Bytes = std::vector<std::uint8_t>;
    EXPECT_EQ(data(""), Bytes{});
    EXPECT_EQ(data("01 ab ff "), (Bytes{0x01, 0xAB, 0xFF}));
    EXPECT_EQ(data("1 2 3"), (Bytes{1, 2, 3}));
    EXPECT_EQ(data("0xAB FF"), (Bytes{0xAB, 0xFF}));
    EXPECT_EQ(data(R"(01\t02\n\n 03)"), (Bytes{1, 2, 3}));
    EXPECT_EQ(data("01 zz 02"), Bytes{1});
    EXPECT_EQ(data("01 -1 02"), Bytes{1});
    EXPECT_EQ(data("01 +1 02"), Bytes{1});
    EXPECT_EQ(data("01 02x 03"), Bytes{1});
    EXPECT_EQ(data("01 10000 02"), Bytes{1}) << "beyond 16 bits is no number";
    EXPECT_EQ(data("ff g0 100"), Bytes{0xFF}) << "nothing after the end of the text is looked at";
}

TEST(RecordingContainer, EqualKeysLastOneHolds) {
    EXPECT_EQ(read(R"({"Type":"Metadata","Type":"State","Timestamp":1,"Timestamp":2,"Key":"a","Key":"b",)"
                   R"("Value":1,"Value":[1,{"x":1,"x":2}]})"),
              (std::vector<Frame>{
                  stateFrame(2, "b", PropertyValue::Array{1u, PropertyValue::Dictionary{{"x", 2u}}})}));
    EXPECT_EQ(read(R"({"Type":7,"Timestamp":"x","Data":100,"Type":"InputReport","Timestamp":2,"Data":"05"})"),
              (std::vector<Frame>{reportFrame(2, {5})}))
        << "also when the first one is no good";
    EXPECT_EQ(frameRefusal(R"({"Type":"InputReport","Timestamp":2,"Data":"05","Data":100})"),
              "invalid_argument: invalid report");
    EXPECT_EQ(frameRefusal(R"({"Type":"InputReport","Timestamp":2,"Data":"05","Type":"Nothing"})"),
              "invalid_argument: invalid frame type");
    EXPECT_EQ(frameRefusal(R"({"Type":"InputReport","Timestamp":2,"Data":"05","Timestamp":null})"),
              "invalid_argument: invalid frame timestamp");
}

TEST(RecordingContainer, EqualKeysOfTheContainerLastOneHolds) {
    EXPECT_EQ(refusal(R"({"Version":3,"Frames":7,"Version":2,"Frames":[]})"), "");
    EXPECT_EQ(refusal(R"({"Version":2,"Frames":[],"Version":3})"),
              migrationRefusal("invalid container version: 3"));
    EXPECT_EQ(refusal(R"({"Version":2,"Frames":[],"Version":"2"})"), migrationRefusal("invalid version"));
    EXPECT_EQ(refusal(R"({"Version":2,"Frames":[],"Frames":null})"), "invalid_argument: invalid frames");
    const auto last = readRecordingContainer(
        R"({"Frames":[{"Type":"bad"}],"Version":2,"Frames":[{"Type":"InputReport","Timestamp":1,"Data":"01"}]})");
    EXPECT_EQ(framesOf(last.frames), (std::vector<Frame>{reportFrame(1, {1})}))
        << "the first array is not looked at";
    EXPECT_EQ(refusal(R"({"Version":1,"Frames":[{"Type":"InputReport"}],"Frames":[]})"), "");
    const auto old = readRecordingContainer(
        R"({"Version":1,"Frames":[{"Type":"InputReport","Report":5,"Timestamp":1,"Report":"02"}]})");
    EXPECT_EQ(framesOf(old.frames), (std::vector<Frame>{reportFrame(1, {2})}));
    const auto older = readRecordingContainer(
        R"({"Version":0,"Reports":5,"Reports":[{"Timestamp":"x","ReportData":5,"ReportData":"03","Timestamp":4}]})");
    EXPECT_EQ(framesOf(older.frames), (std::vector<Frame>{reportFrame(4, {3})}));
}

TEST(RecordingContainer, AnyVersionMayStandBehindItsFrames) {
    const std::string both = R"([{"Type":"State","Timestamp":1,"Key":"k","Value":5},)"
                             R"({"Type":"InputReport","Timestamp":2,"Data":"02","Report":"03"}])";
    const auto lastVersion = [&both](const char *version) {
        return readRecordingContainer(
            R"({"Reports":[{"Timestamp":4,"ReportData":"04"}],"Version":2,"Frames":)" + both +
            R"(,"Version":)" + version + "}");
    };
    EXPECT_EQ(framesOf(lastVersion("2").frames),
              (std::vector<Frame>{stateFrame(1, "k", 5u), reportFrame(2, {2})}));
    EXPECT_EQ(framesOf(lastVersion("1").frames),
              (std::vector<Frame>{stateFrame(1, "k", 5u), reportFrame(2, {3})}));
    EXPECT_EQ(framesOf(lastVersion("0").frames), (std::vector<Frame>{reportFrame(4, {4})}));
    EXPECT_EQ(refusal(R"({"Frames":)" + both + R"(,"Version":3})"),
              migrationRefusal("invalid container version: 3"));
}

TEST(RecordingContainer, ReadsTextThatArrivesByteByByte) {
    const std::string text = container("2", R"({"Type":"InputReport","Timestamp":2,"Data":"02 ff "},)"
                                            R"({"Type":"Metadata","Timestamp":3,"Key":"k","Value":"]}\""})");
    const RecordingContainer recording = readRecordingContainer(
        [pieces = Util::piecesOf(text)](char *to, std::size_t) mutable { return pieces(to, 1); });
    EXPECT_EQ(framesOf(recording.frames),
              (std::vector<Frame>{reportFrame(2, {2, 255}), metadataFrame(3, "k", "]}\"")}));
}

TEST(RecordingContainer, TextMustBeJsonBeforeAFrameCanBeWrong) {
    EXPECT_EQ(refusal(R"({"Version":2,"Frames":[{"Type":"bad"},{]}]})"),
              migrationRefusal("invalid container"));
    EXPECT_EQ(refusal(R"({"Version":2,"Frames":[{"Type":"bad"}]},)"), migrationRefusal("invalid container"));
    EXPECT_EQ(refusal(R"({"Version":1,"Frames":[{}],"x":01})"), migrationRefusal("invalid container"));
    EXPECT_EQ(refusal(R"({"Frames":[{"Type":"bad"}],"Version":3})"),
              migrationRefusal("invalid container version: 3"));
}

TEST(RecordingContainer, AllFramesAreMigratedBeforeOneIsRead) {
    EXPECT_EQ(refusal(R"({"Version":1,"Frames":[{"Type":"InputReport","Report":5},{"Type":7}]})"),
              migrationRefusal("frame Type isn't a string"));
    EXPECT_EQ(refusal(R"({"Version":0,"Reports":[{"Timestamp":"x","ReportData":"1"},{"Timestamp":1}]})"),
              migrationRefusal("frame lacks ReportData"));
}

// --- Texts that are no container -----------------------------------------------------------------

/// A good container but for what stands under a key that nothing reads.
std::string withExtra(std::string_view json) {
    return R"({"Version":2,"Frames":[],"x":)" + std::string(json) + "}";
}

TEST(RecordingContainer, RefusesWhatIsNoJson) {
    using namespace std::string_literals;
    const std::string good = R"({"Version":2,"Frames":[]})";
    ASSERT_EQ(refusal(good), "");
    const std::string texts[] = {
        "",
        " ",
        "nonsense",
        "{",
        good + "}",
        good + " x",
        good + good,
        good + ",",
        good + "\0"s,
        "\0"s + good,
        good.substr(0, good.size() - 1),
        R"({"Version":2,"Frames":[],})",
        R"({'Version':2,'Frames':[]})",
        R"({"Version":2 "Frames":[]})",
        R"({Version:2,"Frames":[]})",
        "/**/" + good,
        "\xEF\xBB\xBF" + good,
        "\xFE\xFF" + good,
        good + "\xEF\xBB\xBF",
        withExtra("01"),
        withExtra("+1"),
        withExtra(".5"),
        withExtra("1."),
        withExtra("1e"),
        withExtra("-"),
        withExtra("NaN"),
        withExtra("Infinity"),
        withExtra("nul"),
        withExtra("True"),
        withExtra("0x10"),
        withExtra("[1,]"),
        withExtra("[1 2]"),
        withExtra("[1"),
        withExtra("1]"),
        withExtra(R"({"a"})"),
        withExtra(R"({"a":})"),
        withExtra(R"({1:2})"),
        withExtra(R"("open)"),
        withExtra(R"("\x")"),
        withExtra(R"("\u12G4")"),
        withExtra(R"("\u12")"),
        withExtra("\"a\nb\""),
        withExtra("\"a\0b\""s),
        withExtra("\"a\x1F\""),
    };
    for (const std::string &text : texts)
        EXPECT_EQ(refusal(text), migrationRefusal("invalid container")) << text;
}

TEST(RecordingContainer, RefusesMalformedUtf8Anywhere) {
    const std::string bad[] = {
        "\x80",
        "\xFF",
        "\xC3",
        "\xC0\x80",
        "\xE2\x82",
        "\xED\xA0\x80",
        "\xED\xBF\xBF",
        "\xF4\x90\x80\x80",
        "\xF0\x80\x80\x80",
        "\xF8\x88\x80\x80\x80",
    };
    for (const std::string &bytes : bad) {
        EXPECT_EQ(refusal(withExtra("\"" + bytes + "\"")), migrationRefusal("invalid container"));
        EXPECT_EQ(refusal(withExtra("{\"" + bytes + "\":1}")), migrationRefusal("invalid container"));
        EXPECT_EQ(frameRefusal("{\"Type\":\"State\",\"Timestamp\":1,\"Key\":\"" + bytes + "\",\"Value\":1}"),
                  migrationRefusal("invalid container"));
    }
    EXPECT_EQ(refusal(withExtra("\"\xF4\x8F\xBF\xBF\xED\x9F\xBF\xEE\x80\x80\"")), "") << "the edges are fine";
}

TEST(RecordingContainer, RefusesUnpairedSurrogates) {
    for (const char *text :
         {R"("\ud800")", R"("\udbff")", R"("\udc00")", R"("\udfff")", R"("\ud800x")", R"("\ud800\u0041")",
          R"("\ud800\ud800")", R"("\udc00\ud800")", R"("\ud83d\ude00\ude00")", R"("\ud800\n")",
          R"("\ud800\\udc00")", R"({"\ud800":1})", R"({"\udc00":1})"})
        EXPECT_EQ(refusal(withExtra(text)), migrationRefusal("invalid container")) << text;
    for (const char *text : {R"("\ud800\udc00")", R"("\udbff\udfff")", R"("\uD83D\uDE00")", R"("\\ud800")"})
        EXPECT_EQ(refusal(withExtra(text)), "") << text;
}

TEST(RecordingContainer, RefusesNumbersOutOfRange) {
    for (const char *number :
         {"1e400", "-1e400", "1e309", "18446744073709551616", "99999999999999999999999999"}) {
        EXPECT_EQ(refusal(withExtra(number)), migrationRefusal("invalid container")) << number;
        EXPECT_EQ(frameRefusal(R"({"Type":"InputReport","Data":"","Timestamp":)" + std::string(number) + "}"),
                  migrationRefusal("invalid container"))
            << number;
    }
}

TEST(RecordingContainer, RefusesMoreThanSixtyFourLevels) {
    const auto arrays = [](std::size_t depth, const char *core) {
        return std::string(depth, '[') + core + std::string(depth, ']');
    };
    const auto objects = [](std::size_t depth, const std::string &core) {
        std::string text = core;
        for (std::size_t i = 0; i < depth; ++i)
            text = R"({"a":)" + text + "}";
        return text;
    };
    // The container is level 1, so that 63 more fit.
    for (const char *core : {"", "7", "\"t\"", "null"})
        EXPECT_EQ(refusal(withExtra(arrays(63, core))), "") << core;
    EXPECT_EQ(refusal(withExtra(objects(63, "7"))), "");
    EXPECT_EQ(refusal(withExtra(objects(62, "{}"))), "");
    EXPECT_EQ(refusal(withExtra(arrays(64, ""))), migrationRefusal("invalid container"));
    EXPECT_EQ(refusal(withExtra(arrays(64, "7"))), migrationRefusal("invalid container"));
    EXPECT_EQ(refusal(withExtra(objects(64, "7"))), migrationRefusal("invalid container"));
    EXPECT_EQ(refusal(withExtra(objects(63, "{}"))), migrationRefusal("invalid container"));
    // A frame's value stands at level 4.
    const std::string head = R"({"Type":"State","Timestamp":1,"Key":"k","Value":)";
    EXPECT_EQ(read(head + arrays(61, "7") + "}").at(0).value, nested(61));
    EXPECT_EQ(frameRefusal(head + arrays(62, "7") + "}"), migrationRefusal("invalid container"));
}

TEST(RecordingContainer, EnormousNestingIsRefusedQuietly) {
    std::string objects;
    for (int i = 0; i < 200000; ++i)
        objects += R"({"Frames":[)";
    for (const std::string &text : {std::string(1000000, '['), std::string(1000000, '{'), objects,
                                    withExtra(std::string(1000000, '[') + std::string(1000000, ']'))})
        EXPECT_EQ(refusal(text), migrationRefusal("invalid container"));
}

TEST(RecordingContainer, RefusesWhatIsNoObject) {
    for (const char *text : {"[]", "null", "true", "2", "\"Version\"", R"([{"Version":2,"Frames":[]}])"})
        EXPECT_EQ(refusal(text), migrationRefusal("invalid container")) << text;
}

TEST(RecordingContainer, TellsWhatTheJsonParserFound) {
    try {
        (void)readRecordingContainer("{]");
        FAIL() << "nothing was thrown";
    } catch (const ContainerError &error) {
        EXPECT_EQ(error.what(), kMigrationFailed + "invalid container");
        EXPECT_EQ(error.problem, "invalid container");
        EXPECT_EQ(error.reason, "an object's key must be a string");
        EXPECT_EQ(error.offset, 1u);
        EXPECT_FALSE(error.frameIndex.has_value());
    }
    try {
        (void)readRecordingContainer("[]");
        FAIL() << "nothing was thrown";
    } catch (const ContainerError &error) {
        EXPECT_EQ(error.reason, "") << "it is JSON";
    }
}

// --- Versions ------------------------------------------------------------------------------------

TEST(RecordingContainer, VersionsAreComparedAsNumbers) {
    for (const char *version : {"2", "2.0", "2e0", "0.2e1", "20e-1"})
        EXPECT_EQ(refusal(container(version, "")), "") << version;
    EXPECT_EQ(readRecordingContainer(container("2.0", "")).version, 2u);
    EXPECT_EQ(readRecordingContainer(container("1.0", "")).version, 1u);
    EXPECT_EQ(readRecordingContainer(container("0.0", "")).version, 0u);
    EXPECT_EQ(readRecordingContainer(container("1", "")).version, 1u);
    EXPECT_EQ(readRecordingContainer(container("0", "")).version, 0u);
}

TEST(RecordingContainer, UnknownVersionsArePrinted) {
    EXPECT_EQ(refusal(container("3", "")), migrationRefusal("invalid container version: 3"));
    EXPECT_EQ(refusal(container("2.5", "")), migrationRefusal("invalid container version: 2.5"));
    EXPECT_EQ(refusal(container("0.5", "")), migrationRefusal("invalid container version: 0.5"));
    EXPECT_EQ(refusal(container("18446744073709551615", "")),
              migrationRefusal("invalid container version: 18446744073709551615"));
    EXPECT_EQ(refusal(container("-1", "")), migrationRefusal("invalid container version: -1"));
}

TEST(RecordingContainer, UnknownVersionsArePrintedAsTheyAreWritten) {
    for (const char *version :
         {"-2", "-2.0", "-0.5", "3.0", "3.00", "1e300", "1E+300", "4e0", "0.30", "2.50"}) {
        const std::string expected = migrationRefusal(std::string("invalid container version: ") + version);
        EXPECT_EQ(refusal(container(version, "")), expected);
        EXPECT_EQ(refusal("{ \"Version\"\t:\n" + std::string(version) + " }"), expected);
        EXPECT_EQ(
            refusal(
                R"({"a":{"Version":8},"b":["Version"],"c":"Version","Version":[9],"\\\"":1,"\u0056ersion":)" +
                std::string(version) + R"(,"d":{"Version":7}})"),
            expected);
    }
}

TEST(RecordingContainer, AParsedVersionIsPrintedInDecimal) {
    const auto message = [](PropertyValue version) -> std::string {
        try {
            (void)migrateRecordingContainer(PropertyValue::Dictionary{{"Version", std::move(version)}});
        } catch (const std::invalid_argument &error) {
            return error.what();
        }
        return "nothing was thrown";
    };
    EXPECT_EQ(message(3u), "invalid container version: 3");
    EXPECT_EQ(message(-2.0), "invalid container version: -2");
    EXPECT_EQ(message(2.5), "invalid container version: 2.5");
}

TEST(RecordingContainer, AVersionMustBeANumber) {
    for (const char *version : {R"("2")", "true", "false", "null", "[2]", R"({"Version":2})", R"("")"})
        EXPECT_EQ(refusal(container(version, "")), migrationRefusal("invalid version")) << version;
    EXPECT_EQ(refusal(R"({"Frames":[]})"), migrationRefusal("invalid version"));
    EXPECT_EQ(refusal("{}"), migrationRefusal("invalid version"));
    EXPECT_EQ(refusal(R"({"version":2,"Frames":[]})"), migrationRefusal("invalid version"));
}

// --- Frames that are not as they must be ---------------------------------------------------------

struct BadFrame {
    const char *frame;
    const char *message;
};

constexpr BadFrame kBadFrames[] = {
    {R"({})", "invalid frame type"},
    {R"(7)", "invalid frame type"},
    {R"(null)", "invalid frame type"},
    {R"("State")", "invalid frame type"},
    {R"([])", "invalid frame type"},
    {R"([{"Type":"State","Timestamp":1,"Key":"k","Value":1}])", "invalid frame type"},
    {R"({"Type":1,"Timestamp":1})", "invalid frame type"},
    {R"({"Type":null,"Timestamp":1})", "invalid frame type"},
    {R"({"Type":["State"],"Timestamp":1})", "invalid frame type"},
    {R"({"Type":"","Timestamp":1})", "invalid frame type"},
    {R"({"Type":"state","Timestamp":1,"Key":"k","Value":1})", "invalid frame type"},
    {R"({"Type":"State ","Timestamp":1,"Key":"k","Value":1})", "invalid frame type"},
    {R"({"Type":"State\u0000","Timestamp":1,"Key":"k","Value":1})", "invalid frame type"},
    {R"({"type":"State","Timestamp":1,"Key":"k","Value":1})", "invalid frame type"},
    {R"({"Type":"State"})", "invalid frame timestamp"},
    {R"({"Type":"State","Timestamp":null,"Key":"k","Value":1})", "invalid frame timestamp"},
    {R"({"Type":"State","Timestamp":"1","Key":"k","Value":1})", "invalid frame timestamp"},
    {R"({"Type":"State","Timestamp":true,"Key":"k","Value":1})", "invalid frame timestamp"},
    {R"({"Type":"State","Timestamp":[1],"Key":"k","Value":1})", "invalid frame timestamp"},
    {R"({"Type":"InputReport","Data":"01"})", "invalid frame timestamp"},
    {R"({"Type":"Metadata","Key":"k","Value":1})", "invalid frame timestamp"},
    {R"({"Type":"State","Timestamp":1})", "invalid state key"},
    {R"({"Type":"State","Timestamp":1,"Value":1})", "invalid state key"},
    {R"({"Type":"State","Timestamp":1,"Key":5,"Value":1})", "invalid state key"},
    {R"({"Type":"State","Timestamp":1,"Key":null,"Value":1})", "invalid state key"},
    {R"({"Type":"State","Timestamp":1,"Key":"k"})", "invalid state value class"},
    {R"({"Type":"State","Timestamp":1,"Key":"k","value":1})", "invalid state value class"},
    {R"({"Type":"InputReport","Timestamp":1})", "invalid report"},
    {R"({"Type":"InputReport","Timestamp":1,"Report":"01"})", "invalid report"},
    {R"({"Type":"InputReport","Timestamp":1,"Data":1})", "invalid report"},
    {R"({"Type":"InputReport","Timestamp":1,"Data":null})", "invalid report"},
    {R"({"Type":"InputReport","Timestamp":1,"Data":["01"]})", "invalid report"},
    {R"({"Type":"InputReport","Timestamp":1,"Data":"100"})", "invalid hex string"},
    {R"({"Type":"InputReport","Timestamp":1,"Data":"01 ff ffff"})", "invalid hex string"},
    {R"({"Type":"Metadata","Timestamp":1})", "invalid metadata key"},
    {R"({"Type":"Metadata","Timestamp":1,"Key":5,"Value":1})", "invalid metadata key"},
    {R"({"Type":"Metadata","Timestamp":1,"Key":"k"})", "invalid metadata value class"},
};

TEST(RecordingContainer, EveryFrameIsChecked) {
    for (const BadFrame &bad : kBadFrames)
        EXPECT_EQ(frameRefusal(bad.frame), std::string("invalid_argument: ") + bad.message) << bad.frame;
}

TEST(RecordingContainer, TellsWhichFrameIsBad) {
    const std::string good = R"({"Type":"InputReport","Timestamp":1,"Data":"01"},)";
    for (const BadFrame &bad : kBadFrames) {
        try {
            (void)readRecordingContainer(container("2", good + good + bad.frame + "," + good + "{}"));
            FAIL() << "nothing was thrown: " << bad.frame;
        } catch (const FrameError &error) {
            EXPECT_STREQ(error.what(), bad.message) << bad.frame;
            EXPECT_EQ(error.frameIndex, 2u) << bad.frame;
        }
    }
}

TEST(RecordingContainer, ANullValueIsAValue) {
    EXPECT_EQ(
        read(R"({"Type":"State","Timestamp":1,"Key":"k","Value":null},)"
             R"({"Type":"Metadata","Timestamp":2,"Key":"","Value":null})"),
        (std::vector<Frame>{stateFrame(1, "k", PropertyValue()), metadataFrame(2, "", PropertyValue())}));
}

TEST(RecordingContainer, FramesMustBeAnArray) {
    for (const char *frames : {"null", "{}", "7", R"("[]")", "true"}) {
        for (const char *version : {"2", "1"}) {
            const std::string text =
                R"({"Version":)" + std::string(version) + R"(,"Frames":)" + std::string(frames) + "}";
            EXPECT_EQ(refusal(text), "invalid_argument: invalid frames") << text;
        }
        EXPECT_EQ(refusal(R"({"Version":0,"Reports":)" + std::string(frames) + "}"),
                  "invalid_argument: invalid frames")
            << frames;
    }
    EXPECT_EQ(refusal(R"({"Version":2})"), "invalid_argument: invalid frames") << "missing";
}

TEST(RecordingContainer, FailuresComeInOrder) {
    // Everything is wrong at once, and is put right step by step.
    const auto text = [](const char *version, const char *frames, const char *tail) {
        return R"({"Version":)" + std::string(version) + R"(,"Frames":)" + std::string(frames) + "}" + tail;
    };
    const char *frames = R"([{"Type":"InputReport","Timestamp":"x","Report":5},{"Type":"InputReport"},{}])";
    EXPECT_EQ(refusal(text("\"1\"", frames, "x")), migrationRefusal("invalid container"));
    EXPECT_EQ(refusal(text("\"1\"", frames, "")), migrationRefusal("invalid version"));
    EXPECT_EQ(refusal(text("7", frames, "")), migrationRefusal("invalid container version: 7"));
    EXPECT_EQ(refusal(text("1", frames, "")), migrationRefusal("frame lacks Report"))
        << "all frames migrate first";
    frames = R"([{"Type":"InputReport","Timestamp":"x","Report":5},{"Type":"State"},{}])";
    EXPECT_EQ(refusal(text("1", frames, "")), migrationRefusal("frame lacks Type"));
    frames = R"([{"Type":"InputReport","Timestamp":"x","Report":5},{"Type":"State"},{"Type":"Other"}])";
    EXPECT_EQ(refusal(text("1", frames, "")), "invalid_argument: invalid frame timestamp");
    frames = R"([{"Type":"InputReport","Timestamp":1,"Report":5},{"Type":"State"},{"Type":"Other"}])";
    EXPECT_EQ(refusal(text("1", frames, "")), "invalid_argument: invalid report");
    frames = R"([{"Type":"InputReport","Timestamp":1,"Report":"100"},{"Type":"State"},{"Type":"Other"}])";
    EXPECT_EQ(refusal(text("1", frames, "")), "invalid_argument: invalid hex string");
    frames = R"([{"Type":"InputReport","Timestamp":1,"Report":"10"},{"Type":"State"},{"Type":"Other"}])";
    EXPECT_EQ(refusal(text("1", frames, "")), "invalid_argument: invalid frame timestamp");
    frames = R"([{"Type":"InputReport","Timestamp":1,"Report":"10"},{"Type":"Other"}])";
    EXPECT_EQ(refusal(text("1", frames, "")), "invalid_argument: invalid frame type");
}

TEST(RecordingContainer, AVersionIsCheckedBeforeTheFrames) {
    EXPECT_EQ(refusal(R"({"Frames":[{"Type":5}],"Version":3})"),
              migrationRefusal("invalid container version: 3"));
    EXPECT_EQ(refusal(R"({"Frames":7,"Version":"x"})"), migrationRefusal("invalid version"));
}

// --- Older versions ------------------------------------------------------------------------------

TEST(RecordingContainer, ReadsVersionOne) {
    const RecordingContainer old = readRecordingContainer(
        R"({"Version":1,"Frames":[{"Type":"InputReport","Timestamp":5,"Report":"01 02"},)"
        R"({"Type":"State","Timestamp":6,"Key":"a","Value":false},)"
        R"({"Type":"Metadata","Timestamp":7,"Key":"m","Value":[]}]})");
    EXPECT_EQ(old.version, 1u);
    EXPECT_EQ(framesOf(old.frames), (std::vector<Frame>{reportFrame(5, {1, 2}), stateFrame(6, "a", false),
                                                        metadataFrame(7, "m", PropertyValue::Array{})}));
}

TEST(RecordingContainer, ReadsVersionZero) {
    const RecordingContainer old =
        readRecordingContainer(R"({"Version":0,"Reports":[{"Timestamp":5,"ReportData":"01 02"},)"
                               R"({"ReportData":"ff ","Timestamp":4,"Type":"State","Key":9}]})");
    EXPECT_EQ(old.version, 0u);
    EXPECT_EQ(framesOf(old.frames), (std::vector<Frame>{reportFrame(5, {1, 2}), reportFrame(4, {0xFF})}))
        << "every report of version 0 is an input report";
}

TEST(RecordingContainer, AnOlderContainerWithoutFramesIsEmpty) {
    EXPECT_TRUE(readRecordingContainer(R"({"Version":0})").frames.empty());
    EXPECT_TRUE(readRecordingContainer(R"({"Version":0,"Reports":[]})").frames.empty());
    EXPECT_TRUE(readRecordingContainer(R"({"Version":0,"Frames":[{}]})").frames.empty())
        << "Frames is not its key";
    EXPECT_TRUE(readRecordingContainer(R"({"Version":1})").frames.empty());
    EXPECT_TRUE(readRecordingContainer(R"({"Version":1,"Frames":[],"Reports":[{}]})").frames.empty());
}

TEST(RecordingContainer, TheReportOfVersionOneReplacesItsData) {
    const RecordingContainer old = readRecordingContainer(
        R"({"Version":1,"Frames":[{"Type":"InputReport","Timestamp":5,"Report":"01","Data":"02"},)"
        R"({"Type":"InputReport","Timestamp":6,"Data":7,"Report":"03"}]})");
    EXPECT_EQ(framesOf(old.frames), (std::vector<Frame>{reportFrame(5, {1}), reportFrame(6, {3})}));
}

TEST(RecordingContainer, OtherFramesOfVersionOneKeepTheirReport) {
    EXPECT_EQ(
        refusal(
            R"({"Version":1,"Frames":[{"Type":"State","Timestamp":5,"Key":"a","Value":1,"Report":"zz"}]})"),
        "");
}

struct BadOldFrame {
    const char *version;
    const char *frame; ///< of "Reports" for version 0
    const char *error;
    bool inMigration;
};

constexpr BadOldFrame kBadOldFrames[] = {
    {"1", R"({})", "frame lacks Type", true},
    {"1", R"(7)", "frame lacks Type", true},
    {"1", R"(null)", "frame lacks Type", true},
    {"1", R"([])", "frame lacks Type", true},
    {"1", R"({"Timestamp":1,"Report":"01"})", "frame lacks Type", true},
    {"1", R"({"Type":5,"Timestamp":1,"Report":"01"})", "frame Type isn't a string", true},
    {"1", R"({"Type":null,"Timestamp":1,"Report":"01"})", "frame Type isn't a string", true},
    {"1", R"({"Type":"InputReport","Timestamp":1})", "frame lacks Report", true},
    {"1", R"({"Type":"InputReport","Timestamp":1,"Data":"01"})", "frame lacks Report", true},
    {"1", R"({"Type":"InputReport","Report":"01"})", "invalid frame timestamp", false},
    {"1", R"({"Type":"InputReport","Timestamp":1,"Report":5})", "invalid report", false},
    {"1", R"({"Type":"InputReport","Timestamp":1,"Report":null})", "invalid report", false},
    {"1", R"({"Type":"InputReport","Timestamp":1,"Report":"100"})", "invalid hex string", false},
    {"1", R"({"Type":"Other","Timestamp":1})", "invalid frame type", false},
    {"1", R"({"Type":"State","Timestamp":1})", "invalid state key", false},
    {"1", R"({"Type":"Metadata","Timestamp":1,"Key":"k"})", "invalid metadata value class", false},
    {"0", R"({})", "frame lacks Timestamp", true},
    {"0", R"(7)", "frame lacks Timestamp", true},
    {"0", R"("x")", "frame lacks Timestamp", true},
    {"0", R"({"ReportData":"01"})", "frame lacks Timestamp", true},
    {"0", R"({"Timestamp":1})", "frame lacks ReportData", true},
    {"0", R"({"Timestamp":1,"Report":"01","Data":"01"})", "frame lacks ReportData", true},
    {"0", R"({"Timestamp":"x","ReportData":"01"})", "invalid frame timestamp", false},
    {"0", R"({"Timestamp":null,"ReportData":"01"})", "invalid frame timestamp", false},
    {"0", R"({"Timestamp":1,"ReportData":5})", "invalid report", false},
    {"0", R"({"Timestamp":1,"ReportData":null})", "invalid report", false},
    {"0", R"({"Timestamp":1,"ReportData":"0x100"})", "invalid hex string", false},
};

std::string oldContainer(const BadOldFrame &bad) {
    const bool isReport = std::string_view(bad.version) == "0";
    const std::string good = isReport ? R"({"Timestamp":1,"ReportData":"01"},)"
                                      : R"({"Type":"InputReport","Timestamp":1,"Report":"01"},)";
    return R"({"Version":)" + std::string(bad.version) + (isReport ? R"(,"Reports":[)" : R"(,"Frames":[)") +
           good + bad.frame + "]}";
}

TEST(RecordingContainer, EveryOldFrameIsChecked) {
    for (const BadOldFrame &bad : kBadOldFrames) {
        const std::string expected =
            bad.inMigration ? migrationRefusal(bad.error) : std::string("invalid_argument: ") + bad.error;
        EXPECT_EQ(refusal(oldContainer(bad)), expected) << oldContainer(bad);
    }
}

TEST(RecordingContainer, TellsWhichOldFrameIsBad) {
    for (const BadOldFrame &bad : kBadOldFrames) {
        SCOPED_TRACE(oldContainer(bad));
        try {
            (void)readRecordingContainer(oldContainer(bad));
            FAIL() << "nothing was thrown";
        } catch (const FrameError &error) {
            EXPECT_FALSE(bad.inMigration);
            EXPECT_EQ(error.frameIndex, 1u);
        } catch (const ContainerError &error) {
            EXPECT_TRUE(bad.inMigration);
            EXPECT_EQ(error.frameIndex, 1u);
            EXPECT_EQ(error.reason, "");
        }
    }
}

// --- Migration of value trees --------------------------------------------------------------------

using Array = PropertyValue::Array;
using Dictionary = PropertyValue::Dictionary;

/// Why a value tree cannot be migrated; empty if it can.
std::string migrationError(const PropertyValue &object) {
    try {
        (void)PipelineRecording::migrateSerializedContainer(object);
    } catch (const std::invalid_argument &error) {
        return error.what();
    }
    return "";
}

TEST(RecordingMigration, ReturnsTheCurrentVersionUnchanged) {
    const PropertyValue current(Dictionary{{"Version", 2u}, {"Frames", "anything"}, {"Extra", Array{1u}}});
    EXPECT_EQ(PipelineRecording::migrateSerializedContainer(current), current);
    const PropertyValue bare(Dictionary{{"Version", 2.0}});
    EXPECT_EQ(migrateRecordingContainer(bare), bare);
}

TEST(RecordingMigration, RenamesTheReportsOfVersionOne) {
    const PropertyValue old(Dictionary{
        {"Version", 1u},
        {"Extra", 5u},
        {"Frames",
         Array{Dictionary{{"Type", "InputReport"}, {"Report", "01"}, {"Timestamp", "as it is"}, {"x", 1u}},
               Dictionary{{"Type", "State"}, {"Report", "kept"}},
               Dictionary{{"Type", "Unknown"}, {"Value", PropertyValue()}}}},
    });
    const PropertyValue expected(Dictionary{
        {"Version", 2u},
        {"Frames",
         Array{Dictionary{{"Type", "InputReport"}, {"Data", "01"}, {"Timestamp", "as it is"}, {"x", 1u}},
               Dictionary{{"Type", "State"}, {"Report", "kept"}},
               Dictionary{{"Type", "Unknown"}, {"Value", PropertyValue()}}}},
    });
    EXPECT_EQ(PipelineRecording::migrateSerializedContainer(old), expected);
}

TEST(RecordingMigration, TurnsTheReportsOfVersionZeroIntoFrames) {
    const PropertyValue old(Dictionary{
        {"Version", 0u},
        {"Reports", Array{Dictionary{{"Timestamp", 5u}, {"ReportData", "01 02"}, {"x", 1u}},
                          Dictionary{{"Timestamp", PropertyValue()}, {"ReportData", 7u}}}},
    });
    const PropertyValue expected(Dictionary{
        {"Version", 2u},
        {"Frames", Array{Dictionary{{"Type", "InputReport"}, {"Timestamp", 5u}, {"Data", "01 02"}},
                         Dictionary{{"Type", "InputReport"}, {"Timestamp", PropertyValue()}, {"Data", 7u}}}},
    });
    EXPECT_EQ(PipelineRecording::migrateSerializedContainer(old), expected);
}

TEST(RecordingMigration, MakesAnEmptyContainerOfAMissingList) {
    const PropertyValue empty(Dictionary{{"Version", 2u}, {"Frames", Array{}}});
    EXPECT_EQ(PipelineRecording::migrateSerializedContainer(Dictionary{{"Version", 0u}}), empty);
    EXPECT_EQ(PipelineRecording::migrateSerializedContainer(Dictionary{{"Version", 1u}}), empty);
}

TEST(RecordingMigration, TellsWhatIsWrong) {
    EXPECT_EQ(migrationError(PropertyValue()), "invalid container");
    EXPECT_EQ(migrationError(Array{}), "invalid container");
    EXPECT_EQ(migrationError("{}"), "invalid container");
    EXPECT_EQ(migrationError(Dictionary{}), "invalid version");
    EXPECT_EQ(migrationError(Dictionary{{"Version", "2"}}), "invalid version");
    EXPECT_EQ(migrationError(Dictionary{{"Version", true}}), "invalid version");
    EXPECT_EQ(migrationError(Dictionary{{"Version", 3u}}), "invalid container version: 3");
    EXPECT_EQ(migrationError(Dictionary{{"Version", 2.5}}), "invalid container version: 2.5");
    EXPECT_EQ(migrationError(Dictionary{{"Version", 1u}, {"Frames", Array{Dictionary{}}}}),
              "frame lacks Type");
    EXPECT_EQ(migrationError(Dictionary{{"Version", 1u}, {"Frames", Array{Dictionary{{"Type", 1u}}}}}),
              "frame Type isn't a string");
    EXPECT_EQ(
        migrationError(Dictionary{{"Version", 1u}, {"Frames", Array{Dictionary{{"Type", "InputReport"}}}}}),
        "frame lacks Report");
    EXPECT_EQ(migrationError(Dictionary{{"Version", 0u}, {"Reports", Array{Dictionary{}}}}),
              "frame lacks Timestamp");
    EXPECT_EQ(migrationError(Dictionary{{"Version", 0u}, {"Reports", Array{Dictionary{{"Timestamp", 1u}}}}}),
              "frame lacks ReportData");
    EXPECT_EQ(migrationError(Dictionary{{"Version", kNan}}).substr(0, 27), "invalid container version: ");
}

// --- There and back ------------------------------------------------------------------------------

TEST(RecordingContainer, CanonicalTextComesBackAsItWas) {
    const std::string text =
        R"({"Version":2,"Frames":[)"
        R"({"Type":"State","Timestamp":1,"Key":"Algs.EnableTapSuppression","Value":false},)"
        R"({"Type":"InputReport","Timestamp":2,"Data":"01 ab ff "},)"
        R"({"Type":"Metadata","Timestamp":18446744073709551615,"Key":"","Value":{"":null,"a":[0,-0.5,1e+22,"\"\\"]}},)"
        R"({"Type":"State","Timestamp":4,"Key":"k","Value":200.0}]})";
    EXPECT_EQ(writeRecordingContainer(readRecordingContainer(text).frames), text);
}

TEST(RecordingContainer, OlderVersionsAreWrittenAsTheCurrentOne) {
    const auto old =
        readRecordingContainer(R"({"Version":0,"Reports":[{"Timestamp":5,"ReportData":"1 2"}]})");
    EXPECT_EQ(writeRecordingContainer(old.frames),
              R"({"Version":2,"Frames":[{"Type":"InputReport","Timestamp":5,"Data":"01 02 "}]})");
}

TEST(RecordingContainer, ReportsOfEveryLengthComeBack) {
    FrameList list;
    for (const std::size_t length : {0u, 1u, 73u, 76u, 77u, 512u, 600u, 70000u})
        list.append(reportFrame(length, Scripted::patternedReport(length, 1)));
    EXPECT_EQ(framesOf(readRecordingContainer(writeRecordingContainer(list)).frames), framesOf(list));
}

TEST(RecordingContainer, AFullRecordingComesBack) {
    FrameList list;
    for (std::uint64_t i = 0; i < 8700; ++i)
        list.append(reportFrame(i, Scripted::patternedReport(73, static_cast<std::uint8_t>(i))));
    EXPECT_EQ(framesOf(readRecordingContainer(writeRecordingContainer(list)).frames), framesOf(list));
}

} // namespace
} // namespace ZorvaTouch
