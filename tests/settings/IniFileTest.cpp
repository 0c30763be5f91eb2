#include "settings/IniFile.h"

#include "tests/support/TempFolder.h"

#include <gtest/gtest.h>

#include <memory>
#include <random>
#include <string>
#include <utility>
#include <vector>

#ifndef _WIN32
#include <sys/stat.h>
#include <unistd.h>
#endif

using namespace testsupport; // TempFolder and the whole-file helpers

namespace {

using Section = std::pair<std::string, std::vector<std::pair<std::string, std::string>>>;

// The store as a list, sections without values left out (they are never written).
std::vector<Section> Contents(const CIniFile& ini) {
    std::vector<Section> sections;
    for (int k = 0; k < ini.GetNumKeys(); ++k) {
        const CIniFile::key& section = ini.keys[k];
        if (section.names.GetSize() == 0)
            continue;
        Section s{ini.names[k], {}};
        for (int j = 0; j < section.names.GetSize(); ++j)
            s.second.emplace_back(section.names[j], section.values[j]);
        sections.push_back(s);
    }
    return sections;
}

// Reads the given bytes through a file.
class IniFileTest : public ::testing::Test {
protected:
    CIniFile& Read(const std::string& bytes, bool* result = nullptr) {
        std::string fileName = m_dir.File("in.ini");
        WriteBytes(fileName, bytes);
        m_read = std::make_unique<CIniFile>(fileName);
        bool ok = m_read->ReadFile();
        if (result)
            *result = ok;
        return *m_read;
    }

    TempFolder m_dir;
    std::unique_ptr<CIniFile> m_read;
};

} // namespace

// --- construction and paths ---

TEST_F(IniFileTest, DefaultConstructorLeavesPathAndStoreEmpty) {
    CIniFile ini;
    EXPECT_EQ(ini.path, "");
    EXPECT_EQ(ini.GetNumKeys(), 0);
    EXPECT_EQ(ini.names.GetSize(), 0);
    EXPECT_EQ(ini.error, "");
}

TEST_F(IniFileTest, ConstructorSetsPath) {
    CIniFile ini("C:\\Tools\\Orvex1.ini");
    EXPECT_EQ(ini.path, "C:\\Tools\\Orvex1.ini");
    EXPECT_EQ(ini.GetNumKeys(), 0);
}

TEST_F(IniFileTest, SetPathKeepsContents) {
    CIniFile ini("a.ini");
    ini.SetValue("S", "n", "v");
    ini.SetPath("b.ini");
    EXPECT_EQ(ini.path, "b.ini");
    EXPECT_EQ(ini.GetValue("S", "n"), "v");
}

// --- ReadFile: existence and opening ---

TEST_F(IniFileTest, ReadMissingFileFailsAndLeavesErrorUnchanged) {
    CIniFile ini(m_dir.File("missing.ini"));
    ini.error = "earlier";
    EXPECT_FALSE(ini.ReadFile());
    EXPECT_EQ(ini.error, "earlier");
    EXPECT_EQ(ini.GetNumKeys(), 0);
}

TEST_F(IniFileTest, ReadMissingFileKeepsStore) {
    CIniFile ini(m_dir.File("missing.ini"));
    ini.SetValue("S", "n", "v");
    EXPECT_FALSE(ini.ReadFile());
    EXPECT_EQ(ini.GetValue("S", "n"), "v");
}

TEST_F(IniFileTest, ReadDirectoryFailsWithOpenError) {
    CIniFile ini(m_dir.Dir());
    EXPECT_FALSE(ini.ReadFile());
    EXPECT_EQ(ini.error, "Unable to open ini file.");
    EXPECT_EQ(ini.GetNumKeys(), 0);
}

#ifndef _WIN32
TEST_F(IniFileTest, ReadUnreadableFileFailsWithOpenError) {
    if (::geteuid() == 0)
        GTEST_SKIP() << "running as root: file permissions do not stop reading";
    std::string fileName = m_dir.File("locked.ini");
    WriteBytes(fileName, "[S]\nn=v\n");
    ASSERT_EQ(::chmod(fileName.c_str(), 0), 0);
    CIniFile ini(fileName);
    EXPECT_FALSE(ini.ReadFile());
    EXPECT_EQ(ini.error, "Unable to open ini file.");
}
#endif

// --- ReadFile: lines ---

TEST_F(IniFileTest, EmptyFileReadsAsEmptyStore) {
    bool ok = false;
    CIniFile& ini = Read("", &ok);
    EXPECT_TRUE(ok);
    EXPECT_EQ(ini.GetNumKeys(), 0);
}

TEST_F(IniFileTest, OnlyEmptyLinesReadAsEmptyStore) {
    bool ok = false;
    CIniFile& ini = Read("\r\n\r\n\n\r\n", &ok);
    EXPECT_TRUE(ok);
    EXPECT_EQ(ini.GetNumKeys(), 0);
}

TEST_F(IniFileTest, SuccessfulReadLeavesErrorUnchanged) {
    std::string fileName = m_dir.File("in.ini");
    WriteBytes(fileName, "[S]\r\nn=v\r\n");
    CIniFile ini(fileName);
    ini.error = "earlier";
    EXPECT_TRUE(ini.ReadFile());
    EXPECT_EQ(ini.error, "earlier");
}

TEST_F(IniFileTest, ValueLineSplitsAtFirstEquals) {
    CIniFile& ini = Read("[S]\r\na=b=c\r\nb=\r\n=x\r\n");
    EXPECT_EQ(ini.GetNumValues("S"), 3);
    EXPECT_EQ(ini.GetValue("S", "a"), "b=c");
    EXPECT_EQ(ini.GetValue("S", "b"), "");
    EXPECT_EQ(ini.FindValue(0, "b"), 1);
    EXPECT_EQ(ini.GetValue("S", ""), "x");
}

TEST_F(IniFileTest, LineWithoutEqualsDropsFirstCharacterUnderEmptyName) {
    CIniFile& ini = Read("[S]\r\nabc\r\n");
    ASSERT_EQ(ini.GetNumValues("S"), 1);
    EXPECT_EQ(ini.keys[0].names[0], "");
    EXPECT_EQ(ini.GetValue("S", ""), "bc");
}

TEST_F(IniFileTest, SingleCharacterLineWithoutEqualsGivesEmptyValue) {
    CIniFile& ini = Read("[S]\r\nx\r\n");
    ASSERT_EQ(ini.GetNumValues("S"), 1);
    EXPECT_EQ(ini.GetValue("S", ""), "");
}

TEST_F(IniFileTest, HeadingRules) {
    CIniFile& ini = Read("[[A]]\r\na=1\r\n[]\r\nb=2\r\n[a]b]\r\nc=3\r\n[[]]]\r\nd=4\r\n");
    ASSERT_EQ(ini.GetNumKeys(), 3);
    EXPECT_EQ(ini.names[0], "A");
    EXPECT_EQ(ini.names[1], "");
    EXPECT_EQ(ini.names[2], "a]b");
    EXPECT_EQ(ini.GetValue("A", "a"), "1");
    EXPECT_EQ(ini.GetValue("", "b"), "2");
    EXPECT_EQ(ini.GetValue("", "d"), "4"); // [[]]] is the empty section again
    EXPECT_EQ(ini.GetValue("a]b", "c"), "3");
}

TEST_F(IniFileTest, HeadingsInsideAreKept) {
    CIniFile& ini = Read("[x[]\r\na=1\r\n[]x]\r\nb=2\r\n");
    EXPECT_EQ(ini.GetValue("x[", "a"), "1");
    EXPECT_EQ(ini.GetValue("]x", "b"), "2");
}

TEST_F(IniFileTest, BlankBeforeOrAfterHeadingMakesAValueLine) {
    CIniFile& ini = Read(" [A]\r\n[B] \r\n [C]=1\r\n");
    EXPECT_EQ(ini.FindKey("A"), -1);
    EXPECT_EQ(ini.FindKey("B"), -1);
    EXPECT_EQ(ini.FindKey("C"), -1);
    ASSERT_EQ(ini.GetNumKeys(), 1);
    EXPECT_EQ(ini.names[0], "");
    // " [A]" and "[B] " have no "=": empty name, first character dropped; the second replaces the first.
    EXPECT_EQ(ini.GetValue("", ""), "B] ");
    EXPECT_EQ(ini.GetValue("", " [C]"), "1");
    EXPECT_EQ(ini.GetNumValues(""), 2);
}

TEST_F(IniFileTest, NoCommentSyntax) {
    CIniFile& ini = Read("[S]\r\n;x=1\r\n#y=2\r\n");
    EXPECT_EQ(ini.GetValue("S", ";x"), "1");
    EXPECT_EQ(ini.GetValue("S", "#y"), "2");
}

TEST_F(IniFileTest, BlanksAreKept) {
    CIniFile& ini = Read("[CurrentPath]\r\nPath = C:\\x\r\n");
    EXPECT_EQ(ini.GetValue("CurrentPath", "Path "), " C:\\x");
    ini.error = "";
    EXPECT_EQ(ini.GetValue("CurrentPath", "Path"), "");
    EXPECT_EQ(ini.error, "Unable to locate specified value.");
}

TEST_F(IniFileTest, NamesAreCaseSensitive) {
    CIniFile& ini = Read("[S]\r\nPath=1\r\npath=2\r\n[s]\r\nPath=3\r\n");
    EXPECT_EQ(ini.GetNumKeys(), 2);
    EXPECT_EQ(ini.GetValue("S", "Path"), "1");
    EXPECT_EQ(ini.GetValue("S", "path"), "2");
    EXPECT_EQ(ini.GetValue("s", "Path"), "3");
    EXPECT_EQ(ini.FindKey("S"), 0);
    EXPECT_EQ(ini.FindKey("s"), 1);
    EXPECT_EQ(ini.FindValue(0, "PATH"), -1);
}

TEST_F(IniFileTest, ValuesBeforeFirstHeadingBelongToEmptySection) {
    CIniFile& ini = Read("a=1\r\n[S]\r\nb=2\r\n");
    ASSERT_EQ(ini.GetNumKeys(), 2);
    EXPECT_EQ(ini.names[0], "");
    EXPECT_EQ(ini.GetValue("", "a"), "1");
    EXPECT_EQ(ini.GetValue("S", "b"), "2");
}

TEST_F(IniFileTest, RepeatedHeadingContinuesSection) {
    CIniFile& ini = Read("[A]\r\na=1\r\n[B]\r\nb=2\r\n[A]\r\nc=3\r\n");
    ASSERT_EQ(ini.GetNumKeys(), 2);
    EXPECT_EQ(ini.names[0], "A");
    EXPECT_EQ(ini.names[1], "B");
    EXPECT_EQ(ini.GetNumValues("A"), 2);
    EXPECT_EQ(ini.FindValue(0, "c"), 1);
}

TEST_F(IniFileTest, RepeatedValueKeepsFirstPositionAndLastValue) {
    CIniFile& ini = Read("[S]\r\na=1\r\nb=2\r\na=3\r\n");
    ASSERT_EQ(ini.GetNumValues("S"), 2);
    EXPECT_EQ(ini.FindValue(0, "a"), 0);
    EXPECT_EQ(ini.GetValue("S", "a"), "3");
}

TEST_F(IniFileTest, HeadingWithoutValuesCreatesNoSection) {
    CIniFile& ini = Read("[Empty]\r\n[S]\r\nn=v\r\n[Trailing]\r\n");
    EXPECT_EQ(ini.GetNumKeys(), 1);
    EXPECT_EQ(ini.FindKey("Empty"), -1);
    EXPECT_EQ(ini.FindKey("Trailing"), -1);
}

TEST_F(IniFileTest, LastLineWithoutLineEndIsRead) {
    CIniFile& ini = Read("[S]\r\na=1\r\nb=2");
    EXPECT_EQ(ini.GetValue("S", "b"), "2");
}

TEST_F(IniFileTest, LineFeedAloneAlsoEndsALine) {
    CIniFile& ini = Read("[S]\na=1\nb=2\n");
    EXPECT_EQ(ini.GetValue("S", "a"), "1");
    EXPECT_EQ(ini.GetValue("S", "b"), "2");
}

TEST_F(IniFileTest, CarriageReturnNotBeforeLineFeedIsAnOrdinaryCharacter) {
    CIniFile& ini = Read("[S]\r\na=1\rb=2\r\nc=3\r\r\nd=4\r");
    EXPECT_EQ(ini.GetValue("S", "a"), "1\rb=2");
    EXPECT_EQ(ini.GetValue("S", "c"), "3\r");
    EXPECT_EQ(ini.GetValue("S", "d"), "4\r");
    EXPECT_EQ(ini.GetNumValues("S"), 3);
}

TEST_F(IniFileTest, LineOf2047CharactersIsRead) {
    std::string value(2045, 'v'); // "a=" + 2045 = 2047 characters
    CIniFile& ini = Read("[S]\r\na=" + value + "\r\nb=2\r\n");
    EXPECT_EQ(ini.GetValue("S", "a"), value);
    EXPECT_EQ(ini.GetValue("S", "b"), "2");
}

TEST_F(IniFileTest, LineOf2047CharactersAtEndOfFileIsRead) {
    std::string value(2045, 'v');
    CIniFile& ini = Read("[S]\r\na=" + value);
    EXPECT_EQ(ini.GetValue("S", "a"), value);
}

TEST_F(IniFileTest, LongerLineStopsReadingButSucceeds) {
    bool ok = false;
    std::string value(2046, 'v'); // 2048 characters
    CIniFile& ini = Read("[S]\r\nfirst=1\r\na=" + value + "\r\nlast=2\r\n[T]\r\nt=3\r\n", &ok);
    EXPECT_TRUE(ok);
    EXPECT_EQ(ini.GetValue("S", "first"), "1");
    EXPECT_EQ(ini.GetNumValues("S"), 1);
    EXPECT_EQ(ini.FindValue(0, "a"), -1);
    EXPECT_EQ(ini.FindValue(0, "last"), -1);
    EXPECT_EQ(ini.FindKey("T"), -1);
}

TEST_F(IniFileTest, LongLineWithoutLineEndAtEndOfFileIsIgnored) {
    bool ok = false;
    CIniFile& ini = Read("[S]\r\nfirst=1\r\n" + std::string(3000, 'x'), &ok);
    EXPECT_TRUE(ok);
    EXPECT_EQ(ini.GetNumValues("S"), 1);
}

TEST_F(IniFileTest, ReadMergesIntoExistingStore) {
    std::string fileName = m_dir.File("in.ini");
    WriteBytes(fileName, "[B]\r\nnew=1\r\nold=file\r\n[C]\r\nc=2\r\n");
    CIniFile ini(fileName);
    ini.SetValue("A", "a", "kept");
    ini.SetValue("B", "old", "store");
    ASSERT_TRUE(ini.ReadFile());
    ASSERT_EQ(ini.GetNumKeys(), 3);
    EXPECT_EQ(ini.names[0], "A");
    EXPECT_EQ(ini.names[1], "B");
    EXPECT_EQ(ini.names[2], "C");
    EXPECT_EQ(ini.GetValue("A", "a"), "kept");
    EXPECT_EQ(ini.FindValue(1, "old"), 0);
    EXPECT_EQ(ini.FindValue(1, "new"), 1);
    EXPECT_EQ(ini.GetValue("B", "old"), "file");
    EXPECT_EQ(ini.GetValue("C", "c"), "2");
}

TEST_F(IniFileTest, ReadingTwiceMergesSameContents) {
    std::string fileName = m_dir.File("in.ini");
    WriteBytes(fileName, "[S]\r\na=1\r\nb=2\r\n");
    CIniFile ini(fileName);
    ASSERT_TRUE(ini.ReadFile());
    ASSERT_TRUE(ini.ReadFile());
    EXPECT_EQ(ini.GetNumKeys(), 1);
    EXPECT_EQ(ini.GetNumValues("S"), 2);
}

// --- look-ups ---

TEST_F(IniFileTest, CountsAndPositions) {
    CIniFile ini;
    ini.SetValue("A", "x", "1");
    ini.SetValue("B", "y", "2");
    ini.SetValue("B", "z", "3");
    EXPECT_EQ(ini.GetNumKeys(), 2);
    EXPECT_EQ(ini.GetNumValues("A"), 1);
    EXPECT_EQ(ini.GetNumValues("B"), 2);
    EXPECT_EQ(ini.GetNumValues("C"), -1);
    EXPECT_EQ(ini.FindKey("A"), 0);
    EXPECT_EQ(ini.FindKey("B"), 1);
    EXPECT_EQ(ini.FindKey("C"), -1);
    EXPECT_EQ(ini.FindKey("a"), -1);
    EXPECT_EQ(ini.FindKey(" A"), -1);
    EXPECT_EQ(ini.FindValue(1, "z"), 1);
    EXPECT_EQ(ini.FindValue(1, "x"), -1);
    EXPECT_EQ(ini.FindValue(-1, "x"), -1);
}

TEST_F(IniFileTest, GetValueMissingKeySetsError) {
    CIniFile ini;
    ini.SetValue("S", "n", "v");
    EXPECT_EQ(ini.GetValue("T", "n"), "");
    EXPECT_EQ(ini.error, "Unable to locate specified key.");
}

TEST_F(IniFileTest, GetValueMissingValueSetsError) {
    CIniFile ini;
    ini.SetValue("S", "n", "v");
    EXPECT_EQ(ini.GetValue("S", "m"), "");
    EXPECT_EQ(ini.error, "Unable to locate specified value.");
}

TEST_F(IniFileTest, GetValueSuccessLeavesErrorAsItWas) {
    CIniFile ini;
    ini.SetValue("S", "n", "v");
    ini.GetValue("T", "n");
    EXPECT_EQ(ini.GetValue("S", "n"), "v");
    EXPECT_EQ(ini.error, "Unable to locate specified key.");
}

TEST_F(IniFileTest, GetValueIConvertsLeniently) {
    CIniFile ini;
    ini.SetValue("S", "plain", "42");
    ini.SetValue("S", "blanks", "  -17px");
    ini.SetValue("S", "plus", "+8");
    ini.SetValue("S", "text", "abc");
    ini.SetValue("S", "empty", "");
    EXPECT_EQ(ini.GetValueI("S", "plain"), 42);
    EXPECT_EQ(ini.GetValueI("S", "blanks"), -17);
    EXPECT_EQ(ini.GetValueI("S", "plus"), 8);
    EXPECT_EQ(ini.GetValueI("S", "text"), 0);
    EXPECT_EQ(ini.GetValueI("S", "empty"), 0);
    EXPECT_EQ(ini.error, "");
    EXPECT_EQ(ini.GetValueI("S", "missing"), 0);
    EXPECT_EQ(ini.error, "Unable to locate specified value.");
    EXPECT_EQ(ini.GetValueI("T", "plain"), 0);
    EXPECT_EQ(ini.error, "Unable to locate specified key.");
}

TEST_F(IniFileTest, GetValueFConvertsLeniently) {
    CIniFile ini;
    ini.SetValue("S", "f", "1.5");
    ini.SetValue("S", "e", "2.5e+01x");
    ini.SetValue("S", "text", "abc");
    EXPECT_DOUBLE_EQ(ini.GetValueF("S", "f"), 1.5);
    EXPECT_DOUBLE_EQ(ini.GetValueF("S", "e"), 25.0);
    EXPECT_DOUBLE_EQ(ini.GetValueF("S", "text"), 0.0);
    EXPECT_DOUBLE_EQ(ini.GetValueF("S", "missing"), 0.0);
    EXPECT_EQ(ini.error, "Unable to locate specified value.");
    EXPECT_DOUBLE_EQ(ini.GetValueF("T", "f"), 0.0);
    EXPECT_EQ(ini.error, "Unable to locate specified key.");
}

// --- changes ---

TEST_F(IniFileTest, SetValueCreatesInOrder) {
    CIniFile ini;
    EXPECT_TRUE(ini.SetValue("B", "y", "1", true));
    EXPECT_TRUE(ini.SetValue("A", "x", "2", true));
    EXPECT_TRUE(ini.SetValue("B", "a", "3", true));
    ASSERT_EQ(ini.GetNumKeys(), 2);
    EXPECT_EQ(ini.names[0], "B");
    EXPECT_EQ(ini.names[1], "A");
    EXPECT_EQ(ini.keys[0].names[0], "y");
    EXPECT_EQ(ini.keys[0].names[1], "a");
    EXPECT_EQ(ini.keys[0].values[1], "3");
}

TEST_F(IniFileTest, ValuesStayOneLongerThanNames) {
    CIniFile ini;
    ini.SetValue("S", "a", "1");
    EXPECT_EQ(ini.keys[0].names.GetSize(), 1);
    EXPECT_EQ(ini.keys[0].values.GetSize(), 2);
    EXPECT_EQ(ini.keys[0].values[1], "");
    ini.SetValue("S", "b", "2");
    ini.SetValue("S", "a", "3"); // replacing does not grow
    EXPECT_EQ(ini.keys[0].names.GetSize(), 2);
    EXPECT_EQ(ini.keys[0].values.GetSize(), 3);
    EXPECT_EQ(ini.keys[0].values[2], "");
    ASSERT_TRUE(ini.DeleteValue("S", "a"));
    EXPECT_EQ(ini.keys[0].names.GetSize(), 1);
    EXPECT_EQ(ini.keys[0].values.GetSize(), 2);
    EXPECT_EQ(ini.keys[0].values[0], "2");
    EXPECT_EQ(ini.keys.GetSize(), ini.names.GetSize());
}

TEST_F(IniFileTest, SetValueReplaces) {
    CIniFile ini;
    ini.SetValue("S", "n", "old");
    EXPECT_TRUE(ini.SetValue("S", "n", "new", false));
    EXPECT_EQ(ini.GetValue("S", "n"), "new");
    EXPECT_EQ(ini.GetNumValues("S"), 1);
}

TEST_F(IniFileTest, SetValueWithoutCreateFailsOnMissingSection) {
    CIniFile ini;
    ini.error = "earlier";
    EXPECT_FALSE(ini.SetValue("S", "n", "v", false));
    EXPECT_EQ(ini.GetNumKeys(), 0);
    EXPECT_EQ(ini.names.GetSize(), 0);
    EXPECT_EQ(ini.error, "earlier");
}

TEST_F(IniFileTest, SetValueWithoutCreateFailsOnMissingValue) {
    CIniFile ini;
    ini.SetValue("S", "n", "v");
    ini.error = "earlier";
    EXPECT_FALSE(ini.SetValue("S", "m", "w", false));
    EXPECT_EQ(ini.GetNumValues("S"), 1);
    EXPECT_EQ(ini.keys[0].values.GetSize(), 2);
    EXPECT_EQ(ini.error, "earlier");
}

TEST_F(IniFileTest, SetValueIFormatsDecimal) {
    CIniFile ini;
    EXPECT_TRUE(ini.SetValueI("S", "a", 100));
    EXPECT_TRUE(ini.SetValueI("S", "b", -42));
    EXPECT_TRUE(ini.SetValueI("S", "c", 0));
    EXPECT_TRUE(ini.SetValueI("S", "d", -2147483647 - 1));
    EXPECT_EQ(ini.GetValue("S", "a"), "100");
    EXPECT_EQ(ini.GetValue("S", "b"), "-42");
    EXPECT_EQ(ini.GetValue("S", "c"), "0");
    EXPECT_EQ(ini.GetValue("S", "d"), "-2147483648");
    EXPECT_FALSE(ini.SetValueI("T", "a", 1, false));
}

TEST_F(IniFileTest, SetValueFFormatsExponent) {
    CIniFile ini;
    EXPECT_TRUE(ini.SetValueF("S", "a", 1.5));
    EXPECT_TRUE(ini.SetValueF("S", "b", -0.00025));
    EXPECT_TRUE(ini.SetValueF("S", "c", 0.0));
    EXPECT_TRUE(ini.SetValueF("S", "d", 1.7976931348623157e308));
    EXPECT_EQ(ini.GetValue("S", "a"), "1.500000e+00");
    EXPECT_EQ(ini.GetValue("S", "b"), "-2.500000e-04");
    EXPECT_EQ(ini.GetValue("S", "c"), "0.000000e+00");
    EXPECT_EQ(ini.GetValue("S", "d"), "1.797693e+308");
    EXPECT_DOUBLE_EQ(ini.GetValueF("S", "a"), 1.5);
    EXPECT_FALSE(ini.SetValueF("T", "a", 1.0, false));
}

TEST_F(IniFileTest, DeleteValue) {
    CIniFile ini;
    ini.SetValue("S", "a", "1");
    ini.SetValue("S", "b", "2");
    ini.SetValue("S", "c", "3");
    EXPECT_TRUE(ini.DeleteValue("S", "b"));
    EXPECT_EQ(ini.GetNumValues("S"), 2);
    EXPECT_EQ(ini.FindValue(0, "c"), 1);
    EXPECT_EQ(ini.GetValue("S", "c"), "3");
    EXPECT_FALSE(ini.DeleteValue("S", "b"));
    EXPECT_FALSE(ini.DeleteValue("T", "a"));
    EXPECT_EQ(ini.GetNumValues("S"), 2);
}

TEST_F(IniFileTest, DeletingLastValueLeavesEmptySectionThatIsNotWritten) {
    CIniFile ini(m_dir.File("out.ini"));
    ini.SetValue("S", "a", "1");
    ini.SetValue("T", "b", "2");
    ASSERT_TRUE(ini.DeleteValue("S", "a"));
    EXPECT_EQ(ini.GetNumKeys(), 2);
    EXPECT_EQ(ini.GetNumValues("S"), 0);
    ini.WriteFile();
    EXPECT_EQ(ReadBytes(ini.path), "[T]\r\nb=2\r\n\r\n");
}

TEST_F(IniFileTest, DeleteKey) {
    CIniFile ini;
    ini.SetValue("A", "a", "1");
    ini.SetValue("B", "b", "2");
    ini.SetValue("C", "c", "3");
    EXPECT_TRUE(ini.DeleteKey("B"));
    ASSERT_EQ(ini.GetNumKeys(), 2);
    EXPECT_EQ(ini.names.GetSize(), 2);
    EXPECT_EQ(ini.FindKey("C"), 1);
    EXPECT_EQ(ini.GetValue("C", "c"), "3");
    EXPECT_EQ(ini.GetValue("A", "a"), "1");
    EXPECT_FALSE(ini.DeleteKey("B"));
    EXPECT_EQ(ini.GetNumKeys(), 2);
}

TEST_F(IniFileTest, ResetEmptiesStoreAndKeepsPath) {
    CIniFile ini("x.ini");
    ini.SetValue("A", "a", "1");
    ini.SetValue("B", "b", "2");
    ini.Reset();
    EXPECT_EQ(ini.GetNumKeys(), 0);
    EXPECT_EQ(ini.names.GetSize(), 0);
    EXPECT_EQ(ini.FindKey("A"), -1);
    EXPECT_EQ(ini.path, "x.ini");
    EXPECT_TRUE(ini.SetValue("C", "c", "3"));
    EXPECT_EQ(ini.FindKey("C"), 0);
}

TEST_F(IniFileTest, PositionOutsideAnArrayThrows) {
    CIniFile ini;
    EXPECT_THROW(ini.keys[0], CInvalidArgException);
    EXPECT_THROW(ini.names[-1], CInvalidArgException);
    ini.SetValue("S", "a", "1");
    EXPECT_THROW(ini.FindValue(1, "a"), CInvalidArgException);
    EXPECT_THROW(ini.FindValue(-2, "a"), CInvalidArgException);
    EXPECT_THROW(ini.keys[0].names[1], CInvalidArgException);
    EXPECT_THROW(ini.keys[0].values[2], CInvalidArgException);
    EXPECT_EQ(ini.keys[0].values[1], ""); // the spare last value is inside the array
}

TEST_F(IniFileTest, CopyingASectionCopiesItsValues) {
    CIniFile ini;
    ini.SetValue("S", "a", "1");
    CIniFile::key copy = ini.keys[0];
    ini.SetValue("S", "a", "2");
    EXPECT_EQ(copy.names.GetSize(), 1);
    EXPECT_EQ(copy.values.GetSize(), 2);
    EXPECT_EQ(copy.values[0], "1");
}

// --- WriteFile ---

TEST_F(IniFileTest, DefaultParametersExampleByteForByte) {
    CIniFile ini(m_dir.File("datains.ini"));
    ini.SetValue("Default Parameters", "Layer", "0");
    ini.SetValue("Default Parameters", "Color", "7");
    ini.WriteFile();
    EXPECT_EQ(ReadBytes(ini.path), "[Default Parameters]\r\nLayer=0\r\nColor=7\r\n\r\n");
}

TEST_F(IniFileTest, EverySectionEndsWithAnEmptyLineInCrLf) {
    CIniFile ini(m_dir.File("out.ini"));
    ini.SetValue("A", "a", "1");
    ini.SetValue("B", "b", "x y=z");
    ini.SetValue("B", "", "e");
    ini.WriteFile();
    EXPECT_EQ(ReadBytes(ini.path), "[A]\r\na=1\r\n\r\n[B]\r\nb=x y=z\r\n=e\r\n\r\n");
}

TEST_F(IniFileTest, EmptyStoreWritesEmptyFile) {
    CIniFile ini(m_dir.File("out.ini"));
    ini.WriteFile();
    EXPECT_EQ(ReadBytes(ini.path), "");
}

TEST_F(IniFileTest, WriteTruncatesExistingFile) {
    std::string fileName = m_dir.File("out.ini");
    WriteBytes(fileName, std::string(5000, 'x'));
    CIniFile ini(fileName);
    ini.SetValue("S", "n", "v");
    ini.WriteFile();
    EXPECT_EQ(ReadBytes(fileName), "[S]\r\nn=v\r\n\r\n");
}

TEST_F(IniFileTest, WriteToUncreatableFileIsSilent) {
    CIniFile ini(m_dir.File("no-such-folder/out.ini"));
    ini.SetValue("S", "n", "v");
    ini.error = "earlier";
    EXPECT_FALSE(ini.WriteFile());
    EXPECT_EQ(ini.error, "earlier");
    EXPECT_FALSE(FileExists(ini.path));
}

TEST_F(IniFileTest, WriteOverDirectoryIsSilent) {
    CIniFile ini(m_dir.Dir());
    ini.SetValue("S", "n", "v");
    EXPECT_FALSE(ini.WriteFile());
    EXPECT_EQ(ini.error, "");
}

TEST_F(IniFileTest, EmptyNamedValueReadsBack) {
    CIniFile ini(m_dir.File("out.ini"));
    ini.SetValue("S", "", "x");
    ini.SetValue("S", "n", "");
    ini.WriteFile();
    CIniFile back(ini.path);
    ASSERT_TRUE(back.ReadFile());
    EXPECT_EQ(Contents(back), Contents(ini));
}

TEST_F(IniFileTest, LoneCarriageReturnsInValuesReadBack) {
    CIniFile ini(m_dir.File("out.ini"));
    ini.SetValue("S", "a", "x\ry");
    ini.SetValue("S", "b", "z\r");
    ini.WriteFile();
    CIniFile back(ini.path);
    ASSERT_TRUE(back.ReadFile());
    EXPECT_EQ(Contents(back), Contents(ini));
}

TEST_F(IniFileTest, ReadWriteKeepsFileAsItWas) {
    const std::string text = "[]\r\n=x\r\nfree=1\r\n\r\n[a]b]\r\nPath = C:\\x\r\n;c=d\r\n\r\n";
    std::string fileName = m_dir.File("in.ini");
    WriteBytes(fileName, text);
    CIniFile ini(fileName);
    ASSERT_TRUE(ini.ReadFile());
    ini.WriteFile();
    EXPECT_EQ(ReadBytes(fileName), text);
}

// --- round trip of random stores ---

namespace {

std::string RandomText(std::mt19937& rng, const std::string& alphabet, int maxLength) {
    int length = std::uniform_int_distribution<int>(0, maxLength)(rng);
    std::string text;
    for (int i = 0; i < length; ++i)
        text += alphabet[std::uniform_int_distribution<std::size_t>(0, alphabet.size() - 1)(rng)];
    return text;
}

// A section name that reads back as itself from its heading: it neither starts with "[" nor ends
// with "]".
std::string RandomSectionName(std::mt19937& rng) {
    std::string name = RandomText(rng, "ab XYZ09=[];.\\\t-", 12);
    if (!name.empty() && name.front() == '[')
        name.front() = 'k';
    if (!name.empty() && name.back() == ']')
        name.back() = 'k';
    return name;
}

// A value name: no "=", and no leading "[" (a line "[name=value]" would read as a heading).
std::string RandomValueName(std::mt19937& rng) {
    std::string name = RandomText(rng, "abc XYZ09[];.#\\\t", 12);
    if (!name.empty() && name.front() == '[')
        name.front() = 'n';
    return name;
}

std::string RandomValue(std::mt19937& rng) {
    if (std::uniform_int_distribution<int>(0, 30)(rng) == 0)
        return RandomText(rng, "xyz =", 2000); // a long line, still inside the line buffer
    return RandomText(rng, "abc XYZ09=[];.#\\\t,\"'", 24);
}

} // namespace

TEST_F(IniFileTest, RandomStoresRoundTrip) {
    const unsigned seeds[] = {1, 2, 3, 5, 8, 13, 21, 34, 55, 89, 144, 233, 377, 610, 987, 1597, 2024, 65535};
    for (unsigned variant : seeds) {
        SCOPED_TRACE("variant " + std::to_string(variant));
        std::mt19937 rng(variant);
        CIniFile ini(m_dir.File("random-" + std::to_string(variant) + ".ini"));
        std::vector<std::string> sectionPool;
        std::vector<std::string> namePool;
        int operations = std::uniform_int_distribution<int>(0, 60)(rng);
        for (int i = 0; i < operations; ++i) {
            // Reuse earlier names now and then so that values get replaced and sections continued.
            bool reuseSection = !sectionPool.empty() && std::uniform_int_distribution<int>(0, 2)(rng) != 0;
            std::string section =
                reuseSection
                    ? sectionPool[std::uniform_int_distribution<std::size_t>(0, sectionPool.size() - 1)(rng)]
                    : RandomSectionName(rng);
            bool reuseName = !namePool.empty() && std::uniform_int_distribution<int>(0, 3)(rng) == 0;
            std::string name =
                reuseName ? namePool[std::uniform_int_distribution<std::size_t>(0, namePool.size() - 1)(rng)]
                          : RandomValueName(rng);
            sectionPool.push_back(section);
            namePool.push_back(name);
            ASSERT_TRUE(ini.SetValue(section, name, RandomValue(rng), true));
        }
        ini.WriteFile();

        CIniFile back(ini.path);
        ASSERT_TRUE(back.ReadFile());
        EXPECT_EQ(Contents(back), Contents(ini));
        EXPECT_EQ(back.GetNumKeys(), ini.GetNumKeys());
    }
}
