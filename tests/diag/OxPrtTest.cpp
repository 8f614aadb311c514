#include "oxbase/diag/OxPrt.h"
#include "oxbase/diag/OxMsg.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <cstring>
#include <iomanip>
#include <string>

namespace {

std::string takeText(OxPrt& prt) {
    char* text = prt.flushToString();
    std::string result = text != nullptr ? text : "<null>";
    delete[] text;
    return result;
}

std::string hexOf(const std::string& bytes, size_t offset) {
    OxPrt prt;
    OxPrt::printHex(prt.getStr(), reinterpret_cast<const unsigned char*>(bytes.data()),
                    bytes.size(), offset);
    return takeText(prt);
}

struct Seen {
    std::string text;
    int calls = 0;
};

void collect(const char* text, void* userData) {
    Seen* seen = static_cast<Seen*>(userData);
    seen->text += text;
    seen->calls++;
}

} // namespace

TEST(OxPrtTest, PrintHexRows) {
    const std::string row = "Hello world!!!!!";
    const std::string full =
        "000000 48 65 6c 6c 6f 20 77 6f 72 6c 64 21 21 21 21 21 | Hello world!!!!!\n";
    EXPECT_EQ(hexOf(row, 0), full);

    // 17 bytes: a full row, a row of one byte with the bar in the same column, an empty line.
    std::string text = hexOf(row + "?", 0);
    std::string second = "000010 3f " + std::string(45, ' ') + "| ?" + std::string(15, ' ') + "\n";
    EXPECT_EQ(text, full + second + "\n");

    // A first row that starts inside a row has no position column.
    EXPECT_EQ(hexOf("abc", 5), "61 62 63 " + std::string(24, ' ') + "| " + std::string(5, ' ') +
                                   "abc" + std::string(8, ' ') + "\n\n");
    EXPECT_EQ(hexOf("WXYZ", 14), "57 58 | " + std::string(14, ' ') + "WX\n" + "000010 59 5a " +
                                     std::string(42, ' ') + "| YZ" + std::string(14, ' ') + "\n\n");
    // Positions wider than six digits are not cut.
    EXPECT_EQ(hexOf(row, 0x1234560).substr(0, 8), "1234560 ");

    EXPECT_EQ(hexOf("", 0), "<null>");
    EXPECT_EQ(hexOf(std::string("\x7f\x80\x1f\x20\x41", 5), 0),
              "000000 7f 80 1f 20 41 " + std::string(33, ' ') + "| \x7f.. A" +
                  std::string(11, ' ') + "\n\n");

    // The stream is left in decimal with a blank fill.
    OxPrt prt;
    std::ostrstream* stream = prt.getStr();
    OxPrt::printHex(stream, reinterpret_cast<const unsigned char*>("\xff"), 1);
    *stream << 255 << std::setw(4) << 7;
    std::string dump = takeText(prt);
    EXPECT_EQ(dump.substr(dump.size() - 7), "255   7");
}

TEST(OxPrtTest, NotationOfFirstAndLaterStreams) {
    OxPrt prt;
    *prt.getStr() << 1.5;
    EXPECT_EQ(takeText(prt), "1.500000");
    *prt.getStr() << 1.5;
    EXPECT_EQ(takeText(prt), "1.5");

    prt.setDefaultFormat();
    *prt.getStr() << 1.5 << " " << std::hex << 255;
    EXPECT_EQ(takeText(prt), "1.500000 ff");

    prt.setDefaultFormat();
    prt.resetFormat();
    std::ios::fmtflags cleared =
        std::ios::floatfield | std::ios::basefield | std::ios::adjustfield | std::ios::showpoint;
    EXPECT_EQ(prt.getStr()->flags() & cleared, std::ios::fmtflags());
    *prt.getStr() << 2.0;
    EXPECT_EQ(takeText(prt), "2");

    // flushToString of an empty stream is null, and the next text starts clean.
    EXPECT_EQ(takeText(prt), "<null>");
    *prt.getStr() << "next";
    EXPECT_EQ(takeText(prt), "next");
}

TEST(OxPrtTest, FlushReachesCallbackAndLog) {
    Seen seen;
    {
        OxPrt prt;
        prt.setPrtCallback(collect);
        prt.setUserData(&seen);
        *prt.getStr() << "first";
        prt.flushPrt();
        prt.flushPrt(); // an empty stream goes the same way
        EXPECT_EQ(seen.text, "first");
        EXPECT_EQ(seen.calls, 2);
        *prt.getStr() << "quiet";
        EXPECT_EQ(takeText(prt), "quiet"); // flushToString reaches no callback
        EXPECT_EQ(seen.calls, 2);
        *prt.getStr() << "last";
    } // the destructor flushes what is left
    EXPECT_EQ(seen.text, "firstlast");
    EXPECT_EQ(seen.calls, 3);

    // With the message subsystem running, the text goes to its callback and log.
    oxtest::TempDir dir;
    Seen logged;
    testing::internal::CaptureStderr();
    {
        OxMsg msg("oxbase.msg", OXBASE_DATA_DIR, dir.file("prt.log").c_str(), nullptr);
        EXPECT_EQ(OxMsg::isValid(), OxTrue);
        OxMsg::setMsgCallback(collect);
        OxMsg::setMsgCallbackUserData(&logged);
        OxPrt prt;
        *prt.getStr() << "to the log\n";
        prt.flushPrt();
        OxPrt::trace() << "traced\n";
        OxPrt::flushTrace();
    }
    std::string err = testing::internal::GetCapturedStderr();
    EXPECT_EQ(logged.text, "to the log\ntraced\n");
    EXPECT_NE(err.find("to the log\n"), std::string::npos);
    EXPECT_NE(oxtest::readText(dir.file("prt.log")).find("to the log\ntraced\n"),
              std::string::npos);
}

TEST(OxPrtTest, TraceStreamIsRenewedWhenFlushed) {
    OxPrtInit();
    OxPrt::trace() << "trace line " << 1.5 << "\n";
    OxPrt::flushTrace(); // no message subsystem: dropped, and the stream is new
    std::ostrstream& after = OxPrt::trace();
    EXPECT_EQ(after.pcount(), 0);
    EXPECT_EQ(after.flags() & std::ios::fixed, std::ios::fmtflags());
}

TEST(OxPrtTest, FullAtTheBoundaryAndManyLargeFlushes) {
    Seen seen; // outlives the print object, whose destructor still flushes
    OxPrt prt;
    std::string block(2000000, 'x');
    prt.getStr()->write(block.data(), static_cast<std::streamsize>(block.size()));
    EXPECT_EQ(prt.isFull(), OxFalse);
    *prt.getStr() << 'y';
    EXPECT_EQ(prt.isFull(), OxTrue);
    EXPECT_EQ(takeText(prt).size(), 2000001u);
    EXPECT_EQ(prt.isFull(), OxFalse);

    prt.setPrtCallback(collect);
    prt.setUserData(&seen);
    std::string chunk(300000, 'z');
    for (int i = 0; i < 30; i++) { // half of them to the callback, half taken as text
        *prt.getStr() << chunk << chunk;
        if (i % 2 == 0) {
            prt.flushPrt();
        } else {
            EXPECT_EQ(takeText(prt).size(), 2 * chunk.size());
        }
    }
    EXPECT_EQ(seen.text.size(), 15 * 2 * chunk.size());
    EXPECT_EQ(seen.calls, 15);
}

TEST(OxPrtTest, FailedStreamStillGivesTerminatedText) {
    OxPrt prt;
    const char* missing = nullptr;
    *prt.getStr() << "ab";
    *prt.getStr() << missing; // sets the stream's bad bit
    EXPECT_EQ(takeText(prt), "ab");
    *prt.getStr() << missing;
    EXPECT_EQ(takeText(prt), "<null>");
}

TEST(OxPrtTest, IndentationBounds) {
    {
        OxPrt reset; // constructing a print object resets the indentation
    }
    EXPECT_EQ(OxPrt::getIndent(), 0);
    EXPECT_EQ(OxPrt::indent[0], '\0');
    char before = OxPrt::indent[1];
    OxPrt::adjustIndent(2);
    EXPECT_EQ(OxPrt::getIndent(), 2);
    EXPECT_EQ(OxPrt::indent[0], ' ');
    EXPECT_EQ(OxPrt::indent[2], '\0');
    EXPECT_EQ(OxPrt::indent[1], before);
    // Each step (set or adjust by) and the indentation after it: 0 to 40 only.
    const struct {
        bool set;
        int value;
        int indent;
    } steps[] = {{false, -2, 0}, {false, -1, 0}, {true, 40, 40}, {false, 1, 40},
                 {true, 41, 40}, {true, -1, 40}, {true, 3, 3}};
    for (const auto& step : steps) {
        step.set ? OxPrt::setIndent(step.value) : OxPrt::adjustIndent(step.value);
        EXPECT_EQ(OxPrt::getIndent(), step.indent) << step.set << " " << step.value;
    }

    // A dump line starts with curpos + 1 blanks, whatever the stream's fill.
    std::ostrstream stream;
    stream << std::setfill('*');
    oxIndent(stream) << "x";
    EXPECT_EQ(oxtest::streamText(stream), "    x");

    {
        OxPrt temporary; // a temporary print object sets the indentation back to 0
    }
    EXPECT_EQ(OxPrt::getIndent(), 0);
    EXPECT_EQ(OxPrt::indent[0], '\0');
}
