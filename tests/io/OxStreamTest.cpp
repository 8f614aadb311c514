#include "OxIoTestSupport.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxMemory.h"
#include "oxbase/io/OxOutput.h"

#include <gtest/gtest.h>

#include <cstring>
#include <filesystem>
#include <string>
#include <sys/stat.h>

#ifndef _WIN32
#include <fcntl.h>
#include <unistd.h>
#endif

using oxiotest::IoTest;
using oxiotest::Numbers;

namespace {
const OxFile::FILE_MODE kBinary = OxFile::FILE_MODE_BINARY;
const OxFile::FILE_MODE kText = OxFile::FILE_MODE_TEXT;

std::string bytes(std::initializer_list<int> values) {
    std::string out;
    for (int v : values) {
        out += static_cast<char>(v);
    }
    return out;
}
} // namespace

TEST_F(IoTest, EveryValueTypeHasItsByteLayout) {
    const std::string path = dir.file("values.bin");
    char block[] = "xyz";
    {
        OxOutput out(path.c_str(), kBinary);
        ASSERT_EQ(out.isGood(), OxTrue);
        // Each write answers OxTrue (1): ten writes, ten.
        EXPECT_EQ(out.write('A') + out.write(static_cast<unsigned char>(0xFE)) +
                      out.write(static_cast<short>(-2)) +
                      out.write(static_cast<unsigned short>(0x1234)) + out.write(-2) +
                      out.write(16909060u) + out.write(1.0f) + out.write(-2.5) +
                      out.write(block, 3) + out.write(reinterpret_cast<unsigned char*>(block), 0),
                  10);
        EXPECT_EQ(static_cast<long long>(std::streamoff(out.getFilePosition())), 29);
    }
    // -2.5 is -1.25 * 2^1: sign 1, biased exponent 0x400, fraction 0x4000000000000.
    const std::string expected = bytes({0x41, 0xFE, 0xFF, 0xFE, 0x12, 0x34, 0xFF, 0xFF, 0xFF, 0xFE,
                                        0x01, 0x02, 0x03, 0x04, 0x3F, 0x80, 0x00, 0x00, 0xC0, 0x04,
                                        0,    0,    0,    0,    0,    0,    'x',  'y',  'z'});
    ASSERT_EQ(oxtest::readFile(path), expected);

    // The numbers from the short on, read back from either reader.
    auto readNumbers = [](auto& reader) {
        short s = 0;
        unsigned short us = 0;
        int i = 0;
        unsigned int ui = 0;
        float f = 0;
        double d = 0;
        EXPECT_EQ(reader.read(s) + reader.read(us) + reader.read(i) + reader.read(ui) +
                      reader.read(f) + reader.read(d),
                  24);
        EXPECT_EQ(s, -2);
        EXPECT_EQ(us, 0x1234);
        EXPECT_EQ(i, -2);
        EXPECT_EQ(ui, 16909060u);
        EXPECT_EQ(f, 1.0f);
        EXPECT_EQ(d, -2.5);
    };
    OxInput in(path.c_str(), kBinary);
    ASSERT_EQ(in.isGood(), OxTrue);
    EXPECT_EQ(in.getFileLength(), 29);
    char c = 0;
    unsigned char uc = 0;
    char text[4] = {};
    EXPECT_EQ(in.read(c), 1);
    EXPECT_EQ(in.read(uc), 1);
    readNumbers(in);
    EXPECT_EQ(in.read(text, 3), 3);
    EXPECT_EQ(in.getFilePosition(), 29);
    EXPECT_EQ(c, 'A');
    EXPECT_EQ(uc, 0xFE);
    EXPECT_STREQ(text, "xyz");
    EXPECT_EQ(in.eof(), OxFalse); // ended exactly at the end: no flag yet
    EXPECT_EQ(in.isGood(), OxTrue);

    // The same bytes from memory, with one byte more than the record.
    std::string copy = expected + '\0';
    OxMemory memory(reinterpret_cast<unsigned char*>(&copy[0]), copy.size());
    EXPECT_EQ(memory.seek(2, OxMemory::DIR_BEGIN), OxTrue);
    readNumbers(memory);
    EXPECT_EQ(taken(), Numbers{});

    // Swapping reverses the bit pattern; twice gives the value back.
    EXPECT_EQ(swapd(swapd(-2.5)), -2.5);
    float reversed = swapf(1.0f);
    unsigned char pattern[4];
    std::memcpy(pattern, &reversed, 4);
    EXPECT_EQ(std::string(reinterpret_cast<char*>(pattern), 4), bytes({0x3F, 0x80, 0, 0}));
}

TEST_F(IoTest, ReinterpretingAndWideReads) {
    oxtest::writeFile(dir.file("f.bin"), bytes({0x3F, 0x80, 0, 0, 0xFF, 0xFF, 0xFF, 0xFF}));
    OxInput in(dir.file("f.bin").c_str(), kBinary);
    float f = 0;
    int i = 0;
    long long wide = -1;
    EXPECT_EQ(in.read(f), 4);
    EXPECT_EQ(f, 1.0f);
    EXPECT_EQ(in.seek(0, 0), OxTrue);
    EXPECT_EQ(in.read(i), 4);
    EXPECT_EQ(i, 0x3F800000);
    EXPECT_EQ(in.read(wide), 4); // unsigned 32 bits, no sign extension
    EXPECT_EQ(wide, 4294967295LL);
    EXPECT_EQ(in.seek(-4, 2), OxTrue);
    EXPECT_EQ(in.getFilePosition(), 4);
    EXPECT_EQ(in.seek(-1, 1), OxTrue);
    EXPECT_EQ(in.getFilePosition(), 3);
    EXPECT_EQ(in.seek(-100, 0), OxFalse);
    EXPECT_EQ(taken(), Numbers{});
}

TEST_F(IoTest, EndOfFileProtocol) {
    oxtest::writeFile(dir.file("five.bin"), bytes({1, 2, 3, 4, 5}));
    const std::string name = dir.file("five.bin");
    {
        OxInput in(name.c_str(), kBinary);
        double d = 7.0;
        EXPECT_EQ(in.read(d), 5);
        EXPECT_EQ(d, 7.0);
        EXPECT_EQ(log.take(), (std::vector<std::string>{"m2 " + name, "m18", "m19"}));
        char c = 'q';
        EXPECT_EQ(in.read(c), 0);
        EXPECT_EQ(c, 'q');
        EXPECT_EQ(taken(), (Numbers{"2", "18", "19"}));
        EXPECT_EQ(in.eof(), OxTrue);
        EXPECT_EQ(in.isGood(), OxFalse);
        EXPECT_EQ(in.getFilePosition(), -1);
        EXPECT_EQ(in.seek(0, 0), OxTrue); // flags stay: reading still fails
        EXPECT_EQ(in.read(c), 0);
        EXPECT_EQ(taken(), (Numbers{"2", "18", "19"}));
        unsigned int stored = 9;
        char text[4];
        EXPECT_EQ(in.readUStoC(text, 2, stored), 0);
        EXPECT_EQ(stored, 0u);
        taken();
    }
    {
        // A block read short of its length: the bytes arrive but do not count.
        OxInput in(name.c_str(), kBinary);
        char buffer[8] = {};
        EXPECT_EQ(in.read(buffer, 8), 0);
        EXPECT_EQ(std::string(buffer, 5), bytes({1, 2, 3, 4, 5}));
        EXPECT_EQ(taken(), (Numbers{"2", "18", "19"}));
    }
    {
        // A record cut inside its second unit returns the bytes of that unit.
        OxInput in(name.c_str(), kBinary);
        char text[8];
        unsigned int stored = 0;
        EXPECT_EQ(in.readUStoC(text, 3, stored), 1);
        EXPECT_EQ(stored, 2u);
        EXPECT_EQ(taken(), (Numbers{"2", "18", "19"}));
    }
}

TEST_F(IoTest, CharacterRecordsAndLines) {
    oxtest::writeFile(dir.file("us.bin"), bytes({0x00, 0x41, 0x80, 0xC2, 0x41, 0xC2, 0x43, 0x44}));
    OxInput in(dir.file("us.bin").c_str(), kBinary);
    char text[8] = {};
    unsigned int stored = 0;
    EXPECT_EQ(in.readUStoC(text, 2, stored), 4);
    EXPECT_EQ(stored, 2u);
    EXPECT_EQ(std::string(text, 2), "AB");
    EXPECT_EQ(in.readDECUStoC(text, 3, stored), 2);
    EXPECT_EQ(stored, 3u);
    EXPECT_EQ(std::string(text, 4), "ABCD");
    EXPECT_EQ(in.readUStoC(text, 0, stored), 0);
    EXPECT_EQ(in.readDECUStoC(text, 0xFFFFFFFFu, stored), 0);
    EXPECT_EQ(stored, 0u);
    EXPECT_EQ(in.isGood(), OxTrue);

    oxtest::writeFile(dir.file("lines.txt"), "one\r\n0123456789\nlast");
    OxInput lines(dir.file("lines.txt").c_str(), kText);
    EXPECT_EQ(lines.getFileLength(), 20); // bytes, even in text mode
    char line[5];
    EXPECT_EQ(lines.getline(line, sizeof line, '\n'), OxTrue);
#ifdef _WIN32
    EXPECT_STREQ(line, "one"); // text mode reads CR LF as "\n"
#else
    EXPECT_STREQ(line, "one\r");
#endif
    EXPECT_EQ(lines.getline(line, sizeof line, '\n'), OxFalse);
    EXPECT_STREQ(line, "0123");
    EXPECT_EQ(lines.eof(), OxFalse);
    EXPECT_EQ(lines.getline(line, sizeof line, '\n'), OxFalse);

    OxInput last(dir.file("lines.txt").c_str(), kText);
    char big[32];
    EXPECT_EQ(last.getline(big, sizeof big), OxTrue);
    EXPECT_EQ(last.getline(big, sizeof big), OxTrue);
    EXPECT_EQ(last.getline(big, sizeof big), OxFalse); // no delimiter at the end
    EXPECT_STREQ(big, "last");
    EXPECT_EQ(last.eof(), OxTrue);
    EXPECT_EQ(taken(), Numbers{});
}

TEST_F(IoTest, HexDumpAndDumps) {
    oxtest::writeFile(dir.file("abc.bin"), "ABCDEFGHIJKLMNOP\x01RST");
    OxInput in(dir.file("abc.bin").c_str(), kBinary);
    std::ostrstream out;
    EXPECT_EQ(in.hexDump(&out), OxTrue);
    // Second row: 4 bytes, then the bar padded to the column of full rows.
    const std::string expected = "OxInput (Binary File):\n"
                                 "000000 41 42 43 44 45 46 47 48 49 4a 4b 4c 4d 4e 4f 50 "
                                 "| ABCDEFGHIJKLMNOP\n"
                                 "000010 01 52 53 54 " +
                                 std::string(36, ' ') + "| .RST            \n\n";
    EXPECT_EQ(oxtest::streamText(out), expected);
    EXPECT_EQ(in.getFilePosition(), 20);

    oxtest::writeFile(dir.file("empty.bin"), "");
    OxInput empty(dir.file("empty.bin").c_str(), kBinary);
    EXPECT_EQ(empty.isGood(), OxTrue);
    EXPECT_EQ(empty.getFileLength(), 0);
    std::ostrstream none;
    EXPECT_EQ(empty.hexDump(&none), OxFalse);
    EXPECT_EQ(oxtest::streamText(none), "");

    std::ostrstream d;
    EXPECT_EQ(in.dump(&d), &d);
    OxOutput o(dir.file("o.bin").c_str(), kBinary);
    o.dump(&d);
    static_cast<OxFile&>(o).OxFile::dump(&d);
    EXPECT_EQ(oxtest::streamText(d),
              "OxInput (Binary File):\nOxOutput (Binary File):\nOxFile (Binary File):\n");
    EXPECT_EQ(std::string(o.getFilename()), dir.file("o.bin"));
    EXPECT_EQ(taken(), Numbers{});
}

TEST_F(IoTest, BadInputIsReportedNotFatal) {
    const std::string missing = dir.file("missing.bin");
    OxInput none(missing.c_str(), kBinary);
    EXPECT_EQ(none.isGood(), OxFalse);
    EXPECT_EQ(none.getFileLength(), 0);
    EXPECT_EQ(log.take(), (std::vector<std::string>{"m1 " + missing, "m19"}));

    OxInput unnamed(nullptr, kBinary);
    OxOutput nameless("", kBinary);
    EXPECT_EQ(unnamed.isGood(), OxFalse);
    EXPECT_EQ(nameless.isGood(), OxFalse);
    EXPECT_EQ(nameless.write(1), OxFalse);
    EXPECT_EQ(taken(), (Numbers{"1", "19", "1", "19", "179"}));

    OxInput folder(dir.path().c_str(), kBinary); // a directory is no file
    EXPECT_EQ(folder.isGood(), OxFalse);
    EXPECT_EQ(taken(), (Numbers{"1", "19"}));
    OxInput nested(dir.file("no/such/dir/f.bin").c_str(), kText);
    EXPECT_EQ(nested.isGood(), OxFalse);
    EXPECT_EQ(taken(), (Numbers{"1", "19"}));

    // Truncated in the middle of a value: the count tells, nothing breaks.
    oxtest::writeFile(dir.file("cut.bin"), bytes({0x3F, 0xF0, 0x00}));
    OxInput cut(dir.file("cut.bin").c_str(), kBinary);
    double d = 0;
    short s = 0;
    EXPECT_EQ(cut.read(s) + cut.read(d), 3);
    EXPECT_EQ(s, 0x3FF0);
    EXPECT_EQ(d, 0.0);
    EXPECT_EQ(taken(), (Numbers{"2", "18", "19"}));

    // Unreadable file; a superuser reads it anyway, so only check when denied.
    const std::string locked = dir.file("locked.bin");
    oxtest::writeFile(locked, "data");
    ::chmod(locked.c_str(), 0);
    if (!std::ifstream(locked).is_open()) {
        OxInput denied(locked.c_str(), kBinary);
        EXPECT_EQ(denied.isGood(), OxFalse);
        EXPECT_EQ(taken(), (Numbers{"1", "19"}));
    }
    ::chmod(locked.c_str(), 0600);
}

TEST_F(IoTest, OutputPreparesItsDirectory) {
    const std::string base = dir.path();
    // The messages of opening and closing an output that must be good or not.
    auto opening = [&](const std::string& path, OxBool good) {
        {
            OxOutput out(path.c_str(), kBinary);
            EXPECT_EQ(out.isGood(), good) << path;
        }
        return taken();
    };
    EXPECT_EQ(opening(base + R"(\made\f.bin)", OxTrue), Numbers{}); // one missing level
    EXPECT_TRUE(std::filesystem::is_regular_file(dir.file("made/f.bin")));
    EXPECT_EQ(opening(base + R"(\a\b\f.bin)", OxFalse), Numbers{"180"}); // two missing levels
    EXPECT_FALSE(std::filesystem::exists(dir.file("a")));
    oxtest::writeFile(dir.file("plain"), "x");
    {
        OxOutput out((base + R"(\plain\f.bin)").c_str(), kBinary);
        EXPECT_EQ(out.isGood(), OxFalse);
        EXPECT_EQ(log.take(), std::vector<std::string>{"m181 " + base + R"(\plain)"});
    }
    EXPECT_EQ(opening(R"(\only-front.bin)", OxFalse), Numbers{"180"}); // empty directory part
    std::filesystem::create_directory(dir.file("made/taken"));
    // a directory in the way
    EXPECT_EQ(opening(base + R"(\made\taken)", OxFalse), Numbers{"182"});
    // An existing file is removed first: a second link keeps the old text.
    oxtest::writeFile(dir.file("made/old.txt"), "old");
    std::filesystem::create_hard_link(dir.file("made/old.txt"), dir.file("made/link.txt"));
    {
        OxOutput out((base + R"(\made\old.txt)").c_str(), kText);
        EXPECT_EQ(out.putline("new"), OxTrue);
        EXPECT_EQ(out.putline(static_cast<const char*>(nullptr)), OxTrue);
        EXPECT_EQ(out.putline(""), OxTrue);
        // flushed per line
        EXPECT_EQ(oxtest::readFile(dir.file("made/old.txt")), oxtest::textBytes("new\n\n"));
    }
    EXPECT_EQ(oxtest::readFile(dir.file("made/link.txt")), "old");
    // Without a separator nothing is removed: the truncation empties the file.
    std::filesystem::path home = std::filesystem::current_path();
    std::filesystem::current_path(dir.file("made"));
    EXPECT_EQ(opening("link.txt", OxTrue), Numbers{});
    std::filesystem::current_path(home);
    EXPECT_EQ(oxtest::readFile(dir.file("made/old.txt")), oxtest::textBytes("new\n\n"));
    EXPECT_EQ(oxtest::readFile(dir.file("made/link.txt")), "");
    EXPECT_EQ(taken(), Numbers{});
}

TEST_F(IoTest, OutputSeekAndFailedState) {
    const std::string path = dir.file("patch.bin");
    {
        OxOutput out(path.c_str(), kBinary);
        out.write(0);
        out.write(0);
        EXPECT_EQ(out.seek(2, 0), OxTrue);
        EXPECT_EQ(static_cast<long long>(std::streamoff(out.getFilePosition())), 2);
        out.write(static_cast<short>(0x0102));
        EXPECT_EQ(out.seek(-1, 2), OxTrue);
        out.write('z');
    }
    EXPECT_EQ(oxtest::readFile(path), bytes({0, 0, 1, 2, 0, 0, 0, 'z'}));

    if (!std::filesystem::exists("/dev/full")) {
        GTEST_SKIP() << "no /dev/full to fail writes";
    }
    OxOutput full("/dev/full", kText);
    ASSERT_EQ(full.isGood(), OxTrue);
    EXPECT_EQ(full.putline("lost"), OxFalse); // the flush fails
    EXPECT_EQ(taken(), (Numbers{"179", "20"}));
    EXPECT_EQ(full.write(1.0), OxFalse); // a failed stream stays failed
    EXPECT_EQ(taken(), (Numbers{"179", "20"}));
    // A block is handed over without a test; the stream adds its failure flag.
    EXPECT_EQ(full.write(const_cast<char*>("ab"), 2), OxFalse);
    EXPECT_EQ(taken(), (Numbers{"179", "19", "20"}));
    EXPECT_EQ(full.isGood(), OxFalse);
}

TEST_F(IoTest, OutputKeepsDevicesFifosAndLinkTargets) {
#ifdef _WIN32
    GTEST_SKIP() << "/dev/null, FIFOs and symbolic links are POSIX's";
#else
    struct stat status {};
    {
        OxOutput null("/dev/null", kBinary); // a directory part: the old file would go
        EXPECT_EQ(null.write(7), OxTrue);
        EXPECT_EQ(null.close(), OxTrue);
    }
    ASSERT_EQ(stat("/dev/null", &status), 0);
    EXPECT_TRUE(S_ISCHR(status.st_mode));

    // A FIFO is written through, not replaced; a reader is there first, so
    // that the open does not wait.
    const std::string fifo = dir.file("pipe");
    ASSERT_EQ(mkfifo(fifo.c_str(), 0600), 0);
    int reader = open(fifo.c_str(), O_RDONLY | O_NONBLOCK);
    ASSERT_GE(reader, 0);
    {
        OxOutput out(fifo.c_str(), kText);
        EXPECT_EQ(out.putline("through"), OxTrue);
    }
    char got[16] = {0};
    EXPECT_EQ(read(reader, got, sizeof got - 1), 8);
    EXPECT_STREQ(got, "through\n");
    close(reader);
    ASSERT_EQ(lstat(fifo.c_str(), &status), 0);
    EXPECT_TRUE(S_ISFIFO(status.st_mode));

    // A symbolic link is replaced itself; what it pointed to stays.
    oxtest::writeFile(dir.file("target.txt"), "keep");
    std::filesystem::create_symlink(dir.file("target.txt"), dir.file("link.txt"));
    {
        OxOutput out(dir.file("link.txt").c_str(), kText);
        EXPECT_EQ(out.putline("new"), OxTrue);
    }
    EXPECT_EQ(oxtest::readFile(dir.file("target.txt")), "keep");
    EXPECT_FALSE(std::filesystem::is_symlink(dir.file("link.txt")));
    EXPECT_EQ(oxtest::readFile(dir.file("link.txt")), "new\n");
    EXPECT_EQ(taken(), Numbers{});
#endif
}

TEST_F(IoTest, BufferedValuesReachTheFileOrTheirLossIsReported) {
    const std::string path = dir.file("values.bin");
    {
        OxOutput out(path.c_str(), kBinary);
        EXPECT_EQ(out.write(1), OxTrue);
        EXPECT_EQ(out.flush(), OxTrue);
        EXPECT_EQ(oxtest::readFile(path), bytes({0, 0, 0, 1}));
        EXPECT_EQ(out.write(static_cast<short>(2)), OxTrue);
        EXPECT_EQ(out.close(), OxTrue);
        EXPECT_EQ(out.isGood(), OxFalse);
        EXPECT_EQ(out.write(3), OxFalse); // closed: nothing more goes out
        EXPECT_EQ(out.close(), OxFalse);
    }
    EXPECT_EQ(oxtest::readFile(path), bytes({0, 0, 0, 1, 0, 2}));
    EXPECT_EQ(taken(), (Numbers{"179", "179"}));
}

TEST_F(IoTest, LossOfBufferedValuesIsReported) {
    if (!std::filesystem::exists("/dev/full")) {
        GTEST_SKIP() << "no /dev/full to fail writes";
    }
    // Values wait in the buffer and report success; the flush tells.
    {
        OxOutput full("/dev/full", kBinary);
        EXPECT_EQ(full.write(1.0), OxTrue);
        EXPECT_EQ(full.flush(), OxFalse);
        EXPECT_EQ(taken(), (Numbers{"179", "20"}));
        EXPECT_EQ(full.close(), OxFalse);
        EXPECT_EQ(taken(), (Numbers{"179", "19", "20"}));
    }
    EXPECT_EQ(taken(), Numbers{}); // closed already: the destructor is quiet
    {
        OxOutput full("/dev/full", kBinary);
        EXPECT_EQ(full.write(2.0), OxTrue);
    } // a clean stream whose final close fails names the file
    EXPECT_EQ(log.take(), std::vector<std::string>{"m183 /dev/full"});
}
