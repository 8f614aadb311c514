// oxtool as a user runs it: each command on small inputs, its output and its
// exit status (0, 4, 8 by the worst message; 2 for a command line that
// cannot be obeyed), the options every command shares, and "-".
#include "tool/OxToolRun.h"

#include <gtest/gtest.h>

#include <filesystem>

using oxtest::contains;
using oxtest::count;
using oxtest::oxtool;

namespace fs = std::filesystem;

namespace {

const char* const kClean = "<?xml version=\"1.0\"?>\n<a>\n <b x=\"1\"/>\n <c>text</c>\n</a>\n";
const char* const kMismatch = "<?xml version=\"1.0\"?>\n<a>\n<b></c>\n</a>\n";
const char* const kBroken = "<?xml version=\"1.0\"?>\n<a>\n<b x=1/>\n</a>\n";

const char* const kCommands[] = {"check",    "csv",   "demo",   "hexdump", "list", "log",
                                 "messages", "paths", "ranges", "walk",    "xml",  "xml-dump"};

} // namespace

TEST(OxToolCommon, HelpAndVersionOnEveryCommand) {
    oxtest::TempDir dir;
    for (const char* command : kCommands) {
        for (const char* option : {"--help", "-h"}) {
            oxtest::CommandResult result = oxtool(std::string(command) + " " + option, dir.path());
            EXPECT_EQ(result.status, 0) << command << " " << option;
            EXPECT_TRUE(contains(result.out, std::string("usage: oxtool ") + command)) << command;
            EXPECT_TRUE(contains(result.out, "exit status")) << command;
            EXPECT_TRUE(result.err.empty()) << command << ": " << result.err;
        }
        oxtest::CommandResult version = oxtool(std::string(command) + " --version", dir.path());
        EXPECT_EQ(version.status, 0) << command;
        EXPECT_TRUE(contains(version.out, "oxtool " OXBASE_TEST_VERSION)) << version.out;
    }
    // Help does not do the command's work: no walk of a directory named
    // "--help", no folder made by the demo.
    EXPECT_FALSE(contains(oxtool("walk --help", dir.path()).out, "directories:"));
    EXPECT_TRUE(fs::is_empty(dir.path()));
    oxtest::CommandResult overview = oxtool("--help");
    EXPECT_EQ(overview.status, 0);
    for (const char* command : kCommands) {
        EXPECT_TRUE(contains(overview.out, std::string("  ") + command + " ")) << command;
    }
    EXPECT_EQ(oxtool("--version").status, 0);
    EXPECT_EQ(oxtool("help xml").status, 0);
}

TEST(OxToolCommon, UsageErrorsEndWithStatusTwo) {
    oxtest::TempDir dir;
    oxtest::writeFile(dir.file("a.xml"), kClean);
    const char* const lines[] = {"",
                                 "frobnicate",
                                 "xml",
                                 "xml a.xml b.xml c.xml",
                                 "xml --bogus a.xml",
                                 "check -x a.xml",
                                 "check",
                                 "check --jobs many a.xml",
                                 "check -",
                                 "walk . --depth deep",
                                 "walk",
                                 "walk -",
                                 "log",
                                 "log 1 a b c d e",
                                 "hexdump",
                                 "ranges 1 --negate 1",
                                 "ranges 1 --negate a 2",
                                 "csv a.csv --sep ab",
                                 "demo a b c",
                                 "xml a.xml --log -",
                                 "xml a.xml --messages -",
                                 "xml a.xml --verbose=yes"};
    for (const char* line : lines) {
        oxtest::CommandResult result = oxtool(line, dir.path());
        EXPECT_EQ(result.status, 2) << line << ": " << result.err;
        EXPECT_FALSE(result.err.empty()) << line;
        EXPECT_TRUE(result.out.empty()) << line << ": " << result.out;
    }
    // Nothing was done: no files besides the input.
    EXPECT_EQ(std::distance(fs::directory_iterator(dir.path()), fs::directory_iterator()), 1);
}

TEST(OxToolCommon, MessagesAndLogOptions) {
    oxtest::TempDir dir;
    oxtest::writeFile(dir.file("m.xml"), kMismatch);
    // --log takes every message; the message file in use is named by --verbose.
    oxtest::CommandResult logged = oxtool("xml m.xml --log run.log --verbose", dir.path());
    EXPECT_EQ(logged.status, 4);
    EXPECT_TRUE(contains(oxtest::readFile(dir.file("run.log")), "567W: "));
    EXPECT_TRUE(contains(logged.err, "message file "));
    // Own texts, found by --messages.
    oxtest::writeFile(dir.file("own.msg"), "567,E,0MISMATCH %s %u %u %s %s\n");
    oxtest::CommandResult own = oxtool("xml m.xml --messages own.msg", dir.path());
    EXPECT_EQ(own.status, 8); // the own file makes 567 an error
    EXPECT_TRUE(contains(own.err, "MISMATCH m.xml 3 3 c b"));
    // A message file that is not there: the command cannot do its work.
    oxtest::CommandResult missing = oxtool("xml m.xml --messages none.msg", dir.path());
    EXPECT_EQ(missing.status, 8);
    EXPECT_TRUE(contains(missing.err, "none.msg"));
}

TEST(OxToolXml, StatusIsTheWorstMessageAndDashIsStandardInputOrOutput) {
    oxtest::TempDir dir;
    oxtest::writeFile(dir.file("clean.xml"), kClean);
    oxtest::writeFile(dir.file("m.xml"), kMismatch);
    oxtest::writeFile(dir.file("broken.xml"), kBroken);
    EXPECT_EQ(oxtool("xml clean.xml", dir.path()).status, 0);
    oxtest::CommandResult mismatch = oxtool("xml m.xml", dir.path());
    EXPECT_EQ(mismatch.status, 4);
    EXPECT_TRUE(contains(mismatch.err, "line 3"));
    EXPECT_EQ(oxtool("xml broken.xml", dir.path()).status, 8);
    EXPECT_EQ(oxtool("xml missing.xml", dir.path()).status, 8);
    EXPECT_EQ(oxtool("xml-dump broken.xml", dir.path()).status, 8);

    // OUT "-": the document on standard output, no file named "-".
    oxtest::CommandResult out = oxtool("xml clean.xml -", dir.path());
    EXPECT_EQ(out.status, 0);
    EXPECT_EQ(out.out, "<?xml version=\"1.0\"?>\n<a>\n <b x=\"1\"/>\n <c>text</c>\n</a>\n");
    EXPECT_FALSE(fs::exists(dir.file("-")));
    // IN "-": standard input.
    oxtest::CommandResult in = oxtool("xml - copy.xml", dir.path(), dir.file("m.xml"));
    EXPECT_EQ(in.status, 4);
    EXPECT_EQ(oxtest::readText(dir.file("copy.xml")),
              "<?xml version=\"1.0\"?>\n<a>\n <b/>\n</a>\n");
    oxtest::CommandResult dump = oxtool("xml-dump -", dir.path(), dir.file("clean.xml"));
    EXPECT_EQ(dump.status, 0);
    EXPECT_TRUE(contains(dump.out, "OxXmlFile"));
}

TEST(OxToolCheck, FilesDirectoriesListsAndSummary) {
    oxtest::TempDir dir;
    fs::create_directories(dir.file("docs/sub"));
    oxtest::writeFile(dir.file("docs/clean.xml"), kClean);
    oxtest::writeFile(dir.file("docs/sub/m.xml"), kMismatch);
    oxtest::writeFile(dir.file("docs/sub/table.CSV"), "a,b\n1,2\n");
    oxtest::writeFile(dir.file("docs/notes.txt"), "not collected");
    oxtest::writeFile(dir.file("broken.xml"), kBroken);
    oxtest::writeFile(dir.file("files.lst"), "# the broken one\nbroken.xml\n");

    // A directory: its .xml and .csv files, whatever the case of the ending.
    oxtest::CommandResult folder = oxtool("check docs", dir.path());
    EXPECT_EQ(folder.status, 4);
    EXPECT_TRUE(contains(folder.out, oxtest::native("docs/sub/m.xml") + ":3: warning: "));
    EXPECT_TRUE(contains(folder.out, "[msg 567]"));
    EXPECT_TRUE(contains(folder.out, "checked 3 files"));
    EXPECT_TRUE(contains(folder.out, "1 warning, 0 errors"));
    EXPECT_FALSE(contains(folder.out, "notes.txt"));
    EXPECT_TRUE(contains(oxtool("check docs --ext .txt", dir.path()).out, "checked 1 file "));

    // A clean file alone: status 0, only the summary.
    oxtest::CommandResult clean = oxtool("check docs/clean.xml", dir.path());
    EXPECT_EQ(clean.status, 0);
    EXPECT_EQ(count(clean.out, "\n"), 1u);

    // A list file; an error's place and its own message share the line.
    oxtest::CommandResult listed = oxtool("check @files.lst", dir.path());
    EXPECT_EQ(listed.status, 8);
    EXPECT_EQ(count(listed.out, "broken.xml:3: error: "), 2u);
    EXPECT_TRUE(contains(listed.out, "[msg 566]"));
    EXPECT_TRUE(contains(listed.out, "[msg 560]"));

    // Missing operands of every kind end non-zero with a message.
    EXPECT_EQ(oxtool("check nothing.xml", dir.path()).status, 8);
    EXPECT_EQ(oxtool("check @nothing.lst", dir.path()).status, 8);

    // Worker processes give the same report, in the same order.
    oxtest::CommandResult one = oxtool("check docs broken.xml", dir.path());
    oxtest::CommandResult two = oxtool("check docs broken.xml --jobs 3", dir.path());
    EXPECT_EQ(two.status, one.status);
    auto body = [](const std::string& text) { return text.substr(0, text.rfind("checked ")); };
    EXPECT_EQ(body(two.out), body(one.out));
    // The same summary but for the time it took.
    auto summary = [](const std::string& text) {
        size_t at = text.rfind("checked ");
        return text.substr(at, text.find(" in ", at) - at);
    };
    EXPECT_EQ(summary(two.out), summary(one.out));
    // Not a terminal: no progress line.
    EXPECT_FALSE(contains(two.err, "\r"));
}

TEST(OxToolWalkAndList, MissingStartsAndWalksThatEndEarly) {
    oxtest::TempDir dir;
    fs::create_directories(dir.file("tree/a"));
    oxtest::writeFile(dir.file("tree/a/doc.xml"), kClean);
    oxtest::CommandResult walk = oxtool("walk tree --ext .xml", dir.path());
    EXPECT_EQ(walk.status, 0);
    EXPECT_TRUE(contains(walk.out, "F ")) << walk.out;
    EXPECT_TRUE(contains(walk.out, "shown: 1"));
    oxtest::CommandResult missing = oxtool("walk nosuchdir", dir.path());
    EXPECT_EQ(missing.status, 8);
    EXPECT_TRUE(contains(missing.err, "nosuchdir"));

    // A symbolic link that points at itself ends the library's walk.
    std::error_code error;
    fs::create_symlink("loop", dir.file("tree/loop"), error);
    if (error) {
        GTEST_SKIP() << "no symbolic links here";
    }
    oxtest::writeFile(dir.file("tree.lst"), "tree\n");
    oxtest::CommandResult looped = oxtool("walk tree", dir.path());
    EXPECT_EQ(looped.status, 8);
    EXPECT_TRUE(contains(looped.err, "loop")) << looped.err;
    oxtest::CommandResult list = oxtool("list tree.lst", dir.path());
    EXPECT_EQ(list.status, 8);
    EXPECT_TRUE(contains(list.err, "[lint:walk-loop]")) << list.err;
    oxtest::CommandResult check = oxtool("check tree", dir.path());
    EXPECT_EQ(check.status, 8);
    EXPECT_TRUE(contains(check.out, "tree: error: the symbolic link ")) << check.out;
    EXPECT_EQ(oxtool("list none.lst", dir.path()).status, 8);
}

TEST(OxToolWalkAndList, DirectoryBeyondThePathLimitIsReported) {
#ifdef _WIN32
    GTEST_SKIP() << "a working directory on Windows is at most MAX_PATH long: the chain "
                    "beyond the path limit cannot be made from inside";
#endif
    oxtest::TempDir dir;
    // A chain of directories whose full path is longer than a path may be:
    // made one level at a time from inside.
    fs::path saved = fs::current_path();
    fs::current_path(dir.path());
    std::string level(200, 'd');
    fs::create_directory("deep");
    fs::current_path("deep");
    for (int i = 0; i < 24; i++) {
        fs::create_directory(level);
        fs::current_path(level);
    }
    oxtest::writeFile("lost.xml", kClean);
    fs::current_path(saved);
    oxtest::CommandResult check = oxtool("check deep", dir.path());
    EXPECT_EQ(check.status, 4) << check.out << check.err;
    EXPECT_TRUE(contains(check.out, "[lint:walk-unlisted]")) << check.out;
    // Removed from inside out, one level at a time.
    fs::current_path(dir.file("deep"));
    for (int i = 0; i < 24; i++) {
        fs::current_path(level);
    }
    fs::remove("lost.xml");
    for (int i = 0; i < 24; i++) {
        fs::current_path("..");
        fs::remove(level);
    }
    fs::current_path(saved);
}

TEST(OxToolLog, NumbersMessageFilesAndStatus) {
    oxtest::TempDir dir;
    std::string msg = oxtest::dataFile("oxbase.msg");
    oxtest::CommandResult error = oxtool("log 1 part.xml --log run.log", dir.path());
    EXPECT_EQ(error.status, 8);
    EXPECT_TRUE(contains(error.out, "worst error code: 8"));
    EXPECT_TRUE(contains(oxtest::readFile(dir.file("run.log")), "  1E: "));
    oxtest::CommandResult legacy = oxtool("log \"" + msg + "\" own.log 152", dir.path());
    EXPECT_EQ(legacy.status, 4);
    EXPECT_TRUE(contains(oxtest::readFile(dir.file("own.log")), "152W: "));
    EXPECT_EQ(oxtool("log 579 x.xml", dir.path()).status, 0);
    oxtest::CommandResult notNumber = oxtool("log \"" + msg + "\" own.log abc", dir.path());
    EXPECT_EQ(notNumber.status, 2);
    EXPECT_TRUE(contains(notNumber.err, "'abc' is not a message number"));
}

TEST(OxToolCsvHexdumpPathsRanges, OutputAndStatus) {
    oxtest::TempDir dir;
    oxtest::writeFile(dir.file("t.csv"), "a,b,c\n1,,3\n");
    oxtest::CommandResult csv = oxtool("csv t.csv --find a=1 -", dir.path());
    EXPECT_EQ(csv.status, 0);
    EXPECT_EQ(csv.out, "a,b,c\n1,3,\n");
    EXPECT_TRUE(contains(csv.err, "found 1 record(s) for a=1"));
    EXPECT_EQ(oxtool("csv none.csv", dir.path()).status, 8);
    oxtest::CommandResult checked = oxtool("check t.csv", dir.path());
    EXPECT_EQ(checked.status, 4);
    EXPECT_TRUE(contains(checked.out, "t.csv:2: warning: ")) << checked.out;
    EXPECT_TRUE(contains(checked.out, "(b) is empty")) << checked.out;
    // With --log, the lint warnings are in the log too.
    EXPECT_EQ(oxtool("check t.csv --log check.log", dir.path()).status, 4);
    EXPECT_TRUE(contains(oxtest::readFile(dir.file("check.log")), "t.csv:2: warning: "));

    oxtest::writeFile(dir.file("bytes"), "ABC");
    oxtest::CommandResult hex = oxtool("hexdump -", dir.path(), dir.file("bytes"));
    EXPECT_EQ(hex.status, 0);
    EXPECT_TRUE(contains(hex.out, "41 42 43"));
    EXPECT_EQ(oxtool("hexdump none", dir.path()).status, 8);

    oxtest::CommandResult paths = oxtool("paths \"c:\\\\a\\\\b.xml\" /usr/x.xml", dir.path());
    EXPECT_EQ(paths.status, 0);
    EXPECT_TRUE(contains(paths.out, "getFileExtension     \"xml\""));

    // {1-4, 9} and {6-7}; within 0..12 the set lacks 0, 5, 8 and 10 to 12.
    oxtest::CommandResult ranges = oxtool("ranges 9,1-3,2-4 --merge 6-7 --negate 0 12");
    EXPECT_EQ(ranges.status, 0);
    EXPECT_EQ(ranges.out, "0,5,8,10-12\nmembers: 6\n");
    // 4294967296 + 5 wraps to 5 in 32 bits: a warning, and the wrapped set.
    oxtest::CommandResult wrapped = oxtool("ranges 4294967301");
    EXPECT_EQ(wrapped.status, 4);
    EXPECT_EQ(wrapped.out, "5\nmembers: 1\n");
    EXPECT_TRUE(contains(wrapped.err, "wraps to 5"));
    EXPECT_EQ(oxtool("ranges \"1 , 2\"").status, 8);
}

TEST(OxToolDemo, RunsEveryStepOverTheSampleData) {
    oxtest::TempDir dir;
    oxtest::CommandResult demo =
        oxtool("demo \"" + oxtest::native(OXBASE_DATA_DIR) + "\" out", dir.path());
    EXPECT_EQ(demo.status, 0) << demo.err;
    EXPECT_TRUE(contains(demo.out, "all succeeded"));
    EXPECT_TRUE(fs::exists(dir.file("out/assembly.xml")));
    EXPECT_TRUE(fs::exists(dir.file("out/demo.log")));
}

TEST(OxToolMessages, TableOfLibraryNumbersAndTheGuideCopy) {
    // docs/messages.md is this command's output over the bundled file.
    std::string data = OXBASE_DATA_DIR;
    oxtest::CommandResult table =
        oxtool("messages --markdown --messages \"" + oxtest::dataFile("oxbase.msg") + "\"");
    EXPECT_EQ(table.status, 0);
    EXPECT_EQ(table.out, oxtest::readFile(data + "/../docs/messages.md"))
        << "docs/messages.md is out of date: build the docs target";
    EXPECT_TRUE(contains(table.out, "| 566 | E | text, number, number, text | "));
    // A file that lacks numbers: each shown as such, and a warning.
    oxtest::TempDir dir;
    oxtest::writeFile(dir.file("own.msg"), "1,E,0cannot open %s\n");
    oxtest::CommandResult own = oxtool("messages --messages own.msg", dir.path());
    EXPECT_EQ(own.status, 4);
    EXPECT_TRUE(contains(own.out, "   1 E  text"));
    EXPECT_TRUE(contains(own.out, " 579 -  text"));
    EXPECT_TRUE(contains(own.err, "have no text in own.msg"));
}
