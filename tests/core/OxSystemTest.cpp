#include "oxbase/core/OxSystem.h"

#include <gtest/gtest.h>

#include <climits>
#include <cstdlib>
#include <cstring>
#include <string>

TEST(OxSystemTest, CopiesFollowTheCheckedRules) {
    char buffer[8];
    std::strcpy(buffer, "keep");
    EXPECT_EQ(OxSystem::strcpy(buffer, sizeof buffer, nullptr), nullptr);
    EXPECT_STREQ(buffer, "keep");
    EXPECT_EQ(OxSystem::strcat(buffer, sizeof buffer, nullptr), nullptr);
    EXPECT_STREQ(buffer, "keep");
    EXPECT_EQ(OxSystem::strncpy(buffer, sizeof buffer, nullptr, 3), nullptr);
    EXPECT_STREQ(buffer, "keep");
    EXPECT_EQ(OxSystem::strcpy(nullptr, 8, "x"), nullptr);

    EXPECT_EQ(OxSystem::strcpy(buffer, sizeof buffer, "1234567"), buffer);
    EXPECT_STREQ(buffer, "1234567");
    EXPECT_EQ(OxSystem::strcpy(buffer, sizeof buffer, "12345678"), nullptr);
    EXPECT_STREQ(buffer, ""); // a text that does not fit leaves the target empty

    std::strcpy(buffer, "ab");
    EXPECT_EQ(OxSystem::strcat(buffer, sizeof buffer, "cdefg"), buffer);
    EXPECT_STREQ(buffer, "abcdefg");
    EXPECT_EQ(OxSystem::strcat(buffer, sizeof buffer, "h"), nullptr);
    EXPECT_STREQ(buffer, "");

    std::memset(buffer, 'x', sizeof buffer);
    EXPECT_EQ(OxSystem::strncpy(buffer, sizeof buffer, "hello", 3), buffer);
    EXPECT_STREQ(buffer, "hel");
    EXPECT_EQ(OxSystem::strncpy(buffer, sizeof buffer, "hi", 5), buffer);
    EXPECT_EQ(std::string(buffer, 6), std::string("hi\0\0\0\0", 6));
    EXPECT_EQ(OxSystem::strncpy(buffer, 3, "hello", 3), nullptr);
    EXPECT_STREQ(buffer, "");
    // A count beyond the size stays inside the target.
    char small[4] = {'x', 'x', 'x', 'x'};
    EXPECT_EQ(OxSystem::strncpy(small, sizeof small, "ab", 100), small);
    EXPECT_STREQ(small, "ab");

    std::strcpy(buffer, "keep");
    EXPECT_EQ(OxSystem::sprintf(buffer, sizeof buffer, nullptr), 0);
    EXPECT_STREQ(buffer, "keep");
    EXPECT_EQ(OxSystem::sprintf(nullptr, 8, "%d", 1), 0);
    EXPECT_EQ(OxSystem::sprintf(buffer, sizeof buffer, "%d-%s", 42, "ab"), 5);
    EXPECT_STREQ(buffer, "42-ab");
    EXPECT_EQ(OxSystem::sprintf(buffer, sizeof buffer, "%s", "too long"), -1);
    EXPECT_STREQ(buffer, "");
}

TEST(OxSystemTest, TokensKeepTheirOwnPosition) {
    char first[] = "x y,z";
    EXPECT_STREQ(OxSystem::OxStrtok(first, " ,"), "x");
    EXPECT_EQ(OxSystem::OxStrtok(nullptr, nullptr), nullptr); // the position stays
    EXPECT_STREQ(OxSystem::OxStrtok(nullptr, " ,"), "y");

    char second[] = ",,p q";
    EXPECT_STREQ(OxSystem::OxStrtok(second, " ,"), "p"); // a new text forgets the first
    EXPECT_STREQ(OxSystem::OxStrtok(nullptr, " ,"), "q");
    EXPECT_EQ(OxSystem::OxStrtok(nullptr, " ,"), nullptr);
    EXPECT_EQ(OxSystem::OxStrtok(nullptr, " ,"), nullptr);
}

TEST(OxSystemTest, TimeAndErrorTextsUseTheirOwnBuffers) {
    const long long when = 1795043109; // 2026-11-18 23:05:09 UTC
    tm* utc = OxSystem::gmtime(&when);
    ASSERT_NE(utc, nullptr);
    char* text = OxSystem::asctime(utc);
    ASSERT_NE(text, nullptr);
    EXPECT_STREQ(text, "Wed Nov 18 23:05:09 2026\n");

    tm* local = OxSystem::localtime(&when);
    ASSERT_NE(local, nullptr);
    tm copy = *local;
    const long long other = 0;
    EXPECT_EQ(OxSystem::gmtime(&other), utc); // same static structure, not the local one
    EXPECT_EQ(utc->tm_year, 70);
    EXPECT_EQ(OxSystem::localtime(&when), local);
    EXPECT_EQ(local->tm_min, copy.tm_min);
    EXPECT_EQ(local->tm_hour, copy.tm_hour);

    char* local_text = OxSystem::ctime(&when);
    ASSERT_NE(local_text, nullptr);
    EXPECT_NE(local_text, text);
    EXPECT_STREQ(local_text, OxSystem::asctime(local));
    EXPECT_STREQ(text, local_text); // the asctime buffer now holds the local text

    tm invalid = copy;
    invalid.tm_mon = 12;
    EXPECT_EQ(OxSystem::asctime(&invalid), nullptr);
    EXPECT_EQ(OxSystem::asctime(nullptr), nullptr);
    EXPECT_EQ(OxSystem::ctime(nullptr), nullptr);
    EXPECT_EQ(OxSystem::gmtime(nullptr), nullptr);
    EXPECT_EQ(OxSystem::localtime(nullptr), nullptr);
    const long long huge = LLONG_MAX;
    EXPECT_EQ(OxSystem::gmtime(&huge), nullptr);
    EXPECT_EQ(OxSystem::ctime(&huge), nullptr);

    char* success = OxSystem::strerror(0);
    ASSERT_NE(success, nullptr);
    std::string saved = success;
    EXPECT_FALSE(saved.empty());
    char* other_error = OxSystem::strerror(2);
    EXPECT_EQ(other_error, success);
    EXPECT_NE(saved, other_error);
}

TEST(OxSystemTest, EnvironmentAndOperatingSystem) {
    const char* unset = "OXBASE_TEST_VARIABLE_NEVER_SET_4711";
    ASSERT_EQ(std::getenv(unset), nullptr);
    EXPECT_EQ(OxSystem::getenv(unset), nullptr);
    EXPECT_EQ(OxSystem::isEnvVarSet(unset), OxFalse);
    EXPECT_EQ(OxSystem::getenv(nullptr), nullptr);
    EXPECT_EQ(OxSystem::isEnvVarSet(nullptr), OxFalse);

    const char* path = std::getenv("PATH");
    ASSERT_NE(path, nullptr);
    char* value = OxSystem::getenv("PATH");
    ASSERT_NE(value, nullptr);
    EXPECT_STREQ(value, path);
    EXPECT_NE(value, path);
    delete[] value;
    EXPECT_EQ(OxSystem::isEnvVarSet("PATH"), OxTrue);

    EXPECT_EQ(static_cast<int>(OxSystem::OxOSWindows), 7);
    char* name = OxSystem::getOSName(); // host name, blank, system name, blank
    ASSERT_NE(name, nullptr);
    std::string text = name;
    delete[] name;
    EXPECT_NE(text[0], ' ');
#ifdef _WIN32
    EXPECT_EQ(static_cast<int>(OxSystem::getOS()), 7);
    // The computer name fits the 16 wide characters that are asked for.
    const std::string system = " Microsoft Windows ";
    ASSERT_GT(text.size(), system.size());
    EXPECT_LE(text.size() - system.size(), 15u);
    EXPECT_EQ(text.substr(text.size() - system.size()), system);
#else
    EXPECT_EQ(static_cast<int>(OxSystem::getOS()), 8); // OxOSLinux
    ASSERT_GT(text.size(), 7u);
    EXPECT_EQ(text.substr(text.size() - 7), " Linux ");
#endif
}

// The 64-bit time calls of the Windows runtime take 1970 to 3000 only; the
// POSIX calls go on before and after.
TEST(OxSystemTest, TimesOutsideTheRuntimeRange) {
    const long long before1970 = -86400;       // 1969-12-31 00:00:00 UTC
    const long long after3000 = 32535216000LL; // 3001-01-01 00:00:00 UTC
#ifdef _WIN32
    EXPECT_EQ(OxSystem::gmtime(&before1970), nullptr);
    EXPECT_EQ(OxSystem::localtime(&before1970), nullptr);
    EXPECT_EQ(OxSystem::ctime(&after3000), nullptr);
    EXPECT_EQ(OxSystem::gmtime(&after3000), nullptr);
    const long long last = after3000 - 1;
    tm* end = OxSystem::gmtime(&last);
    ASSERT_NE(end, nullptr);
    EXPECT_STREQ(OxSystem::asctime(end), "Wed Dec 31 23:59:59 3000\n");
#else
    tm* day = OxSystem::gmtime(&before1970);
    ASSERT_NE(day, nullptr);
    EXPECT_STREQ(OxSystem::asctime(day), "Wed Dec 31 00:00:00 1969\n");
    tm* later = OxSystem::gmtime(&after3000);
    ASSERT_NE(later, nullptr);
    EXPECT_STREQ(OxSystem::asctime(later), "Thu Jan  1 00:00:00 3001\n");
#endif
}
