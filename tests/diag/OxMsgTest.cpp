#include "oxbase/diag/OxMsg.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <cstring>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

namespace {
const char* const kMessages = "0 test messages\n"
                              "1,I,0Info %s\n"
                              "42,W,0Warning %d\n"
                              "3,E,0Error %s\n"
                              "4,S,0Severe\n"
                              "5,F,0Fatal\n"
                              "6,I,5Detail at level five\n"
                              "7,E,0Seven\n"
                              "12,I,0First line\n"
                              "12 second line\n"
                              "1000,W,0Wide\n"
                              "40,I,0Long %s\n";

void collect(const char* text, void* userData) {
    static_cast<std::vector<std::string>*>(userData)->push_back(text);
}

/// What `run` writes to standard error.
template <class Run> std::string stderrOf(Run run) {
    testing::internal::CaptureStderr();
    run();
    return testing::internal::GetCapturedStderr();
}

class OxMsgTest : public testing::Test {
protected:
    oxtest::TempDir dir;
    std::vector<std::string> callbackTexts;

    std::unique_ptr<OxMsg> start(const std::string& messages, const char* logName) {
        oxtest::writeFile(dir.file("test.msg"), messages);
        auto msg = std::make_unique<OxMsg>(dir.file("test.msg").c_str(), nullptr, logName,
                                           dir.path().c_str());
        OxMsg::setMsgCallback(collect);
        OxMsg::setMsgCallbackUserData(&callbackTexts);
        return msg;
    }
    /// Stops the running subsystem (every OxMsg stops it when it goes), starts
    /// one on `messages` and returns what went to standard error meanwhile.
    std::string restart(std::unique_ptr<OxMsg>& msg, const std::string& messages,
                        const char* logName = nullptr) {
        return stderrOf([&] {
            msg.reset();
            msg = start(messages, logName);
        });
    }
    std::string log() { return oxtest::readText(dir.file("run.log")); }
};
} // namespace

TEST_F(OxMsgTest, LevelsThresholdAndErrorCode) {
    auto msg = start(kMessages, "run.log");
    ASSERT_EQ(OxMsg::isValid(), OxTrue);
    EXPECT_EQ(OxMsg::getMessageThreshold(), 99);
    OxMsg::Log(6u);
    OxMsg::LogForce(6u);
    EXPECT_EQ(log(), "");
    OxMsg::setMessageThreshold(5);
    OxMsg::Log(6u);
    OxMsg::setMessageThreshold(6);
    OxMsg::Log(6u);
    EXPECT_EQ(log(), "  6I: Detail at level five\n");

    for (int in : {0, 100, -3, 50}) {
        OxMsg::setMessageThreshold(in);
        EXPECT_EQ(OxMsg::getMessageThreshold(), in < 1 ? 1 : (in > 99 ? 99 : in));
    }

    testing::internal::CaptureStderr();
    EXPECT_EQ(OxMsg::getErrorCode(), OxErrorNone);
    OxMsg::Log(3u, "x");
    EXPECT_EQ(OxMsg::getErrorCode(), OxErrorError);
    OxMsg::Log(42u, 1); // a warning does not lower the code
    EXPECT_EQ(OxMsg::getErrorCode(), OxErrorError);
    OxMsg::LogError(4u);
    EXPECT_EQ(OxMsg::getErrorCode(), OxErrorSevere);
    OxMsg::Log(5u);
    EXPECT_EQ(OxMsg::getErrorCode(), OxErrorFatal);
    OxMsg::resetErrorCode();
    OxMsg::Log(999u);
    EXPECT_EQ(OxMsg::getErrorCode(), OxErrorNone);
    std::string err = testing::internal::GetCapturedStderr();
    EXPECT_EQ(err, "Error x\nWarning 1\nSevere\nFatal\n There is no message at index 999\n");
    EXPECT_EQ(OxMsg::LogToString(3u, "y"), std::string("Error y"));
    EXPECT_EQ(OxMsg::LogToString(999u), nullptr);
    EXPECT_EQ(OxMsg::getErrorCode(), OxErrorNone);
}

TEST_F(OxMsgTest, RoutingOfInfoMessages) {
    auto msg = start(kMessages, "run.log");
    EXPECT_EQ(stderrOf([] { OxMsg::Log(1u, "quiet"); }), "");
    testing::internal::CaptureStderr();
    OxMsg::LogForce(1u, "forced");
    OxMsg::setVerboseState(OxTrue);
    OxMsg::Log(1u, "verbose");
    OxMsg::setVerboseState(OxFalse);
    msg->closeLogFile();
    EXPECT_EQ(msg->isLogFileOpen(), OxFalse);
    OxMsg::Log(1u, "no log");
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "Info forced\nInfo verbose\nInfo no log\n");
    EXPECT_EQ(log(), "  1I: Info quiet\n  1I: Info forced\n  1I: Info verbose\n");
    EXPECT_EQ(callbackTexts, (std::vector<std::string>{"Info quiet", "Info forced", "Info verbose",
                                                       "Info no log"}));

    // Finished texts: no number, no letter, no line end added.
    msg->openLogFile("second.log", dir.path().c_str());
    EXPECT_EQ(stderrOf([] {
                  OxMsg::Log("plain text|");
                  OxMsg::LogForce("forced text|");
              }),
              "forced text|");
    EXPECT_EQ(oxtest::readText(dir.file("second.log")), "plain text|forced text|");

    EXPECT_EQ(stderrOf([&msg] { msg->openLogFile("  ", nullptr); }),
              "Log file name is null.  No logging will be done.\n");
    EXPECT_EQ(msg->isLogFileOpen(), OxFalse);
}

TEST_F(OxMsgTest, FileFormatContinuationsWideNumbersAndLongTexts) {
    std::unique_ptr<OxMsg> msg;
    EXPECT_EQ(restart(msg, std::string(kMessages) + "30 no delimiter here\n", "run.log"),
              " No message delimiter in message number 30.  Setting message type to unknown.\n"
              " No message delimiter in message number 30.  Setting message level to default "
              "value.\n");
    OxMsg::Log(12u);
    OxMsg::Log(1000u);
    stderrOf([] { OxMsg::Log(30u); });
    // The unknown type logs a blank letter; the two delimiter reads took "n"
    // and "o", so the text is what follows them.
    EXPECT_EQ(log(), " 12I: First line\n\t second line\n1000W: Wide\n 30 :  delimiter here\n");

    // A formatted text beyond the first buffer size is logged whole.
    std::string big(60000, 'z');
    OxMsg::Log(40u, big.c_str());
    std::string written = log();
    EXPECT_NE(written.find(" 40I: Long " + big + "\n"), std::string::npos);
    EXPECT_EQ(callbackTexts.back(), "Long " + big);
    std::string huge(300000, 'h'); // several doublings
    EXPECT_EQ(std::string(OxMsg::LogToString(40u, huge.c_str())), "Long " + huge);
}

TEST_F(OxMsgTest, TextBeyondTheLargestBufferIsCut) {
    // The buffer doubles from 51,200 bytes while its size stays an int:
    // 51,200 * 2^15 is the last size, and a text that needs more is cut to it
    // (less its terminator) instead of the size running out of range.
    auto msg = start("8,I,0%1900000000s\n", nullptr);
    const char* text = OxMsg::LogToString(8u, "x");
    ASSERT_NE(text, nullptr);
    EXPECT_EQ(std::strlen(text), 51200u * 32768u - 1);
    EXPECT_EQ(text[0], ' ');
}

TEST_F(OxMsgTest, BadMessageFilesKeepWhatWasRead) {
    const std::string readError =
        "Error reading message file " + dir.file("test.msg") + " at line 2\n";
    std::unique_ptr<OxMsg> msg;
    EXPECT_EQ(restart(msg, "1,I,0Before\n" + std::string(6000, 'x') + "\n"), readError);
    ASSERT_EQ(OxMsg::isValid(), OxTrue);
    EXPECT_EQ(std::string(OxMsg::LogToString(1u, "")), "Before");

    std::string overlong = "1,I,0Kept\n2,I,0" + std::string(6000, 'y') + "\n3,I,0Lost\n";
    EXPECT_EQ(restart(msg, overlong), readError);
    EXPECT_EQ(std::string(OxMsg::LogToString(1u)), "Kept");
    // The text part of a line holds at most 5,119 characters.
    EXPECT_TRUE(std::string(OxMsg::LogToString(2u)) == std::string(5119, 'y'));
    stderrOf([] { EXPECT_EQ(OxMsg::LogToString(3u), nullptr); });

    // Binary garbage, NUL bytes, a missing final line end: no crash.
    const char raw[] = "7,E,0ok\n\x01\x02\0\xff,,,\n9";
    restart(msg, std::string(raw, sizeof raw - 1));
    EXPECT_EQ(std::string(OxMsg::LogToString(7u)), "ok");
    restart(msg, "8,E");
    EXPECT_EQ(OxMsg::isValid(), OxTrue);
}

TEST_F(OxMsgTest, StartUpFailuresAndLookup) {
    // Logging before any subsystem started does nothing, silently.
    EXPECT_EQ(stderrOf([] {
                  OxMsg::Log(1u, "x");
                  OxMsg::Log("text");
              }),
              "");
    EXPECT_EQ(stderrOf([] { OxMsg missing(nullptr, nullptr, nullptr, nullptr); }),
              "Message file name is NULL.\n");

    std::string cwd = std::filesystem::current_path().string();
    EXPECT_EQ(stderrOf([this] {
                  OxMsg absent("absent.msg", dir.path().c_str(), nullptr, nullptr);
                  EXPECT_EQ(OxMsg::isValid(), OxFalse);
                  OxMsg::Log("nothing");
              }),
              "Unable to open absent.msg\nTried " + dir.file("absent.msg") +
                  " and absent.msg,\nin current working directory, " + cwd + "\n");

    // A relative name is found in the directory argument, and the working
    // directory comes first when both have it.
    oxtest::TempDir other;
    oxtest::writeFile(other.file("app.msg"), "1,I,0from the directory\n");
    {
        OxMsg fromDir(" app.msg ", other.path().c_str(), nullptr, nullptr);
        EXPECT_EQ(std::string(OxMsg::LogToString(1u)), "from the directory");
    }
    oxtest::writeFile(dir.file("app.msg"), "1,I,0from the working directory\n");
    std::filesystem::current_path(dir.path());
    {
        OxMsg fromCwd("app.msg", other.path().c_str(), nullptr, nullptr);
        EXPECT_EQ(std::string(OxMsg::LogToString(1u)), "from the working directory");
    }
    std::filesystem::current_path(cwd);

    oxtest::writeFile(dir.file("test.msg"), kMessages);
    const std::string noDir = dir.file("no/such/dir");
    EXPECT_EQ(stderrOf([&] {
                  OxMsg badLog(dir.file("test.msg").c_str(), nullptr, "run.log", noDir.c_str());
                  EXPECT_EQ(OxMsg::isValid(), OxFalse);
              }),
              " Unable to open " + dir.file("no/such/dir/run.log") + "\n");

    // A second start while a failed one still stands reads into the same
    // table (its lines continue the known messages) and takes over what the
    // first took: nothing is leaked (LeakSanitizer watches the asan build).
    stderrOf([&] {
        OxMsg first(dir.file("test.msg").c_str(), nullptr, "run.log", noDir.c_str());
        OxMsg second(dir.file("test.msg").c_str(), nullptr, "run.log", noDir.c_str());
        EXPECT_EQ(OxMsg::isValid(), OxFalse);
    });
}

TEST_F(OxMsgTest, PlantedTextsNeverWriteOrReadMissingArguments) {
    // 1 and 566 are logged by the library ("s" and "suus"); 9 is the
    // application's own. The 566 continuation adds a fifth conversion.
    const char* planted = "1,E,0open %s %s %s\n"
                          "9,I,0count%-5hn here %s\n"
                          "3,E,0Full: 100%% of %s\n"
                          "566,E,0In %s line %u\n"
                          "566 offset %u: %s %s\n"
                          "293,E,0%1$s at %2$u\n"
                          "294,E,0%s %u-%u%%n\n";
    std::unique_ptr<OxMsg> msg;
    EXPECT_EQ(restart(msg, planted),
              " Message 9: a %n conversion in its text is refused and prints as %p.\n"
              " Message 1: its text does not fit the arguments the library passes; a safe text is "
              "used.\n"
              " Message 293: its text does not fit the arguments the library passes; a safe text "
              "is used.\n"
              " Message 566: its text does not fit the arguments the library passes; a safe text "
              "is used.\n");
    ASSERT_EQ(OxMsg::isValid(), OxTrue);
    EXPECT_STREQ(OxMsg::LogToString(1u, "a.xml"), "Message 1: a.xml");
    EXPECT_STREQ(OxMsg::LogToString(566u, "a.xml", 3u, 4u, "<x"), "Message 566: a.xml 3 4 <x");
    EXPECT_STREQ(OxMsg::LogToString(293u, "range", 2u, "1-"), "Message 293: range 2 1-");
    EXPECT_STREQ(OxMsg::LogToString(3u, "f"), "Full: 100% of f");
    EXPECT_STREQ(OxMsg::LogToString(294u, "range", 5u, 2u), "range 5-2%n");

    // The application's %n prints the pointer instead of writing through it,
    // and the conversion behind it still meets its own argument.
    int untouched = 12345;
    std::string counted = OxMsg::LogToString(9u, &untouched, "s");
    EXPECT_EQ(untouched, 12345);
    char expected[64];
    std::snprintf(expected, sizeof expected, "count%5p here s", static_cast<void*>(&untouched));
    EXPECT_EQ(counted, expected);
}

TEST_F(OxMsgTest, ManyMessagesInAnyOrderAndLongContinuations) {
    // Numbers descending, then a long run of continuations of two messages
    // that take turns: every record is found, every join is in file order.
    std::string messages;
    for (unsigned int n = 3000; n >= 100; n--) {
        messages += std::to_string(n) + ",I,0m" + std::to_string(n) + "\n";
    }
    std::string first = "a", second = "b";
    messages += "50,I,0a\n51,I,0b\n";
    for (int i = 0; i < 20000; i++) {
        std::string piece = std::to_string(i);
        messages += (i % 2 == 0 ? "50 " : "51 ") + piece + "\n";
        (i % 2 == 0 ? first : second) += "\n\t " + piece;
    }
    auto msg = start(messages, nullptr);
    for (unsigned int n = 100; n <= 3000; n += 7) {
        ASSERT_STREQ(OxMsg::LogToString(n), ("m" + std::to_string(n)).c_str());
    }
    EXPECT_EQ(std::string(OxMsg::LogToString(50u)), first);
    EXPECT_EQ(std::string(OxMsg::LogToString(51u)), second);
    stderrOf([] {
        EXPECT_EQ(OxMsg::LogToString(99u), nullptr);
        EXPECT_EQ(OxMsg::LogToString(3001u), nullptr);
    });
}

TEST(OxDefaultMessageFile, LoadsWithoutReports) {
    EXPECT_EQ(stderrOf([] {
                  OxMsg msg(oxtest::dataFile("oxbase.msg").c_str(), nullptr, nullptr, nullptr);
                  EXPECT_EQ(OxMsg::isValid(), OxTrue);
              }),
              "");
}
