// The reader of message definitions: one text at a time, then folders.
#include "description/MsgReader.h"

#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using namespace inspector;
namespace fs = std::filesystem;

// One field as "type dimensions name", with the message and the refusal where it has them.
std::string fieldText(const MessageField& field) {
    std::string text = field.element.type.name;
    if (field.element.dimensions != std::vector<std::int64_t>{1})
        text += "*" + std::to_string(field.element.dimensions.front());
    text += " " + field.element.name;
    if (!field.message.empty()) text += " of " + field.message;
    if (!field.elementOfMatrix.empty()) text += " holds " + field.elementOfMatrix;
    return text;
}

struct LineCase {
    const char* line;
    const char* field; // empty where the line has none
};

// clang-format off
constexpr LineCase lines[] = {
    {"",                              ""},
    {"  # only a comment",            ""},
    {"bool a",                        "boolean a"},
    {"int8 a",                        "int8 a"},
    {"byte a",                        "int8 a"},
    {"uint8 a",                       "uint8 a"},
    {"char a",                        "uint8 a"},
    {"int16 a",                       "int16 a"},
    {"uint16 a",                      "uint16 a"},
    {"int32 a",                       "int32 a"},
    {"uint32 a",                      "uint32 a"},
    {"int64 a",                       "int64 a"},
    {"uint64 a",                      "uint64 a"},
    {"float32 a",                     "single a"},
    {"float64 a",                     "double a"},
    {"time a",                        "time a"},
    {"duration a",                    "duration a"},
    {"string a",                      "string a"},
    {"string[] a",                    "dynmat_string_1d_t a holds string"},
    {"string[3] a",                   "string*3 a"},
    {"\t float64 \t x_1# unit: m",    "double x_1"},
    {"float64[9] m # row major",      "double*9 m"},
    {"float64[1] m",                  "double m"},
    {"uint8[] data",                  "dynmat_uint8_1d_t data holds uint8"},
    {"Point p",                       "pkg_Point p of pkg/Point"},
    {"Point[2] p",                    "pkg_Point*2 p of pkg/Point"},
    {"other_msgs/Point[] p",          "dynmat_other_msgs_Point_1d_t p of other_msgs/Point holds other_msgs_Point"},
    {"Header header",                 "std_msgs_Header header of std_msgs/Header"},
    {"uint8 NAME=4",                  ""},
    {"uint8 NAME = 4 # four",         ""},
    {"string NAME=# no comment",      ""},
    {"int32 a\r",                     "int32 a"},
};
// clang-format on

TEST(MsgParser, Lines) {
    for (const LineCase& row : lines) {
        SCOPED_TRACE(row.line);
        const std::vector<MessageField> fields = parseMessage("m.msg", "pkg", row.line);
        std::string text;
        for (const MessageField& field : fields)
            text += fieldText(field);
        EXPECT_EQ(text, row.field);
    }
}

TEST(MsgParser, FieldsKeepTheirOrderAndPlaces) {
    const auto fields = parseMessage("m.msg", "pkg", "# title\nint8 b\n\n  Point a\nuint8 X=1\ntime c");
    ASSERT_EQ(fields.size(), 3u);
    EXPECT_EQ(fieldText(fields[0]), "int8 b");
    EXPECT_EQ(fieldText(fields[1]), "pkg_Point a of pkg/Point");
    EXPECT_EQ(toText(fields[1].element.type.place), "m.msg:4:3");
    EXPECT_EQ(fieldText(fields[2]), "time c");
}

struct BadLine {
    const char* text;
    const char* complaint;
};

// clang-format off
constexpr BadLine badLines[] = {
    {"int8",                "m.msg:1:5: expected the name of a field"},
    {"int8 \n",             "m.msg:1:6: expected the name of a field"},
    {"\n\n int8 7",         "m.msg:3:7: expected the name of a field"},
    {"7 a",                 "m.msg:1:1: expected a type"},
    {"int8 a b",            "m.msg:1:8: expected the end of the line"},
    {"int8 a, b",           "m.msg:1:7: expected the end of the line"},
    {"int8 a[3]",           "m.msg:1:7: expected the end of the line"},
    {"pkg/ a",              "m.msg:1:5: expected the name of a message"},
    {"int8[0] a",           "m.msg:1:6: expected ']' or a number of elements from 1 to 2147483647"},
    {"int8[-1] a",          "m.msg:1:6: expected ']' or a number of elements from 1 to 2147483647"},
    {"int8[<=3] a",         "m.msg:1:6: expected ']' or a number of elements from 1 to 2147483647"},
    {"int8[2147483648] a",  "m.msg:1:6: expected ']' or a number of elements from 1 to 2147483647"},
    {"int8[99999999999999999999] a", "m.msg:1:6: expected ']' or a number of elements from 1 to 2147483647"},
    {"int8[3 a",            "m.msg:1:7: expected ']'"},
    {"int8 [3] a",          "m.msg:1:6: expected the name of a field"},
    {"int8 a\nint16 a",     "m.msg:2:1: 'a' names an earlier field already"},
};
// clang-format on

TEST(MsgParser, IllFormedLines) {
    for (const BadLine& row : badLines) {
        SCOPED_TRACE(row.text);
        try {
            parseMessage("m.msg", "pkg", row.text);
            ADD_FAILURE() << "accepted";
        } catch (const InputError& e) {
            EXPECT_STREQ(e.what(), row.complaint);
        }
    }
}

// A folder of packages that goes away with the test.
class MsgReaderTest : public testing::Test {
  protected:
    void SetUp() override {
        std::string pattern = (fs::temp_directory_path() / "qltypes_msg_XXXXXX").string();
        ASSERT_NE(mkdtemp(pattern.data()), nullptr);
        root_ = pattern;
    }
    void TearDown() override { fs::remove_all(root_); }

    fs::path write(const std::string& file, const std::string& text) {
        const fs::path path = root_ / file;
        fs::create_directories(path.parent_path());
        std::ofstream(path) << text;
        return path;
    }

    std::string complaintOf(MsgReader& reader) {
        try {
            reader.read();
        } catch (const InputError& e) {
            std::string text = e.what();
            for (std::size_t at; (at = text.find(root_.string())) != std::string::npos;)
                text.replace(at, root_.string().size(), "ROOT");
            return text;
        }
        return "";
    }

    fs::path root_;
};

std::vector<std::string> labelsOf(const Description& description) {
    std::vector<std::string> labels;
    for (const TypeDescription& type : description.types)
        labels.push_back(type.label);
    return labels;
}

TEST_F(MsgReaderTest, FolderIsReadInTheOrderOfNames) {
    write("a_msgs/msg/Z.msg", "int8 x");
    write("a_msgs/msg/B.msg", "Z z");
    write("a_msgs/msg/README.txt", "no definition");
    MsgReader reader;
    reader.addFolder(root_ / "a_msgs/msg");
    const Description description = reader.read();
    EXPECT_THAT(labelsOf(description), testing::ElementsAre("a_msgs/B", "a_msgs/Z"));
    EXPECT_EQ(description.types[0].name, "a_msgs_B");
    EXPECT_EQ(description.numMessages, 2u);
}

TEST_F(MsgReaderTest, WhatIsReferredToIsReadFromOtherPackages) {
    const fs::path file = write("a_msgs/msg/A.msg", "b_msgs/B b\ntime t\nduration d");
    write("b_msgs/msg/B.msg", "C c");
    write("b_msgs/msg/C.msg", "uint64 x");
    MsgReader reader;
    reader.addFile(file);
    const Description description = reader.read();
    EXPECT_THAT(labelsOf(description), testing::ElementsAre("a_msgs/A", "b_msgs/B", "b_msgs/C", "time", "duration"));
    const auto& time = std::get<StructureDescription>(description.types[3].kind).elements;
    const auto& duration = std::get<StructureDescription>(description.types[4].kind).elements;
    ASSERT_EQ(time.size(), 2u);
    ASSERT_EQ(duration.size(), 2u);
    EXPECT_EQ(time[0].name + " " + time[0].type.name, "sec uint32");
    EXPECT_EQ(time[1].name + " " + time[1].type.name, "nsec uint32");
    EXPECT_EQ(duration[0].name + " " + duration[0].type.name, "sec int32");
    EXPECT_EQ(duration[1].name + " " + duration[1].type.name, "nsec int32");
}

TEST_F(MsgReaderTest, PackagesOfDifferentFoldersFindEachOther) {
    const fs::path file = write("here/a_msgs/msg/A.msg", "b_msgs/B b");
    write("there/b_msgs/msg/B.msg", "int8 x");
    MsgReader reader;
    reader.addFile(file);
    reader.addFolder(root_ / "there/b_msgs/msg");
    EXPECT_THAT(labelsOf(reader.read()), testing::ElementsAre("a_msgs/A", "b_msgs/B"));
}

TEST_F(MsgReaderTest, LooseFileBelongsToThePackageOfItsFolder) {
    MsgReader reader;
    reader.addFile(write("loose/A.msg", "B b"));
    write("loose/B.msg", "int8 x");
    EXPECT_THAT(labelsOf(reader.read()), testing::ElementsAre("loose/A", "loose/B"));
}

TEST_F(MsgReaderTest, RefusalsSpreadToWhatContainsThem) {
    write("p/msg/A.msg", "int8 fine\nB b");
    write("p/msg/B.msg", "C[2] c");
    write("p/msg/C.msg", "D d");
    write("p/msg/D.msg", "# nothing");
    write("p/msg/E.msg", "D[] d");
    write("p/msg/F.msg", "int8 fine");
    MsgReader reader;
    reader.addFolder(root_ / "p/msg");
    const Description description = reader.read();
    EXPECT_THAT(labelsOf(description), testing::ElementsAre("p/F"));
    EXPECT_EQ(description.numMessages, 6u);
    std::vector<std::string> refusals;
    for (const Refusal& refusal : description.refusals) {
        refusals.push_back(refusal.label + ": " + refusal.reason + " at " +
                           fs::path(refusal.place.file).filename().string() + ":" + refusal.place.within);
    }
    EXPECT_THAT(refusals, testing::ElementsAre("p/A: field 'b' is p/B, which is refused at A.msg:2:1",
                                               "p/B: field 'c' is p/C, which is refused at B.msg:1:1",
                                               "p/C: field 'd' is p/D, which is refused at C.msg:1:1",
                                               "p/D: it has no fields at D.msg:",
                                               "p/E: field 'd' is p/D, which is refused at E.msg:1:1"));
}

TEST_F(MsgReaderTest, MessageThatIsNotFound) {
    MsgReader reader;
    reader.addFile(write("p/msg/A.msg", "int8 x\nnone_such_msgs/B b"));
    EXPECT_EQ(complaintOf(reader),
              "ROOT/p/msg/A.msg:2:1: unknown type 'none_such_msgs/B': no file B.msg in ROOT/none_such_msgs/msg");
}

TEST_F(MsgReaderTest, SameMessageTwice) {
    const fs::path file = write("here/p/msg/A.msg", "int8 x");
    MsgReader reader;
    reader.addFile(file);
    reader.addFile(root_ / "here/p/../p/msg/A.msg"); // the same file is no other message
    EXPECT_THROW(reader.addFile(write("there/p/msg/A.msg", "int8 x")), InputError);
    EXPECT_EQ(reader.read().numMessages, 1u);
}

TEST_F(MsgReaderTest, FoldersWithoutDefinitions) {
    write("p/readme.txt", "");
    MsgReader reader;
    EXPECT_THROW(reader.addFolder(root_ / "p"), InputError);
    EXPECT_THROW(reader.addFolder(root_ / "absent"), InputError);
    EXPECT_THROW(reader.addFile(write("two words/A.msg", "int8 x")), InputError);
}

} // namespace
