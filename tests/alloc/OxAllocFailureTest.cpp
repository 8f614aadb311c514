// Allocation failure, injected: this program replaces the global operator
// new so that the N-th allocation of an operation fails, for every N until
// the operation runs through. Each run must end with a clear result (the
// failure result and the fatal line, or a complete success), no crash, and
// every block given back once the objects are gone.
#include "oxbase/core/OxString.h"
#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"
#include "oxbase/doc/OxCsvFile.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/doc/OxXmlFile.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <functional>
#include <memory>
#include <new>
#include <optional>
#include <string>

namespace {
long long armedAt = 0;    ///< the allocation that fails; 0 while disarmed
long long counted = 0;    ///< allocations since arming
long long liveBlocks = 0; ///< blocks handed out and not yet freed

/// A block of `size` bytes; the armed allocation of a throwing form fails.
/// The nothrow forms never fail here: callers that use them (the standard
/// library's temporary buffers) fall back to work without the block, which
/// is not the failure under test.
void* allocate(std::size_t size, bool mayFail = true) {
    if (mayFail && armedAt > 0 && ++counted == armedAt) {
        throw std::bad_alloc();
    }
    void* block = std::malloc(size != 0 ? size : 1);
    if (block == nullptr) {
        throw std::bad_alloc();
    }
    liveBlocks++;
    return block;
}

void release(void* block) noexcept {
    if (block != nullptr) {
        liveBlocks--;
        std::free(block);
    }
}
} // namespace

void* operator new(std::size_t size) {
    return allocate(size);
}
void* operator new[](std::size_t size) {
    return allocate(size);
}
void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
    try {
        return allocate(size, false);
    } catch (const std::bad_alloc&) {
        return nullptr;
    }
}
void* operator new[](std::size_t size, const std::nothrow_t&) noexcept {
    try {
        return allocate(size, false);
    } catch (const std::bad_alloc&) {
        return nullptr;
    }
}
void operator delete(void* block) noexcept {
    release(block);
}
void operator delete[](void* block) noexcept {
    release(block);
}
void operator delete(void* block, std::size_t) noexcept {
    release(block);
}
void operator delete[](void* block, std::size_t) noexcept {
    release(block);
}
void operator delete(void* block, const std::nothrow_t&) noexcept {
    release(block);
}
void operator delete[](void* block, const std::nothrow_t&) noexcept {
    release(block);
}

namespace {

const char* const kFatal = "FATAL: Dynamic storage allocation failure.\n";

/// Arms the failure of allocation `n` of what follows (counted from 1) for
/// the life of the object.
class Armed {
public:
    explicit Armed(long long n) {
        counted = 0;
        armedAt = n;
    }
    ~Armed() { armedAt = 0; }
    Armed(const Armed&) = delete;
    Armed& operator=(const Armed&) = delete;
    /// Whether the armed allocation was reached (and so failed).
    static bool reached() { return armedAt > 0 && counted >= armedAt; }
};

/// Calls `once(n)` for n = 1, 2, ...: a run arms the failure of its n-th
/// allocation around the operation under test, checks the result and answers
/// whether the failure was reached. Ends after the first run that was not
/// reached (the operation ran through). No run may keep a block.
void untilItRunsThrough(const std::function<bool(long long n)>& once) {
    {
        // An allocation of the library itself must reach this program's
        // operator new. It does not under valgrind, which replaces it, nor
        // with the Windows DLL, which carries its own static C++ runtime and
        // so its own operator new.
        Armed probe(1000000);
        std::unique_ptr<char[]> text(OxString::dup("probe"));
        if (counted == 0) {
            GTEST_SKIP() << "the library's operator new is not this program's (valgrind "
                            "replaces it; a Windows DLL has its own): nothing can be made to fail";
        }
    }
    once(1000000); // unarmed in effect: lazy statics are made before counting
    for (long long n = 1; n < 100000; n++) {
        long long before = liveBlocks;
        bool reached = once(n);
        EXPECT_EQ(liveBlocks, before) << "blocks kept when allocation " << n << " failed";
        if (!reached) {
            EXPECT_GT(n, 1) << "no allocation to fail";
            return;
        }
    }
    FAIL() << "the operation never ran through";
}

const char* const kDocument = "<?xml version=\"1.0\"?>\n"
                              "<!-- parts of an assembly -->\n"
                              "<assembly name=\"gear box\">\n"
                              " <part id=\"1\" vec3d=\"1 2 3\"/>\n"
                              " <part id=\"2\" note=\"a value over\n"
                              "  two lines\">\n"
                              "  <!-- a note\n   over two lines -->\n"
                              "  <material>steel</material>\n"
                              " </part>\n"
                              "</assembly>\n";

TEST(AllocFailure, XmlReadGivesTheWholeDocumentOrNone) {
    oxtest::TempDir dir;
    oxtest::writeFile(dir.file("a.xml"), kDocument);
    untilItRunsThrough([&](long long n) {
        OxBool result = OxFalse;
        bool reached = false;
        bool empty = false;
        testing::internal::CaptureStderr();
        {
            OxXmlFile file(dir.file("a.xml").c_str(), OxFile::OxIOInput);
            {
                Armed armed(n);
                result = file.readFile();
                reached = Armed::reached();
            }
            empty = file.getRoot() == nullptr;
        }
        std::string reports = testing::internal::GetCapturedStderr();
        EXPECT_EQ(result, reached ? OxFalse : OxTrue) << n;
        EXPECT_EQ(empty, reached) << n; // never a part of the document
        EXPECT_EQ(reports, reached ? kFatal : "") << n;
        return reached;
    });
}

TEST(AllocFailure, XmlWriteAnswersFalseAndKeepsWhatWasSent) {
    for (OxBool flushEveryLine : {OxTrue, OxFalse}) {
        oxtest::TempDir dir;
        oxtest::writeFile(dir.file("a.xml"), kDocument);
        {
            // Gone before the runs: the pools of its nodes give their slabs
            // back only when their last block goes.
            OxXmlFile whole(dir.file("a.xml").c_str(), OxFile::OxIOInput);
            ASSERT_EQ(whole.readFile(), OxTrue);
            whole.open(dir.file("whole.xml").c_str(), OxFile::OxIOOutput);
            ASSERT_EQ(whole.writeFile(), OxTrue);
        }
        std::string complete = oxtest::readText(dir.file("whole.xml"));
        untilItRunsThrough([&](long long n) {
            OxBool result = OxFalse;
            bool reached = false;
            testing::internal::CaptureStderr();
            {
                OxXmlFile file(dir.file("a.xml").c_str(), OxFile::OxIOInput);
                file.readFile();
                file.open(dir.file("out.xml").c_str(), OxFile::OxIOOutput);
                file.setFlushEveryLine(flushEveryLine);
                Armed armed(n);
                result = file.writeFile();
                reached = Armed::reached();
            }
            std::string reports = testing::internal::GetCapturedStderr();
            std::string written = oxtest::readText(dir.file("out.xml"));
            EXPECT_EQ(result, reached ? OxFalse : OxTrue) << n;
            EXPECT_EQ(reports, reached ? kFatal : "") << n;
            EXPECT_EQ(complete.compare(0, written.size(), written), 0) << n; // a start of it
            return reached;
        });
    }
}

TEST(AllocFailure, CsvReadGivesTheWholeTableOrNone) {
    oxtest::TempDir dir;
    oxtest::writeFile(dir.file("t.csv"), "# parts\nid,name,mass\n1,bolt,0.1\n2,,0.4\n3,nut,0.05\n");
    untilItRunsThrough([&](long long n) {
        OxBool result = OxFalse;
        bool reached = false;
        bool empty = false;
        unsigned int columns = 0;
        testing::internal::CaptureStderr();
        {
            OxCsvFile table(dir.file("t.csv").c_str(), OxFile::OxIOInput);
            {
                Armed armed(n);
                result = table.readFile();
                reached = Armed::reached();
            }
            empty = table.getRoot() == nullptr;
            columns = table.getColumnNames().getLength();
        }
        std::string reports = testing::internal::GetCapturedStderr();
        EXPECT_EQ(result, reached ? OxFalse : OxTrue) << n;
        EXPECT_EQ(empty, reached) << n;
        EXPECT_EQ(columns, reached ? 0u : 3u) << n;
        EXPECT_EQ(reports, reached ? kFatal : "") << n;
        return reached;
    });
}

TEST(AllocFailure, PendingAttributesAreBuiltWholeOrStayPending) {
    // The first use of a read element's attributes builds them; without
    // memory it throws and leaves them as read, so that the next use sees
    // exactly the same names and values (the CSV form is read only once).
    oxtest::TempDir dir;
    oxtest::writeFile(dir.file("a.xml"), kDocument);
    oxtest::writeFile(dir.file("t.csv"), "id,name,mass\n 1 , bolt ,,0.1\n");
    untilItRunsThrough([&](long long n) {
        bool reached = false;
        bool thrown = false;
        std::string seen;
        {
            OxXmlFile xml(dir.file("a.xml").c_str(), OxFile::OxIOInput);
            OxCsvFile csv(dir.file("t.csv").c_str(), OxFile::OxIOInput);
            EXPECT_EQ(xml.readFile(), OxTrue);
            EXPECT_EQ(csv.readFile(), OxTrue);
            const OxXmlElement* part = xml.getRoot()->getChild(0);
            const OxXmlElement* record = csv.getRoot()->getChild(0);
            {
                Armed armed(n);
                try {
                    part->getAttribute(0);
                    record->getAttributeByName("mass");
                } catch (const std::bad_alloc&) {
                    thrown = true;
                }
                reached = Armed::reached();
            }
            EXPECT_EQ(part->getNbAttributes(), 2u) << n;
            EXPECT_EQ(record->getNbAttributes(), 3u) << n;
            for (const OxXmlElement* e : {part, record}) {
                for (unsigned int i = 0; i < e->getNbAttributes(); i++) {
                    seen += std::string(e->getAttribute(i)->getName()) + "=" +
                            e->getAttribute(i)->getValue() + ";";
                }
            }
        }
        EXPECT_EQ(thrown, reached) << n;
        EXPECT_EQ(seen, "id=1;vec3d=1 2 3;id=1;name=bolt;column3=0.1;") << n;
        return reached;
    });
}

TEST(AllocFailure, PendingChildrenAreBuiltWholeOrStayPending) {
    // The first use of a read element's children builds all of them (here
    // more than a slab of the store holds); without memory it throws and
    // leaves them as read, the comment object among them still the store's.
    oxtest::TempDir dir;
    std::string text = "<?xml version=\"1.0\"?>\n<r>\n<!-- a note -->\n";
    for (int i = 0; i < 3000; i++) {
        text += "<p i=\"" + std::to_string(i) + "\"/>\n";
    }
    oxtest::writeFile(dir.file("a.xml"), text + "</r>\n");
    untilItRunsThrough([&](long long n) {
        bool reached = false;
        bool thrown = false;
        std::string seen;
        {
            OxXmlFile xml(dir.file("a.xml").c_str(), OxFile::OxIOInput);
            EXPECT_EQ(xml.readFile(), OxTrue);
            const OxXmlElement* root = xml.getRoot();
            {
                Armed armed(n);
                try {
                    root->getChild(0);
                } catch (const std::bad_alloc&) {
                    thrown = true;
                }
                reached = Armed::reached();
            }
            EXPECT_EQ(root->getNbChildElements(), 3001u) << n;
            const OxXmlElement* note = root->getChild(0);
            const OxXmlElement* last = root->getChild(3000);
            EXPECT_EQ(note->getParent(), root) << n;
            EXPECT_EQ(last->getParent(), root) << n;
            seen = std::string(note->getValue()) + ";" + last->getName() + "=" +
                   last->getAttributeValue("i");
        }
        EXPECT_EQ(thrown, reached) << n;
        EXPECT_EQ(seen, "<!-- a note -->;p=2999") << n;
        return reached;
    });
}

TEST(AllocFailure, MessageStartRunsOrDoesNot) {
    oxtest::TempDir dir;
    std::string messages = oxtest::dataFile("oxbase.msg");
    untilItRunsThrough([&](long long n) {
        bool reached = false;
        bool valid = false;
        std::string text;
        testing::internal::CaptureStderr();
        {
            std::optional<OxMsg> msg;
            {
                Armed armed(n);
                msg.emplace(messages.c_str(), nullptr, "run.log", dir.path().c_str());
                reached = Armed::reached();
            }
            valid = OxMsg::isValid() == OxTrue;
            const char* formatted = OxMsg::LogToString(OxMsgFileOpen, "part.xml");
            text = formatted != nullptr ? formatted : "";
        }
        std::string reports = testing::internal::GetCapturedStderr();
        EXPECT_EQ(valid, !reached) << n;
        if (reached) {
            EXPECT_TRUE(reports == kFatal || reports == "Message file buffer is NULL.\n")
                << n << ": " << reports;
            EXPECT_EQ(text, "") << n; // a subsystem that did not start logs nothing
        } else {
            EXPECT_EQ(reports, "");
            EXPECT_EQ(text, "Unable to open file part.xml");
        }
        return reached;
    });
}

} // namespace
