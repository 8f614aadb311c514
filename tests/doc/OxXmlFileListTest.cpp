// Tests of the ".xml" filter of OxXmlFileList, directly and through walks.
#include "oxbase/doc/OxXmlFileList.h"
#include "support/OxTestSupport.h"

#include <algorithm>
#include <filesystem>
#include <gtest/gtest.h>
#include <string>
#include <vector>

class OxXmlFileListTestAccess {
public:
    static int filter(const char* path, OxFileTreeWalkType type, void* list) {
        return OxXmlFileList::filterXMLFileList(path, nullptr, type, list);
    }
};

namespace {

/// Whether the filter keeps `path` as a file.
bool kept(const char* path) {
    OxGList<char*> list;
    EXPECT_EQ(OxXmlFileListTestAccess::filter(path, OxFTWFile, &list), 0);
    bool result = list.getLength() == 1 && std::string(list[0]) == path;
    for (unsigned int i = 0; i < list.getLength(); i++) {
        delete[] list[i];
    }
    return result;
}

} // namespace

TEST(OxXmlFileListTest, FilterCases) {
    // Four characters behind the last "." of the whole path are compared,
    // with case; the first character of the path is not looked at.
    for (const char* yes : {"dir/model.xml", "dir/model.xmlx", "a.xml/model", "dir/.xml"}) {
        EXPECT_TRUE(kept(yes)) << yes;
    }
    for (const char* no :
         {"dir/model.XML", "dir/model.xml.bak", "dir.d/model", ".xml", "model", "model.xm"}) {
        EXPECT_FALSE(kept(no)) << no;
    }

    OxGList<char*> list;
    EXPECT_EQ(OxXmlFileListTestAccess::filter("x.xml", OxFTWDirectory, &list), 0);
    EXPECT_EQ(OxXmlFileListTestAccess::filter("x.xml", OxFTWUnreadableDir, &list), 0);
    EXPECT_EQ(list.getLength(), 0u);
    EXPECT_EQ(OxXmlFileListTestAccess::filter("x.xml", OxFTWFile, nullptr), -1);
    EXPECT_EQ(OxXmlFileListTestAccess::filter("x.xml", OxFTWDirectory, nullptr), 0);
}

TEST(OxXmlFileListTest, DirectoriesAndPlainNames) {
    oxtest::TempDir tmp;
    namespace fs = std::filesystem;
    fs::create_directories(tmp.file("parts/x.xml"));
    fs::create_directories(tmp.file("parts/a.xml"));
    oxtest::writeFile(tmp.file("parts/model.xml"), "<a/>");
    oxtest::writeFile(tmp.file("parts/model.XML"), "<a/>");
    oxtest::writeFile(tmp.file("parts/model.xml.bak"), "<a/>");
    oxtest::writeFile(tmp.file("parts/a.xml/model"), "<a/>");
    oxtest::writeFile(tmp.file("parts/x.xml/inner.xml"), "<a/>");
    std::string listFile = tmp.file("parts.lst");
    oxtest::writeFile(listFile, tmp.file("parts") + "\nplain.txt\n");

    OxXmlFileList list(listFile.c_str());
    EXPECT_EQ(list.readListFiles(), OxTrue);
    std::vector<std::string> got;
    const OxGList<char*>& names = list.getFileNameList();
    for (unsigned int i = 0; i < names.getLength(); i++) {
        got.push_back(names[i]);
    }
    ASSERT_EQ(got.size(), 4u);
    EXPECT_EQ(got.back(), "plain.txt"); // plain names are not filtered
    got.pop_back();
    std::sort(got.begin(), got.end());
    EXPECT_EQ(got,
              (std::vector<std::string>{tmp.file("parts/a.xml/model"), tmp.file("parts/model.xml"),
                                        tmp.file("parts/x.xml/inner.xml")}));

    OxXmlFileList direct;
    direct.add("model.XML");
    EXPECT_EQ(direct.getFileNameList().getLength(), 1u);
}
