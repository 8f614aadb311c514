// A comment longer than the reader's long-text threshold (1 MiB) takes the
// path where the gathered text is handed to its node without a copy.
#include "oxbase/doc/OxXmlFile.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <string>

TEST(OxXmlLongText, LongCommentRoundTripsExactly) {
    oxtest::TempDir dir;
    std::string document = "<?xml version=\"1.0\"?>\n<!-- start of a long comment\n";
    for (int i = 0; i < 40000; i++) {
        document += "line " + std::to_string(i) + " of the comment, kept as it stands\n";
    }
    document += "end -->\n<root id=\"1\"/>\n";
    ASSERT_GT(document.size(), 1u << 20);
    oxtest::writeFile(dir.file("in.xml"), document);

    OxXmlFile in(dir.file("in.xml").c_str(), OxFile::OxIOInput);
    ASSERT_EQ(in.readFile(), OxTrue);
    ASSERT_NE(in.getRoot(), nullptr);
    EXPECT_EQ(in.getRoot()->isNamed("root"), OxTrue);
    in.open(dir.file("out.xml").c_str(), OxFile::OxIOOutput);
    ASSERT_EQ(in.writeFile(), OxTrue);
    EXPECT_TRUE(oxtest::readText(dir.file("out.xml")) == document);
}
