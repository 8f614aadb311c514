// The lint of `oxtool check`: each cause on a small document, with its line,
// and the recall over a generated corpus of adversarial documents: every
// document that reads without error but whose write, read and write again
// does not give back the bytes of the first write draws a lint warning.
#include "tool/OxToolRun.h"

#include "oxbase/doc/OxXmlFile.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <iostream>
#include <map>
#include <random>
#include <set>

using oxtest::contains;
using oxtest::oxtool;

namespace {

const std::string kDeclaration = "<?xml version=\"1.0\"?>\n";

/// The report of `oxtool check` on one document of `text`.
std::string checkText(const std::string& name, const std::string& text, int* status = nullptr) {
    oxtest::TempDir dir;
    oxtest::writeFile(dir.file(name), text);
    oxtest::CommandResult result = oxtool("check " + name, dir.path());
    if (status != nullptr) {
        *status = result.status;
    }
    return result.out;
}

// ---------------------------------------------------------------------------
// The corpus

/// Documents built at random from the constructs the reader and writer
/// handle unevenly; `safe` leaves out every construct that is lossy.
class Corpus {
public:
    Corpus(unsigned int seed, bool safeOnly) : random(seed), safe(safeOnly) {}

    std::string document() {
        std::string text;
        newline = chance(10) && !safe ? "\r\n" : "\n";
        if (!safe && chance(4)) {
            text += "\xEF\xBB\xBF";
        }
        text += declaration();
        if (chance(12)) {
            text += doctype();
        }
        if (chance(20)) {
            text += comment(0) + newline;
        }
        text += element(0, pick(1, 4));
        if (chance(10)) {
            text += comment(0) + newline;
        }
        if (!safe && chance(4)) {
            text += "<second/>" + newline;
        }
        return text;
    }

private:
    bool chance(int percent) { return pick(0, 99) < percent; }
    int pick(int low, int high) { return std::uniform_int_distribution<int>(low, high)(random); }

    std::string name() {
        static const char* const names[] = {"part", "mesh", "a", "node", "xsi:type", "v_2"};
        std::string text = names[pick(0, 5)];
        return !safe && chance(2) ? text + "\tx" : text;
    }

    std::string word() {
        static const char* const words[] = {"1.0 2.0 3.0", "steel", "a b", "&amp;",
                                            "x>y",         "1-4",   "-",   "0.5"};
        return words[pick(0, 7)];
    }

    std::string lossyWord() {
        static const char* const words[] = {"say \"hi\"",    "a<b", "1-4294967296",
                                            "3,99999999999", "",    "'"};
        return words[pick(0, 5)];
    }

    std::string declaration() {
        if (safe || chance(75)) {
            return "<?xml version=\"1.0\" encoding=\"UTF-8\"?>" + newline;
        }
        switch (pick(0, 3)) {
        case 0:
            return "<?xml version=\"1.0\"?><!-- behind -->" + newline;
        case 1:
            return "<?xml version=\"1.0\"?> <extra/>" + newline;
        case 2:
            return "<?xml version=\"1.0\"" + newline + "  encoding=\"UTF-8\"?>" + newline;
        default:
            return "<?xml version='1.0'?>" + newline;
        }
    }

    std::string doctype() {
        if (safe) {
            return "<!DOCTYPE assembly SYSTEM \"a.dtd\">" + newline;
        }
        switch (pick(0, 2)) {
        case 0:
            return "<!DOCTYPE assembly>" + newline;
        case 1:
            return "<!DOCTYPE assembly><!-- c -->" + newline;
        default:
            return "<!DOCTYPE assembly [" + newline + "  <!ENTITY e \"x\">" + newline + "]>" +
                   newline;
        }
    }

    std::string comment(int depth) {
        std::string pad(static_cast<size_t>(depth), ' ');
        if (safe || chance(50)) {
            return pad + (chance(50) ? "<!-- note -->" : "<![CDATA[raw text]]>");
        }
        switch (pick(0, 3)) {
        case 0:
            return pad + "<!-- first" + newline + pad + "   second -->";
        case 1:
            return pad + "<![CDATA[" + newline + pad + "    indented" + newline + pad + "]]>";
        case 2:
            return pad + "<!-- a --> <tail/>";
        default:
            return pad + "<![CDATA[x]]>" + (chance(50) ? "</y>" : "");
        }
    }

    std::string attributes(bool lossy) {
        std::string text;
        int count = pick(0, 3);
        for (int i = 0; i < count; i++) {
            std::string value = lossy && chance(30) ? lossyWord() : word();
            bool single = value.find('"') != std::string::npos || (!safe && chance(10));
            if (value.find('\'') != std::string::npos) {
                single = false;
                if (value.find('"') != std::string::npos) {
                    continue;
                }
            }
            char quote = single ? '\'' : '"';
            text += " k" + std::to_string(i) + "=" + quote + value + quote;
        }
        if (lossy && chance(10)) {
            text += " list=\"1 2" + newline + "   3 4\"";
        }
        return text;
    }

    std::string element(int depth, int children) {
        bool lossy = !safe;
        std::string pad(static_cast<size_t>(depth % 7), ' ');
        std::string tag = name();
        int form = pick(0, 9);
        if (depth > 3 && chance(70)) {
            form = 0; // leaves get likelier as the tree deepens
        }
        if (depth >= 25) {
            form = 1;
        }
        if (form == 0 || children == 0) {
            // A leaf: empty, or with a text value.
            if (chance(40)) {
                return pad + "<" + tag + attributes(lossy) + (chance(50) ? "/>" : " />") + newline;
            }
            std::string value = lossy && chance(20) ? lossyWord() : word();
            if (value.empty() || value.find('<') != std::string::npos) {
                value = "v";
            }
            std::string attrs = lossy && chance(25) ? attributes(lossy) : "";
            if (lossy && chance(5)) {
                value = std::string(static_cast<size_t>(pick(1000, 5000)), 'x');
            }
            if (lossy && chance(10)) {
                return pad + "<" + tag + attrs + ">" + newline + pad + value + "</" + tag + ">" +
                       newline;
            }
            return pad + "<" + tag + attrs + ">" + value + "</" + tag + ">" + newline;
        }
        std::string text = pad + "<" + tag + attributes(lossy) + ">";
        if (lossy && chance(10)) {
            text += comment(0); // shares its line with the start tag
        }
        text += newline;
        for (int i = 0; i < children; i++) {
            if (chance(15)) {
                text += comment(depth + 1) + newline;
            }
            int next = depth >= 24 || chance(35) ? 0 : pick(1, 3);
            if (chance(3) && depth < 3) {
                for (int d = depth + 1; d < depth + 26; d++) {
                    text += std::string(static_cast<size_t>(d % 7), ' ') + "<deep>" + newline;
                }
                text += element(depth + 26, 0);
                for (int d = depth + 25; d > depth; d--) {
                    text += std::string(static_cast<size_t>(d % 7), ' ') + "</deep>" + newline;
                }
                continue;
            }
            text += element(depth + 1, next);
        }
        if (lossy && chance(5)) {
            text += pad + "tail text" + newline;
        }
        std::string end = lossy && chance(4) ? "other" : tag;
        return text + pad + "</" + end + ">" + newline;
    }

    std::mt19937 random;
    bool safe;
    std::string newline = "\n";
};

/// Whether the library reads `path` without error, and whether its write,
/// read and write again give back the first write's bytes.
struct RoundTrip {
    bool read = false;
    bool stable = true;
};

RoundTrip roundTrip(const std::string& path, const oxtest::TempDir& scratch) {
    RoundTrip result;
    OxXmlFile document(path.c_str(), OxFile::OxIOInput);
    result.read = document.readFile() == OxTrue;
    if (!result.read) {
        return result;
    }
    std::string first = scratch.file("first.xml");
    std::string second = scratch.file("second.xml");
    document.open(first.c_str(), OxFile::OxIOOutput);
    document.writeFile();
    OxXmlFile again(first.c_str(), OxFile::OxIOInput);
    again.readFile();
    again.open(second.c_str(), OxFile::OxIOOutput);
    again.writeFile();
    result.stable = oxtest::readFile(first) == oxtest::readFile(second);
    return result;
}

/// The lint causes `oxtool check` reported, by document name.
std::map<std::string, std::set<std::string>> lintByDocument(const std::string& report) {
    std::map<std::string, std::set<std::string>> found;
    size_t start = 0;
    while (start < report.size()) {
        size_t end = report.find('\n', start);
        std::string line = report.substr(start, end == std::string::npos ? end : end - start);
        start = end == std::string::npos ? report.size() : end + 1;
        size_t tag = line.rfind("[lint:");
        size_t name = line.find(".xml");
        if (tag != std::string::npos && name != std::string::npos) {
            size_t begin = line.find_last_of("/\\", name);
            begin = begin == std::string::npos ? 0 : begin + 1;
            found[line.substr(begin, name + 4 - begin)].insert(
                line.substr(tag + 6, line.size() - tag - 7));
        }
    }
    return found;
}

} // namespace

TEST(OxToolLint, EachCauseWithItsLine) {
    struct Case {
        const char* document;
        const char* expected; ///< "LINE: ... [lint:CAUSE]" in the report
    };
    const Case cases[] = {
        {"<r>\n <a b=\"1\">x</a>\n</r>\n", ":3: warning: <a> has a text value and 1 attribute"},
        {"<r>\n<a><!-- c --></a>\n</r>\n", ":3: warning: the text '</a>' behind the end"},
        {"<r>\n<a><!-- c --></a>\n</r>\n", ":3: warning: the comment inside <a> shares its line"},
        {"<r a='say \"hi\"'/>\n", ":2: warning: attribute a of <r> holds a double quote"},
        {"<r a=\"\"/>\n", ":2: warning: attribute a of <r> has an empty value"},
        {"<r pages=\"1-4294967296\"/>\n", "wraps past 4294967295 to 0 [lint:range-wraps]"},
        {"<!DOCTYPE r><r/>\n", ":2: warning: the markup '<r/>' behind the DOCTYPE"},
        {"<!DOCTYPE r [\n<!ENTITY e \"x\">\n]>\n<r/>\n",
         ":2: warning: the DOCTYPE has an internal"},
        {"<r>\n<![CDATA[a\n   b]]>\n</r>\n", ":3: warning: the white space at the ends"},
    };
    for (const Case& c : cases) {
        std::string report = checkText("doc.xml", kDeclaration + c.document);
        EXPECT_TRUE(contains(report, c.expected)) << c.document << "\n" << report;
    }
    // The declaration's own line.
    std::string behind = checkText("d.xml", "<?xml version=\"1.0\"?><r/>\n");
    EXPECT_TRUE(contains(behind, "d.xml:1: warning: the markup '<r/>' behind the declaration"))
        << behind;
    std::string open = checkText("d.xml", "<?xml version=\"1.0\"\nencoding=\"UTF-8\"?>\n<r/>\n");
    EXPECT_TRUE(contains(open, "[lint:declaration-unterminated]")) << open;
    std::string bom = checkText("d.xml", "\xEF\xBB\xBF" + kDeclaration + "<r/>\n");
    EXPECT_TRUE(contains(bom, "d.xml:1: warning: the text ")) << bom;
    // A clean document draws nothing, status 0.
    int status = -1;
    std::string clean =
        checkText("c.xml", kDeclaration + "<r a=\"1\">\n <b>x</b>\n <!-- c -->\n</r>\n", &status);
    EXPECT_FALSE(contains(clean, "[lint:")) << clean;
    EXPECT_EQ(status, 0);
    // CSV: holes, quoted separators and comment lines, each at its record.
    std::string csv = checkText("t.csv", "# parts\nid,name,mass\n1,,2.5\n2,\"a,b\",3\n3,x,1\n");
    EXPECT_TRUE(contains(csv, "t.csv:3: warning: the record's field 2 (name) is empty")) << csv;
    EXPECT_TRUE(contains(csv, "t.csv:4: warning: the quoted field '\"a'")) << csv;
    EXPECT_TRUE(contains(csv, "t.csv:1: warning: 1 comment line(s)")) << csv;
    EXPECT_FALSE(contains(csv, "t.csv:5:")) << csv;
}

TEST(OxToolLint, RecallOverAGeneratedCorpus) {
    oxtest::TempDir dir;
    oxtest::TempDir scratch;
    std::filesystem::create_directory(dir.file("corpus"));
    std::filesystem::create_directory(dir.file("safe"));
    const int kDocuments = 600;
    const int kSafe = 60;
    Corpus corpus(20201, false);
    for (int i = 0; i < kDocuments; i++) {
        oxtest::writeFile(dir.file("corpus/doc" + std::to_string(1000 + i) + ".xml"),
                          corpus.document());
    }
    Corpus safe(7, true);
    for (int i = 0; i < kSafe; i++) {
        oxtest::writeFile(dir.file("safe/doc" + std::to_string(1000 + i) + ".xml"),
                          safe.document());
    }

    oxtest::CommandResult result = oxtool("check corpus --jobs 2", dir.path());
    ASSERT_TRUE(contains(result.out, "checked " + std::to_string(kDocuments) + " files"))
        << result.out.substr(result.out.size() > 300 ? result.out.size() - 300 : 0) << result.err;
    std::map<std::string, std::set<std::string>> lint = lintByDocument(result.out);

    int read = 0;
    int changed = 0;
    int flagged = 0;
    int generic = 0;
    int stableFlagged = 0;
    for (int i = 0; i < kDocuments; i++) {
        std::string name = "doc" + std::to_string(1000 + i) + ".xml";
        RoundTrip trip = roundTrip(dir.file("corpus/" + name), scratch);
        read += trip.read ? 1 : 0;
        if (!trip.read) {
            continue;
        }
        bool warned = lint.count(name) > 0;
        if (!trip.stable) {
            changed++;
            flagged += warned ? 1 : 0;
            generic += warned && lint[name] == std::set<std::string>{"round-trip"} ? 1 : 0;
            EXPECT_TRUE(warned) << name << " changes on a second round trip without a warning:\n"
                                << oxtest::readFile(dir.file("corpus/" + name));
        } else {
            stableFlagged += warned ? 1 : 0;
        }
    }
    std::cout << "lint recall: " << kDocuments << " documents, " << read << " read, " << changed
              << " change on a second round trip, " << flagged << " of them warned (" << generic
              << " by the generic warning only); " << stableFlagged
              << " stable documents warned of a first-write loss\n";
    // The corpus must exercise the property: enough documents read and enough change.
    EXPECT_GT(read, kDocuments / 2);
    EXPECT_GT(changed, 30);
    EXPECT_EQ(flagged, changed);

    // Documents of safe constructs only: no lint warning at all.
    oxtest::CommandResult safeResult = oxtool("check safe", dir.path());
    EXPECT_EQ(safeResult.status, 0) << safeResult.out;
    EXPECT_FALSE(contains(safeResult.out, "[lint:")) << safeResult.out;
    EXPECT_TRUE(contains(safeResult.out, "checked " + std::to_string(kSafe) + " files"));
}
