// Faults of the file system under every reader and writer: a file size limit,
// a full device, a file that shrinks while it is read, a directory that
// vanishes during a walk, rights taken away, and files that are not regular
// files. Each must give its report by message number, no crash, and nothing
// that was already written may be lost.
#include "OxIoTestSupport.h"
#include "oxbase/doc/OxCsvFile.h"
#include "oxbase/doc/OxXmlAttribute.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/doc/OxXmlFile.h"
#include "oxbase/io/OxFileList.h"
#include "oxbase/io/OxFileTreeWalk.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxOutput.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#ifndef _WIN32
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>
#endif

namespace fs = std::filesystem;
using oxiotest::Numbers;

namespace {

/// The file-stream messages plus the ends of the document writers.
class FaultTest : public oxiotest::IoTest {
protected:
    /// "<numbers joined by ,>" of the messages so far, e.g. "179,19".
    std::string numbers() {
        std::string joined;
        for (const std::string& n : taken()) {
            if (n != "578" && n != "579") { // the writers' end messages
                joined += (joined.empty() ? "" : ",") + n;
            }
        }
        return joined;
    }

    /// A document of `parts` children, a few hundred bytes each.
    std::string bigDocument(int parts) {
        std::string text = "<?xml version=\"1.0\"?>\n<model>\n";
        for (int i = 0; i < parts; i++) {
            text += " <part id=\"" + std::to_string(i) + "\" name=\"" + std::string(200, 'n') +
                    "\"/>\n";
        }
        return text + "</model>\n";
    }

    /// An XML file object that has read `bigDocument(parts)` and is opened
    /// for output on `out` (unless it is empty).
    std::unique_ptr<OxXmlFile> bigXml(int parts, const std::string& out) {
        std::string in = dir.file("big-in.xml");
        oxtest::writeFile(in, bigDocument(parts));
        auto file = std::make_unique<OxXmlFile>(in.c_str(), OxFile::OxIOInput);
        EXPECT_EQ(file->readFile(), OxTrue);
        if (!out.empty()) {
            file->open(out.c_str(), OxFile::OxIOOutput);
        }
        return file;
    }

    /// A CSV table of `records` records with a long field each.
    static OxXmlElement* bigTable(int records) {
        OxXmlElement* root = new OxXmlElement("root");
        for (int i = 0; i < records; i++) {
            OxXmlElement* record = new OxXmlElement("record");
            record->addAttribute(new OxXmlAttribute("id", std::to_string(i).c_str()));
            record->addAttribute(new OxXmlAttribute("name", std::string(200, 'n').c_str()));
            root->addChild(record);
            record->setParent(root);
        }
        return root;
    }
};

#ifndef _WIN32
/// Whether `shorter` is the start of `longer`.
bool isPrefix(const std::string& shorter, const std::string& longer) {
    return longer.compare(0, shorter.size(), shorter) == 0;
}
#endif

TEST_F(FaultTest, FileSizeLimitUnderEveryWriter) {
#ifdef _WIN32
    GTEST_SKIP() << "a file size limit needs a forked child with RLIMIT_FSIZE (POSIX only)";
#else
    // Typed values wait in the stream buffer; close tells that only part of
    // them reached the file, and what did is their start.
    const std::string values = dir.file("values.bin");
    std::string result = oxtest::inChild(
        [&] {
            OxOutput out(values.c_str(), OxFile::FILE_MODE_BINARY);
            bool allTaken = true;
            for (int i = 0; i < 1500; i++) {
                allTaken = out.write(i) == OxTrue && allTaken;
            }
            std::string report = allTaken ? "taken" : "refused";
            report += out.close() == OxTrue ? " closed" : " lost";
            return report + " " + numbers();
        },
        {false, 512});
    EXPECT_EQ(result, "taken lost 179,19");
    std::string expected;
    for (int i = 0; i < 1500; i++) {
        expected += std::string{0, 0, static_cast<char>(i >> 8), static_cast<char>(i & 0xff)};
    }
    std::string written = oxtest::readFile(values);
    EXPECT_EQ(written.size(), 512u);
    EXPECT_TRUE(isPrefix(written, expected));

    // Without a close of its own, the destructor reports the loss.
    result = oxtest::inChild(
        [&] {
            {
                OxOutput out(values.c_str(), OxFile::FILE_MODE_BINARY);
                for (int i = 0; i < 1500; i++) {
                    out.write(i);
                }
            }
            return numbers();
        },
        {false, 512});
    EXPECT_EQ(result, "183");

    // Lines are flushed one by one: the line that crosses the limit fails.
    const std::string lines = dir.file("lines.txt");
    result = oxtest::inChild(
        [&] {
            OxOutput out(lines.c_str(), OxFile::FILE_MODE_TEXT);
            int sent = 0;
            while (sent < 100 && out.putline("0123456789012345678") == OxTrue) {
                sent++;
            }
            return std::to_string(sent) + " " + numbers();
        },
        {false, 100});
    EXPECT_EQ(result, "5 179,20");
    EXPECT_EQ(oxtest::readFile(lines).size(), 100u);

    // The document writers answer OxFalse, and the file holds the start of
    // the document.
    const std::string xml = dir.file("model.xml");
    auto document = bigXml(100, ""); // read here: the child may write 4 KiB only
    taken();
    result = oxtest::inChild(
        [&] {
            document->open(xml.c_str(), OxFile::OxIOOutput);
            std::string report = document->writeFile() == OxTrue ? "written " : "failed ";
            return report + numbers().substr(0, 3);
        },
        {false, 4096});
    EXPECT_EQ(result, "failed 179");
    auto whole = bigXml(100, dir.file("whole.xml"));
    ASSERT_EQ(whole->writeFile(), OxTrue);
    taken();
    EXPECT_EQ(oxtest::readFile(xml).size(), 4096u);
    EXPECT_TRUE(isPrefix(oxtest::readFile(xml), oxtest::readFile(dir.file("whole.xml"))));

    const std::string csv = dir.file("table.csv");
    result = oxtest::inChild(
        [&] {
            OxCsvFile table(csv.c_str(), OxFile::OxIOOutput);
            table.setRoot(bigTable(100));
            std::string report = table.writeFile() == OxTrue ? "written " : "failed ";
            return report + numbers().substr(0, 3);
        },
        {false, 4096});
    EXPECT_EQ(result, "failed 179");
    EXPECT_EQ(oxtest::readFile(csv).size(), 4096u);
#endif
}

TEST_F(FaultTest, FullDeviceUnderTheDocumentWriters) {
    if (!fs::exists("/dev/full")) {
        GTEST_SKIP() << "no /dev/full to fail writes";
    }
    auto xml = bigXml(2, "/dev/full");
    EXPECT_EQ(xml->writeFile(), OxFalse);
    EXPECT_EQ(numbers().substr(0, 6), "179,20");
    OxCsvFile csv("/dev/full", OxFile::OxIOOutput);
    csv.setRoot(bigTable(2));
    EXPECT_EQ(csv.writeFile(), OxFalse);
    EXPECT_EQ(numbers().substr(0, 6), "179,20");
    EXPECT_TRUE(fs::exists("/dev/full") && !fs::is_regular_file("/dev/full"));
}

TEST_F(FaultTest, FileThatShrinksWhileItIsRead) {
    const std::string path = dir.file("shrinking.bin");
    oxtest::writeFile(path, std::string(100, '\x01'));
    OxInput in(path.c_str(), OxFile::FILE_MODE_BINARY);
    ASSERT_EQ(in.isGood(), OxTrue);
    fs::resize_file(path, 12);
    double value = 0.0;
    EXPECT_EQ(in.read(value), 8);
    EXPECT_EQ(in.read(value), 4); // what was left of the second value
    EXPECT_NE(numbers(), "");
    EXPECT_EQ(in.read(value), 0); // a failed stream stays failed
    EXPECT_EQ(numbers(), "2,18,19");

    // The XML reader knows the length from the open; the file is shorter
    // when it reads: it reads the lines that are still there, the last one
    // cut, as a line reader would, with no crash and no report.
    const std::string doc = dir.file("shrinking.xml");
    std::string text = bigDocument(50);
    oxtest::writeFile(doc, text);
    OxXmlFile xml(doc.c_str(), OxFile::OxIOInput);
    fs::resize_file(doc, text.size() / 2);
    EXPECT_EQ(xml.readFile(), OxTrue);
    ASSERT_NE(xml.getRoot(), nullptr);
    // A part whose tag name is whole on the line that is left is an element.
    std::string kept = text.substr(0, text.size() / 2);
    unsigned int tags = 0;
    for (size_t at = kept.find("<part "); at != std::string::npos;
         at = kept.find("<part ", at + 1)) {
        tags++;
    }
    EXPECT_GT(tags, 20u);
    EXPECT_EQ(xml.getRoot()->getNbChildElements(), tags);
    EXPECT_EQ(numbers(), "");

    // The CSV reader reads the lines that are still there.
    const std::string table = dir.file("shrinking.csv");
    oxtest::writeFile(table, "a,b\n1,2\n3,4\n5,6\n");
    OxCsvFile csv(table.c_str(), OxFile::OxIOInput);
    fs::resize_file(table, 12);
    EXPECT_EQ(csv.readFile(), OxTrue);
    EXPECT_EQ(csv.getRoot()->getNbChildElements(), 2u); // "1,2" and the cut "3"
}

TEST_F(FaultTest, NothingButRegularFilesIsRead) {
#ifndef _WIN32
    // A FIFO without a writer would block an open forever: every reader
    // refuses it at once, as it refuses a directory. (FIFOs are POSIX's.)
    const std::string fifo = dir.file("fifo");
    ASSERT_EQ(mkfifo(fifo.c_str(), 0600), 0);
    OxInput in(fifo.c_str(), OxFile::FILE_MODE_BINARY);
    EXPECT_EQ(in.isGood(), OxFalse);
    EXPECT_EQ(numbers(), "1,19");
    OxXmlFile xml(fifo.c_str(), OxFile::OxIOInput);
    EXPECT_EQ(xml.readFile(), OxFalse);
    OxCsvFile csv(fifo.c_str(), OxFile::OxIOInput);
    EXPECT_EQ(csv.readFile(), OxFalse);
    EXPECT_EQ(numbers(), "1,19,1,19");
    OxFileList list(fifo.c_str());
    testing::internal::CaptureStderr();
    EXPECT_EQ(list.readListFiles(), OxFalse);
    EXPECT_EQ(testing::internal::GetCapturedStderr(),
              "Unable to open list file.\n  Tried " + fifo + "\n");
#endif

    // A message file planted as a directory or a FIFO in the working
    // directory is passed over for the one in the application's directory.
    oxtest::TempDir work, app;
    fs::create_directory(work.file("app.msg"));
    oxtest::writeFile(app.file("app.msg"), "7,I,0from the application\n");
#ifdef _WIN32
    fs::create_directory(work.file("pipe.msg")); // no FIFO: a directory again
#else
    ASSERT_EQ(mkfifo(work.file("pipe.msg").c_str(), 0600), 0);
#endif
    oxtest::writeFile(app.file("pipe.msg"), "7,I,0past the pipe\n");
    auto message7 = [&](const char* file) {
        OxMsg msg(file, app.path().c_str(), nullptr, nullptr);
        return std::string(OxMsg::LogToString(7) != nullptr ? OxMsg::LogToString(7) : "<none>");
    };
    fs::path home = fs::current_path();
    fs::current_path(work.path());
    std::string fromDirectory = message7("app.msg");
    std::string pastThePipe = message7("pipe.msg");
    fs::current_path(home);
    EXPECT_EQ(fromDirectory, "from the application");
    EXPECT_EQ(pastThePipe, "past the pipe");
}

TEST_F(FaultTest, ReadOnlyOutputDirectory) {
#ifdef _WIN32
    GTEST_SKIP() << "permission bits of a directory and dropping root rights are POSIX's";
#else
    const std::string locked = dir.file("locked");
    fs::create_directory(locked);
    oxtest::writeFile(locked + "/old.xml", "<old/>\n");
    chmod(locked.c_str(), 0555);
    auto xml = bigXml(1, "");
    taken();
    // Root writes anywhere: the writers run in a child without root rights.
    std::string result = oxtest::inChild(
        [&] {
            OxOutput out((locked + "/new.bin").c_str(), OxFile::FILE_MODE_BINARY);
            std::string report = out.isGood() == OxTrue ? "opened " : "refused ";
            xml->open((locked + "/old.xml").c_str(), OxFile::OxIOOutput);
            report += xml->writeFile() == OxTrue ? "written " : "kept ";
            return report + numbers();
        },
        {true, 0});
    chmod(locked.c_str(), 0755);
    EXPECT_EQ(result, "refused kept 1,19,182");
    EXPECT_EQ(oxtest::readFile(locked + "/old.xml"), "<old/>\n"); // nothing destroyed
#endif
}

TEST(OxFaultWalk, DirectoryRemovedDuringAWalk) {
    oxtest::TempDir tmp;
    auto plant = [&] { // a/, b/ and c/, each with deep/deeper/f.txt
        for (const char* sub : {"a", "b", "c"}) {
            fs::create_directories(tmp.file(std::string(sub) + "/deep/deeper"));
            oxtest::writeFile(tmp.file(std::string(sub) + "/deep/deeper/f.txt"), "x");
        }
    };
    plant();
    struct Seen {
        std::string root;
        std::vector<std::string> paths;
        bool removed = false;
    } seen;
    seen.root = tmp.path();
    auto visit = [](const char* path, const OxStat*, OxFileTreeWalkType, void* data) {
        Seen& s = *static_cast<Seen*>(data);
        s.paths.push_back(path);
        if (!s.removed && s.paths.size() == 2) {
            // The first subdirectory met: both others go while the walk runs.
            for (const char* sub : {"a", "b", "c"}) {
                if (s.paths[1] != s.root + oxtest::kSep + sub) {
                    fs::remove_all(s.root + oxtest::kSep + sub);
                }
            }
            s.removed = true;
        }
        return 0;
    };
    for (int slots : {1, 10}) {
        seen.paths.clear();
        seen.removed = false;
        testing::internal::CaptureStderr();
        OxFileTreeWalk walk(tmp.path().c_str(), visit, slots, &seen);
        EXPECT_EQ(walk.run(), 0);
        testing::internal::GetCapturedStderr();
        // The root, the one subdirectory left and its three entries.
        EXPECT_EQ(seen.paths.size(), 5u) << slots;
        plant();
    }
}

} // namespace
