#include "oxbase/io/OxFile.h"
#include "OxIoTestSupport.h"

#include <gtest/gtest.h>

#include <cctype>
#include <filesystem>
#include <string>

#ifdef _WIN32
#include <direct.h>
#endif

using oxiotest::IoTest;
using oxiotest::Numbers;
using oxiotest::take;

namespace {

const char* const N = "<null>";

struct PathRow {
    const char* path;
    const char* baseName;
    const char* fileName;
    const char* relative;
    const char* flat;
};

std::string cwd() {
    return std::filesystem::current_path().string();
}

} // namespace

TEST(OxFilePathText, WorkedTable) {
    const PathRow rows[] = {
        {R"(a\b\c.txt)", R"(a\b)", "c.txt", R"(a\b\c.txt)", "a_b_c.txt"},
        {R"(c:\foo.txt)", R"(c:\)", "foo.txt", "c:foo.txt", "foo.txt"},
        {R"(c:\a\b)", R"(c:\a)", "b", R"(c:a\b)", "a_b"},
        {R"(ab\c)", "ab", "c", R"(ab\c)", "ab_c"},
        {R"(a\b)", R"(a\)", "b", R"(a\b)", "a_b"},
        {R"(a\)", R"(a\)", N, R"(a\)", "a_"},
        {R"(\a)", N, "a", "a", "a"},
        {"foo", N, "foo", "foo", "foo"},
        {"c:foo", N, "c:foo", "c:foo", "foo"},
        {"c:", N, "c:", "c:", ""},
        {R"(c:\)", R"(c:\)", N, "c:", ""},
        {R"(\)", N, N, "", ""},
        {R"(\\srv\share\f)", R"(\\srv\share)", "f", R"(srv\share\f)", "srv_share_f"},
        {R"(dir\\file)", "dir", "file", R"(dir\\file)", "dir__file"},
        {R"(dir\sub\)", R"(dir\sub)", N, R"(dir\sub\)", "dir_sub_"},
        {"", N, N, N, N},
    };
    for (const PathRow& row : rows) {
        SCOPED_TRACE(row.path);
        EXPECT_EQ(take(OxFile::getBaseName(row.path)), row.baseName);
        EXPECT_EQ(take(OxFile::getFileName(row.path)), row.fileName);
        EXPECT_EQ(take(OxFile::getRelativePath(row.path)), row.relative);
        EXPECT_EQ(take(OxFile::pathToFileName(row.path)), row.flat);
    }
    for (auto op : {OxFile::getRelativePath, OxFile::pathToFileName, OxFile::getFileExtension,
                    OxFile::stripFileExtension, OxFile::getAbsolutePath}) {
        EXPECT_EQ(op(nullptr), nullptr);
    }
    EXPECT_EQ(OxFile::getBaseName(nullptr), nullptr);
    EXPECT_EQ(OxFile::getFileName(nullptr), nullptr);
}

TEST(OxFilePathText, LevelsExtensionsAndSpecs) {
    const char* path = R"(aa\bb\cc)";
    EXPECT_EQ(take(OxFile::getBaseName(path, 2)), "aa");
    EXPECT_EQ(take(OxFile::getBaseName(path, 3)), N);
    EXPECT_EQ(take(OxFile::getBaseName(path, 0)), path);
    EXPECT_EQ(take(OxFile::getFileName(path, 2)), R"(bb\cc)");
    EXPECT_EQ(take(OxFile::getFileName(path, 3)), path);
    EXPECT_EQ(take(OxFile::getFileName(path, 0)), path);
    take(OxFile::getFileName(path, 7)); // beyond the components: any text, no fault

    EXPECT_EQ(take(OxFile::getFileExtension("a.b.c")), "c");
    EXPECT_EQ(take(OxFile::getFileExtension("foo.")), N);
    EXPECT_EQ(take(OxFile::getFileExtension(".profile")), N);
    EXPECT_EQ(take(OxFile::getFileExtension(R"(dir.x\file)")), R"(x\file)");
    EXPECT_EQ(take(OxFile::stripFileExtension("a.b.c")), "a.b");
    EXPECT_EQ(take(OxFile::stripFileExtension(".profile")), N);
    EXPECT_EQ(take(OxFile::stripFileExtension("foo")), N);

    for (const char* yes : {R"(c:\x)", R"(\x)"}) {
        EXPECT_EQ(OxFile::isAbsolutePath(yes), OxTrue) << yes;
    }
    for (const char* no : {"c:", "c:x", "/x", "c:/x", "", static_cast<const char*>(nullptr)}) {
        EXPECT_EQ(OxFile::isAbsolutePath(no), OxFalse) << (no ? no : "null");
    }

    EXPECT_EQ(take(OxFile::makeFileSpec("dir", "f")), R"(dir\f)");
    EXPECT_EQ(take(OxFile::makeFileSpec(R"(dir\)", "f")), R"(dir\f)");
    EXPECT_EQ(take(OxFile::makeFileSpec("", "f")), R"(\f)");
    EXPECT_EQ(take(OxFile::makeFileSpec("dir", "")), R"(dir\)");
    EXPECT_EQ(take(OxFile::makeFileSpec(nullptr, "f")), "f");
    EXPECT_EQ(take(OxFile::makeFileSpec("d", nullptr)), "d");
    EXPECT_EQ(take(OxFile::makeFileSpec(nullptr, nullptr)), N);

    char name[] = "a(b)*c-d/e[f]g.txt";
    EXPECT_EQ(OxFile::cleanupFileName(name), name);
    EXPECT_STREQ(name, "a_b__c_d_e_f_g.txt");
    char empty[] = "";
    EXPECT_EQ(OxFile::cleanupFileName(empty), empty);
}

TEST(OxFilePathText, AbsolutePathsAndComparison) {
    // Rooted paths stay as they are, except "\" alone, which gets the current
    // drive where there are drives; without drives "\" stays "\".
    EXPECT_EQ(take(OxFile::getAbsolutePath(R"(\dir\file)")), R"(\dir\file)");
    EXPECT_EQ(take(OxFile::getAbsolutePath(R"(c:\x\..\y)")), R"(c:\x\..\y)");
    // Relative paths go behind the working directory and one backslash,
    // nothing is resolved.
    EXPECT_EQ(take(OxFile::getAbsolutePath(R"(a\..\b)")), cwd() + R"(\a\..\b)");
    EXPECT_EQ(take(OxFile::getAbsolutePath("")), cwd() + R"(\)");

    EXPECT_EQ(OxFile::compareFileSpecs(R"(c:\x)", R"(C:\x)"), OxTrue);
    EXPECT_EQ(OxFile::compareFileSpecs(R"(C:\X)", R"(C:\x)"), OxFalse);
    EXPECT_EQ(OxFile::compareFileSpecs("same", "same"), OxTrue);
    EXPECT_EQ(OxFile::compareFileSpecs("part", "Part"), OxFalse);
#ifdef _WIN32
    // The drive of the working directory (Z: under Wine) and drive C, whose
    // own working directory is asked of the runtime.
    const std::string drive = std::string(1, static_cast<char>(std::toupper(cwd()[0]))) + ":";
    ASSERT_EQ(cwd()[1], ':');
    EXPECT_EQ(take(OxFile::getAbsolutePath(R"(\)")), drive + R"(\)");
    char driveC[300];
    ASSERT_NE(_getdcwd(3, driveC, sizeof driveC), nullptr);
    std::string cwdC = driveC;
    std::string behindC = cwdC.back() == '\\' ? cwdC : cwdC + R"(\)";
    EXPECT_EQ(take(OxFile::getAbsolutePath("c:x")), behindC + "x");
    EXPECT_EQ(take(OxFile::getCWD(nullptr, 0, 3)), cwdC);
    // A drive prefix names that drive's working directory; the drive letter
    // alone is upper-cased in the comparison.
    EXPECT_EQ(OxFile::compareFileSpecs("part", (drive + "part").c_str()), OxTrue);
    std::string lowerDrive = drive;
    lowerDrive[0] = static_cast<char>(std::tolower(lowerDrive[0]));
    EXPECT_EQ(OxFile::compareFileSpecs("part", (lowerDrive + "part").c_str()), OxTrue);
    if (drive != "C:") {
        EXPECT_EQ(OxFile::compareFileSpecs("part", "c:part"), OxFalse);
    }
#else
    EXPECT_EQ(take(OxFile::getAbsolutePath(R"(\)")), R"(\)");
    // Without drives a drive prefix is dropped: it names the one working
    // directory.
    EXPECT_EQ(take(OxFile::getAbsolutePath("c:x")), cwd() + R"(\x)");
    EXPECT_EQ(OxFile::compareFileSpecs("part", "c:part"), OxTrue);
#endif

    char* here = OxFile::getCWD(nullptr, 0, 0);
    EXPECT_EQ(take(here), cwd());
    char buffer[300];
    EXPECT_EQ(OxFile::getCWD(buffer, sizeof buffer, 0), buffer);
    EXPECT_EQ(std::string(buffer), cwd());
}

TEST_F(IoTest, FileSystemQueriesAndChanges) {
    const std::string file = dir.file("f.txt");
    oxtest::writeFile(file, "x");
    // Windows-form spelling of the same paths reaches the same files.
    const std::string winFile = dir.path() + R"(\f.txt)";
    EXPECT_EQ(OxFile::exists(winFile.c_str()), OxTrue);
    EXPECT_EQ(OxFile::isRegularFile(winFile.c_str()), OxTrue);
    EXPECT_EQ(OxFile::isDirectory(winFile.c_str()), OxFalse);
    EXPECT_EQ(OxFile::isDirectory(dir.path().c_str()), OxTrue);
    EXPECT_EQ(OxFile::isRegularFile(dir.path().c_str()), OxFalse);
    for (const char* none : {static_cast<const char*>(nullptr), "", "/no/such/oxbase/path"}) {
        EXPECT_EQ(OxFile::exists(none), OxFalse);
        EXPECT_EQ(OxFile::isDirectory(none), OxFalse);
        EXPECT_EQ(OxFile::isRegularFile(none), OxFalse);
    }

    // mkdir: one level only.
    EXPECT_EQ(OxFile::mkdir(nullptr), OxTrue);
    EXPECT_EQ(OxFile::mkdir(dir.path().c_str()), OxTrue);
    const std::string sub = dir.path() + R"(\sub)";
    EXPECT_EQ(OxFile::mkdir(sub.c_str()), OxTrue);
    EXPECT_TRUE(std::filesystem::is_directory(dir.file("sub")));
    EXPECT_EQ(taken(), Numbers{});
    testing::internal::CaptureStderr();
    EXPECT_EQ(OxFile::mkdir(dir.file("missing/child").c_str()), OxFalse);
    std::string err = testing::internal::GetCapturedStderr();
    EXPECT_NE(err.find("System Error: "), std::string::npos) << err;
    EXPECT_FALSE(std::filesystem::exists(dir.file("missing")));
    EXPECT_EQ(log.take(), std::vector<std::string>{"m180 " + dir.file("missing/child")});
    EXPECT_EQ(OxFile::mkdir(file.c_str()), OxFalse);
    EXPECT_EQ(log.take(), std::vector<std::string>{"m181 " + file});

    EXPECT_EQ(OxFile::removeFile(winFile.c_str()), OxTrue);
    EXPECT_FALSE(std::filesystem::exists(file));
    EXPECT_EQ(OxFile::removeFile(file.c_str()), OxFalse);
    std::vector<std::string> removed = log.take();
    ASSERT_EQ(removed.size(), 1u);
    EXPECT_EQ(removed[0].rfind("m344 " + file + " ", 0), 0u) << removed[0];
    EXPECT_GT(removed[0].size(), ("m344 " + file + " ").size()); // the system's text follows
    EXPECT_EQ(OxFile::removeFile(nullptr), OxFalse);

    // A working directory that does not fit the caller's buffer: 484, null.
    char small[2];
    EXPECT_EQ(OxFile::getCWD(small, sizeof small, 0), nullptr);
    EXPECT_EQ(taken(), Numbers{"484"});
}

TEST_F(IoTest, FindFileAndName) {
    std::filesystem::create_directory(dir.file("one"));
    std::filesystem::create_directory(dir.file("two"));
    std::filesystem::create_directory(dir.file("two/hit.xml")); // a directory: no match
    std::filesystem::create_directory(dir.file("three"));
    oxtest::writeFile(dir.file("three/hit.xml"), "<x/>");
    const std::string one = dir.file("one"), two = dir.file("two"), three = dir.file("three");
    OxGList<char*> dirs;
    dirs.append(nullptr);
    dirs.append(const_cast<char*>(one.c_str()));
    dirs.append(const_cast<char*>(two.c_str()));
    dirs.append(const_cast<char*>(three.c_str()));
    EXPECT_EQ(take(OxFile::findFile("hit.xml", dirs)), three + R"(\hit.xml)");
    EXPECT_EQ(OxFile::findFile("none.xml", dirs), nullptr);
    EXPECT_EQ(OxFile::findFile(nullptr, dirs), nullptr);
    EXPECT_EQ(OxFile::findFile("hit.xml", OxGList<char*>()), nullptr);
    EXPECT_EQ(taken(), Numbers{});
}
