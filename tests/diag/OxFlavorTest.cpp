#include "oxbase/diag/OxFlavor.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>

namespace {
// An OxFlavor over entries named `names` with the given ids; the table is
// released before the flavor is used, as a caller may do.
std::unique_ptr<OxFlavor>
makeFlavor(std::initializer_list<std::pair<const char*, unsigned int>> table) {
    OxGList<OxFlavorEntry*> list;
    for (const auto& row : table) {
        list.append(new OxFlavorEntry(row.first, row.second));
    }
    auto flavor = std::make_unique<OxFlavor>(list);
    for (unsigned int i = 0; i < list.getLength(); i++) {
        delete list[i];
    }
    return flavor;
}
} // namespace

TEST(OxFlavorTest, EntryKeepsItsOwnCopy) {
    char name[] = "verbose";
    OxFlavorEntry entry(name, 7);
    name[0] = 'X';
    EXPECT_STREQ(entry.getName(), "verbose");
    EXPECT_EQ(oxtest::dumpText(entry), "Flavor ID = 7, name = \"verbose\"\n");

    OxFlavorEntry missing(nullptr, 5);
    EXPECT_EQ(missing.getName(), nullptr);
    EXPECT_EQ(missing.getID(), 0u);
    EXPECT_EQ(oxtest::dumpText(missing), "");

    OxFlavorEntry empty("", 3);
    EXPECT_EQ(empty.getName(), nullptr);
    EXPECT_EQ(oxtest::dumpText(empty), "");
}

TEST(OxFlavorTest, NumbersArePositionsNotIds) {
    std::unique_ptr<OxFlavor> flavor = makeFlavor({{"first", 10}, {"second", 20}});
    EXPECT_EQ(flavor->getNbEntries(), 2u);
    EXPECT_EQ(flavor->addFlavor("second"), OxTrue);
    EXPECT_EQ(flavor->isSet(1), OxTrue);
    EXPECT_EQ(flavor->isSet(20), OxFalse);
    EXPECT_EQ(flavor->isSet(0), OxFalse);

    // Activating by number is not checked against the entries.
    flavor->addFlavor(20u);
    EXPECT_EQ(flavor->isSet(20), OxTrue);
}

TEST(OxFlavorTest, ActivationByNameAndNumber) {
    std::unique_ptr<OxFlavor> flavor = makeFlavor({{"alpha", 0}, {"beta", 1}, {"gamma", 2}});
    EXPECT_EQ(flavor->addFlavor("gamma"), OxTrue);
    EXPECT_EQ(flavor->addFlavor("gamma"), OxTrue);
    flavor->addFlavor(2u);
    flavor->addFlavor(0u);
    // Names compare exactly; unknown and null names change nothing.
    EXPECT_EQ(flavor->addFlavor("Beta"), OxFalse);
    EXPECT_EQ(flavor->addFlavor("bet"), OxFalse);
    EXPECT_EQ(flavor->addFlavor(nullptr), OxFalse);
    EXPECT_EQ(flavor->isSet(1), OxFalse);
    // Each number once, in order of activation.
    EXPECT_EQ(oxtest::dumpText(*flavor), "Active flavors:\n  gamma\n  alpha\n");

    flavor->clear();
    for (unsigned int n = 0; n < 4; n++) {
        EXPECT_EQ(flavor->isSet(n), OxFalse) << n;
    }
    EXPECT_EQ(oxtest::dumpText(*flavor), "");
    EXPECT_EQ(flavor->addFlavor("beta"), OxTrue);
    EXPECT_EQ(oxtest::dumpText(*flavor), "Active flavors:\n  beta\n");
}

TEST(OxFlavorTest, EntriesWithoutNameAndNumbersWithoutEntry) {
    OxFlavorEntry named("shown", 0);
    OxFlavorEntry unnamed("", 1);
    OxGList<OxFlavorEntry*> list;
    list.append(&named);
    list.append(nullptr);
    list.append(&unnamed);
    OxFlavor flavor(list);
    EXPECT_EQ(flavor.getNbEntries(), 3u);
    EXPECT_EQ(flavor.addFlavor(""), OxFalse);
    EXPECT_EQ(flavor.addFlavor("shown"), OxTrue);
    flavor.addFlavor(1u);
    flavor.addFlavor(2u);
    flavor.addFlavor(3u); // at the end: no range report
    EXPECT_EQ(oxtest::dumpText(flavor), "Active flavors:\n  shown\n  <null>\n  <null>\n  <null>\n");

    // Beyond the end the list reports the access on standard output.
    flavor.addFlavor(9u);
    testing::internal::CaptureStdout();
    std::string text = oxtest::dumpText(flavor);
    EXPECT_EQ(testing::internal::GetCapturedStdout(),
              "Ooops, trying to access element 9 in OxList of length 3\n");
    EXPECT_EQ(text.substr(text.size() - 9), "  <null>\n");
}
