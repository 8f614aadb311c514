// Tests of file lists: the list-file format, the second-choice path, the
// standard-error texts, directory expansion and the dump.
#include "oxbase/io/OxFileList.h"
#include "oxbase/core/OxString.h"
#include "support/OxTestSupport.h"

#include <algorithm>
#include <filesystem>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace {

std::vector<std::string> names(const OxFileList& list) {
    std::vector<std::string> out;
    const OxGList<char*>& files = list.getFileNameList();
    for (unsigned int i = 0; i < files.getLength(); i++) {
        out.push_back(files[i]);
    }
    return out;
}

int keepFiles(const char* path, const OxStat*, OxFileTreeWalkType type, void* list) {
    if (type == OxFTWFile) {
        static_cast<OxGList<char*>*>(list)->append(OxString::dup(path));
    }
    return 0;
}

/// What readListFiles wrote to standard error; its answer must be `expected`.
std::string readErrors(OxFileList& list, OxBool expected) {
    testing::internal::CaptureStderr();
    EXPECT_EQ(list.readListFiles(), expected);
    return testing::internal::GetCapturedStderr();
}

using oxtest::dumpText;

} // namespace

TEST(OxFileListTest, ListFileFormat) {
    oxtest::TempDir tmp;
    std::string first = tmp.file("first.lst");
    oxtest::writeFile(first, "# comment\n"
                             "\n"
                             "   \t \n"
                             "a.txt # note\n"
                             "\"b#c.txt\"\n"
                             "   # note\n"
                             "  x \"odd # kept\n"
                             "name with blanks.txt\t\n"
                             "last-no-newline");
    OxFileList list(first.c_str());
    EXPECT_EQ(readErrors(list, OxTrue), "");
    EXPECT_EQ(names(list), (std::vector<std::string>{"a.txt", "\"b#c.txt\"", "x \"odd # kept",
                                                     "name with blanks.txt", "last-no-newline"}));

    // Nothing marks a list file as read: a second call adds the names again.
    EXPECT_EQ(list.readListFiles(), OxTrue);
    EXPECT_EQ(list.getFileNameList().getLength(), 10u);
}

TEST(OxFileListTest, LineLengthLimit) {
    oxtest::TempDir tmp;
    std::string longest(519, 'k');
    std::string tooLong(520, 'z');
    std::string cut = tmp.file("cut.lst");
    std::string next = tmp.file("next.lst");
    oxtest::writeFile(cut, "before\n" + longest + "\n" + tooLong + "\nafter\n");
    oxtest::writeFile(next, "from-next\n");
    OxFileList list(cut.c_str());
    list.addListFile(next.c_str());
    list.addListFile("");
    list.addListFile(nullptr);
    EXPECT_EQ(list.getListFiles().getLength(), 2u);
    EXPECT_EQ(list.readListFiles(), OxTrue);
    EXPECT_EQ(names(list), (std::vector<std::string>{"before", longest, "from-next"}));
}

TEST(OxFileListTest, SecondChoicePathAndFailures) {
    oxtest::TempDir tmp;
    oxtest::writeFile(tmp.file("found.lst"), "one\n");

    OxFileList viaPath("found.lst"); // not in the working directory
    viaPath.setListFilePath(tmp.path().c_str());
    EXPECT_EQ(readErrors(viaPath, OxTrue), "");
    EXPECT_EQ(names(viaPath), std::vector<std::string>{"one"});

    OxFileList noPath("missing-oxbase.lst");
    EXPECT_EQ(readErrors(noPath, OxFalse),
              "Unable to open list file.\n  Tried missing-oxbase.lst\n");

    // Names read before a failing list file stay.
    OxFileList withPath(tmp.file("found.lst").c_str());
    withPath.addListFile("missing-oxbase.lst");
    withPath.setListFilePath(tmp.path().c_str());
    EXPECT_EQ(readErrors(withPath, OxFalse),
              "Unable to open list file.\n  Tried missing-oxbase.lst and " +
                  tmp.file("missing-oxbase.lst") + "\n");
    EXPECT_EQ(names(withPath), std::vector<std::string>{"one"});
    withPath.setListFilePath("");
    EXPECT_EQ(withPath.getListFilePath(), nullptr);

    // A list file that is a directory cannot be opened.
    OxFileList directory(tmp.path().c_str());
    EXPECT_EQ(readErrors(directory, OxFalse),
              "Unable to open list file.\n  Tried " + tmp.path() + "\n");

    OxFileList empty;
    EXPECT_EQ(empty.readListFiles(), OxTrue);
}

TEST(OxFileListTest, TextRules) {
    OxFileList list;
    char empty[] = "";
    EXPECT_EQ(list.stripComment(empty), empty);
    EXPECT_STREQ(empty, "");
    char quoted[] = "a\"#\"b#c";
    EXPECT_STREQ(list.stripComment(quoted), "a\"#\"b");
    EXPECT_EQ(list.isComment("  # x"), OxFalse);
    EXPECT_EQ(list.isComment("#x"), OxTrue);
    EXPECT_EQ(list.isEmpty("   "), OxTrue);
    EXPECT_EQ(list.isEmpty("name"), OxFalse);
    EXPECT_EQ(list.isEmpty(nullptr), OxTrue);
    EXPECT_EQ(list.isEmpty(""), OxFalse);
}

TEST(OxFileListTest, AddFilesAndDirectories) {
    oxtest::TempDir tmp;
    std::filesystem::create_directories(tmp.file("dir/sub"));
    oxtest::writeFile(tmp.file("dir/a.txt"), "a");
    oxtest::writeFile(tmp.file("dir/sub/b.txt"), "b");
    oxtest::writeFile(tmp.file("dir/sub/\xe9 c.txt"), "c");

    OxFileList list;
    list.add(nullptr);
    list.add("  not-there.txt \t");
    list.add("   ");
    list.add(tmp.file("dir").c_str()); // no callback yet: nothing added
    EXPECT_EQ(names(list), (std::vector<std::string>{"not-there.txt", ""}));

    list.setFTWCallback(keepFiles);
    list.add(tmp.file("dir").c_str());
    std::vector<std::string> got = names(list);
    std::sort(got.begin() + 2, got.end());
    EXPECT_EQ(
        got, (std::vector<std::string>{"not-there.txt", "", tmp.file("dir/a.txt"),
                                       tmp.file("dir/sub/b.txt"), tmp.file("dir/sub/\xe9 c.txt")}));

    // A relative directory named in a list file.
    std::filesystem::path saved = std::filesystem::current_path();
    std::filesystem::current_path(tmp.path());
    oxtest::writeFile("rel.lst", "dir/sub\n");
    OxFileList relative("rel.lst");
    relative.setFTWCallback(keepFiles);
    EXPECT_EQ(relative.readListFiles(), OxTrue);
    EXPECT_EQ(relative.getFileNameList().getLength(), 2u);
    std::filesystem::current_path(saved);
}

TEST(OxFileListTest, Dump) {
    OxFileList list;
    EXPECT_EQ(dumpText(list), "---- OxFileList\n"
                              "Files containing the lists of files to be processed:\n"
                              "File names in this file list:\n"
                              "---- End of OxFileList\n");
    list.addListFile("parts.lst");
    list.add("wheel.xml");
    EXPECT_EQ(dumpText(list), "---- OxFileList\n"
                              "Files containing the lists of files to be processed:\n"
                              "parts.lst\n"
                              "File names in this file list:\n"
                              "wheel.xml\n"
                              "---- End of OxFileList\n");
}
