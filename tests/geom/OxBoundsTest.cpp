#include "oxbase/geom/OxBBox.h"
#include "oxbase/geom/OxBSphere.h"
#include "oxbase/geom/OxVec.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxOutput.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <initializer_list>
#include <limits>
#include <memory>
#include <string>
#include <vector>

namespace {
const double kDoubleMax = 1.7976931348623157e+308;
const double kFloatMax = 3.4028234663852886e+38;
const double kNaN = std::numeric_limits<double>::quiet_NaN();
using Three = std::array<double, 3>;
using Four = std::array<double, 4>;
using Six = std::array<double, 6>;

/// Big-endian bytes of IEEE bit patterns given by hand.
template <class Bits> std::string bigEndian(std::initializer_list<Bits> patterns) {
    std::string bytes;
    for (Bits bits : patterns) {
        for (int shift = 8 * static_cast<int>(sizeof(Bits)) - 8; shift >= 0; shift -= 8) {
            bytes += static_cast<char>((bits >> shift) & 0xFF);
        }
    }
    return bytes;
}
// 1.0 to 6.0 as doubles and as floats.
const std::string kDoubles1To6 =
    bigEndian<std::uint64_t>({0x3FF0000000000000, 0x4000000000000000, 0x4008000000000000,
                              0x4010000000000000, 0x4014000000000000, 0x4018000000000000});
const std::string kFloats1To6 = bigEndian<std::uint32_t>(
    {0x3F800000, 0x40000000, 0x40400000, 0x40800000, 0x40A00000, 0x40C00000});

std::string pad(const std::string& text, size_t width) {
    return std::string(width > text.size() ? width - text.size() : 0, ' ') + text;
}

std::string num(const char* pattern, double value) {
    char text[64];
    std::snprintf(text, sizeof text, pattern, value);
    return text;
}

// The numbers of a volume in field order, widened to double (exact for floats).
template <class T, class Box> Six extents(const Box& box) {
    T v[6];
    box.getValue(v[0], v[1], v[2], v[3], v[4], v[5]);
    return {v[0], v[1], v[2], v[3], v[4], v[5]};
}
template <class T, class Volume> Four four(const Volume& volume) {
    T v[4];
    volume.getValue(v[0], v[1], v[2], v[3]);
    return {v[0], v[1], v[2], v[3]};
}
/// What getCenter or getSize gives, widened to double.
template <class T, class Box> Three axes(const Box& box, void (Box::*get)(T&, T&, T&) const) {
    T v[3];
    (box.*get)(v[0], v[1], v[2]);
    return {v[0], v[1], v[2]};
}

/// Runs `read` on an input on a scratch file of `bytes`.
template <class Read> void readFrom(const std::string& bytes, Read read) {
    oxtest::TempDir dir;
    oxtest::writeFile(dir.file("in.bin"), bytes);
    OxInput in(dir.file("in.bin").c_str(), OxFile::FILE_MODE_BINARY);
    read(in);
}

/// The bytes that `write` puts in a scratch file.
template <class Write> std::string writtenBy(Write write) {
    oxtest::TempDir dir;
    {
        OxOutput out(dir.file("out.bin").c_str(), OxFile::FILE_MODE_BINARY);
        write(out);
    }
    return oxtest::readFile(dir.file("out.bin"));
}

/// The sum of `count` plain reads of T from `bytes`: the reference for readValue.
template <class T> long long plainReads(const std::string& bytes, int count) {
    long long total = 0;
    readFrom(bytes, [&](OxInput& in) {
        for (int i = 0; i < count; i++) {
            T value{};
            total += in.read(value);
        }
    });
    return total;
}

/// An output on /dev/full, opened by a bare name so that preparing the place
/// removes nothing, with `prefill` single bytes already in its buffer. Writes
/// land in the buffer and fail when it has to go to the device.
std::unique_ptr<OxOutput> openFull(int prefill) {
    const std::filesystem::path home = std::filesystem::current_path();
    std::filesystem::current_path("/dev");
    auto out = std::make_unique<OxOutput>("full", OxFile::FILE_MODE_BINARY);
    std::filesystem::current_path(home);
    for (int i = 0; i < prefill; i++) {
        out->write('\0');
    }
    return out;
}

/// How many of up to `limit` plain writes of `value` succeed on /dev/full
/// after `prefill` bytes: the reference for the byte counts.
template <class T> int plainWrites(int prefill, T value, int limit) {
    std::unique_ptr<OxOutput> out = openFull(prefill);
    int count = 0;
    while (count < limit && out->write(value) == OxTrue) {
        count++;
    }
    return count;
}
} // namespace

TEST(OxBBox, EmptyMarkersUnionAndConversions) {
    const Six doubleMarkers{kDoubleMax,  kDoubleMax,  kDoubleMax,
                            -kDoubleMax, -kDoubleMax, -kDoubleMax};
    OxBBox box;
    EXPECT_EQ(box.isEmpty(), OxTrue);
    EXPECT_EQ(extents<double>(box), doubleMarkers);
    box += OxBBox(1, 2, 3, 4, 5, 6);
    EXPECT_EQ(box.isEmpty(), OxFalse);
    EXPECT_EQ(extents<double>(box), (Six{1, 2, 3, 4, 5, 6}));
    OxBBox both = OxBBox() + OxBBox(); // the markers, yet not flagged empty
    EXPECT_EQ(both.isEmpty(), OxFalse);
    EXPECT_EQ(extents<double>(both), doubleMarkers);
    OxBBox self;
    self += self; // the one exception: nothing changes
    EXPECT_EQ(self.isEmpty(), OxTrue);
    EXPECT_EQ((self + self).isEmpty(), OxFalse);
    EXPECT_EQ(extents<float>(OxBBoxf() + OxBBoxf(-3, -3, -3, -1, -1, -1)),
              (Six{-3, -3, -3, -1, -1, -1}));
    EXPECT_EQ(four<double>(OxBRect(0, 0, 1, 1) + OxBRect(2, 2, 3, 3)), (Four{0, 0, 3, 3}));
    EXPECT_EQ(four<double>(OxBRect()), (Four{kDoubleMax, kDoubleMax, -kDoubleMax, -kDoubleMax}));
    // Lower above upper is kept as given; a NaN field yields to a number.
    EXPECT_EQ(extents<double>(OxBBox(5, 5, 5, 1, 1, 1) + OxBBox(0, 0, 0, 2, 2, 2)),
              (Six{0, 0, 0, 2, 2, 2}));
    EXPECT_EQ(extents<double>(OxBBox(kNaN, 0, 0, kNaN, 1, 1) + OxBBox(1, 2, 3, 4, 5, 6)),
              (Six{1, 0, 0, 4, 5, 6}));

    // The float markers widen exactly; the double markers narrow to infinity,
    // not to the float markers; the flags travel with them.
    const Six floatMarkers{kFloatMax, kFloatMax, kFloatMax, -kFloatMax, -kFloatMax, -kFloatMax};
    OxBBox wide(OxBBoxf{});
    EXPECT_EQ(wide.isEmpty(), OxTrue);
    EXPECT_EQ(extents<double>(wide), floatMarkers);
    wide = OxBBox(1, 1, 1, 1, 1, 1);
    wide = OxBBoxf();
    EXPECT_EQ(wide.isEmpty(), OxTrue);
    EXPECT_EQ(extents<double>(wide), floatMarkers);
    OxBBoxf narrow(1, 1, 1, 1, 1, 1);
    narrow = OxBBox();
    EXPECT_EQ(narrow.isEmpty(), OxTrue);
    const double inf = std::numeric_limits<double>::infinity();
    EXPECT_EQ(extents<float>(narrow), (Six{inf, inf, inf, -inf, -inf, -inf}));
    narrow = OxBBox(0.1, -0.1, 1e-50, 1e300, 3.4028235e38, 0); // the nearest floats
    EXPECT_EQ(extents<float>(narrow), (Six{0.1f, -0.1f, 0.0, inf, kFloatMax, 0}));
    EXPECT_EQ(narrow.isEmpty(), OxFalse);
}

TEST(OxBBox, CentreSizeAndComparison) {
    EXPECT_EQ(axes(OxBBox(), &OxBBox::getCenter), (Three{0, 0, 0}));
    EXPECT_EQ(axes(OxBBox(), &OxBBox::getSize), (Three{-1, -1, -1}));
    EXPECT_EQ(axes(OxBBoxf(), &OxBBoxf::getSize), (Three{-1, -1, -1}));
    OxVec3d center(1, 1, 1), half(2, 3, 4);
    OxBBox box;
    box.setValue(center, half);
    OxBBoxf boxf;
    boxf.setValue(center, half);
    EXPECT_EQ(box.isEmpty() + boxf.isEmpty(), 0);
    EXPECT_EQ(extents<double>(box), (Six{-1, -2, -3, 3, 4, 5}));
    EXPECT_EQ(extents<float>(boxf), (Six{-1, -2, -3, 3, 4, 5}));
    EXPECT_EQ(axes(box, &OxBBox::getCenter), (Three{1, 1, 1}));
    EXPECT_EQ(axes(boxf, &OxBBoxf::getCenter), (Three{1, 1, 1}));
    EXPECT_EQ(axes(box, &OxBBox::getSize), (Three{2, 3, 4}));
    EXPECT_EQ(axes(boxf, &OxBBoxf::getSize), (Three{2, 3, 4}));
    EXPECT_EQ(axes(OxBBox(5, 5, 5, 1, 1, 1), &OxBBox::getSize), (Three{-2, -2, -2}));
    // The float box takes the difference in float, where it overflows.
    EXPECT_TRUE(std::isinf(axes(OxBBoxf(-3e38f, 0, 0, 3e38f, 0, 0), &OxBBoxf::getCenter)[0]));
    EXPECT_EQ(axes(OxBBox(-3e38, 0, 0, 3e38, 0, 0), &OxBBox::getCenter)[0], 0.0);

    EXPECT_EQ(OxBBox(0, 0, 0, 1, 1, 1) == OxBBox(0, 0, 1e-5 / 2, 1, 1, 1), 1);
    EXPECT_EQ(OxBBox(0, 0, 0, 1, 1, 1) != OxBBox(0, 0, 1e-5 / 2, 1, 1, 1), 0);
    EXPECT_EQ(OxBBox(0, 0, 0, 1, 1, 1) == OxBBox(0, 0, 0, 1, 1, 1 + 2e-5), 0);
    EXPECT_EQ(OxBBox(0, 0, 0, 1, 1, 1) != OxBBox(0, 0, 0, 1, 1, 1 + 2e-5), 1);
    // The flags are not compared; NaN equals nothing.
    EXPECT_EQ(OxBBox() == OxBBox() + OxBBox(), 1);
    EXPECT_EQ(OxBBox(kNaN, 0, 0, 1, 1, 1) == OxBBox(kNaN, 0, 0, 1, 1, 1), 0);
    EXPECT_EQ(OxBBoxf(0, 0, 0, 1, 1, 1) == OxBBoxf(0, 0, 0, 1, 1, 1 + 8e-6f), 1);
    EXPECT_EQ(OxBBoxf(0, 0, 0, 1, 1, 1) != OxBBoxf(0, 0, 0, 1, 1, 1 + 2e-5f), 1);
}

TEST(OxBounds, FileFormsByteForByte) {
    EXPECT_EQ(writtenBy([](OxOutput& o) { EXPECT_EQ(OxBBox(1, 2, 3, 4, 5, 6).writeValue(o), 48); }),
              kDoubles1To6);
    EXPECT_EQ(writtenBy([](OxOutput& o) { EXPECT_EQ(OxBRect(1, 2, 3, 4).writeValue(o), 32); }),
              kDoubles1To6.substr(0, 32));
    EXPECT_EQ(writtenBy([](OxOutput& o) { EXPECT_EQ(OxBSphere(1, 2, 3, 4).writeValue(o), 32); }),
              kDoubles1To6.substr(0, 32));
    OxBBoxf halves(0.5f, 1, 1.5f, 2, 2.5f, 3);
    OxBSpheref halfSphere(0.5f, 1, 1.5f, 2);
    EXPECT_EQ(writtenBy([&](OxOutput& o) { EXPECT_EQ(halves.writeValue(o, 2.0f), 24); }),
              kFloats1To6);
    EXPECT_EQ(writtenBy([&](OxOutput& o) { EXPECT_EQ(halfSphere.writeValue(o, 2.0f), 16); }),
              kFloats1To6.substr(0, 16));
    EXPECT_EQ(extents<float>(halves), (Six{0.5, 1, 1.5, 2, 2.5, 3})); // unchanged
    EXPECT_EQ(four<float>(halfSphere), (Four{0.5, 1, 1.5, 2}));
    // Empty objects write what they hold: the markers, or the zeros of a sphere.
    const std::uint64_t hi = 0x7FEFFFFFFFFFFFFF, lo = 0xFFEFFFFFFFFFFFFF;
    EXPECT_EQ(writtenBy([](OxOutput& o) { OxBBox().writeValue(o); }),
              bigEndian<std::uint64_t>({hi, hi, hi, lo, lo, lo}));
    EXPECT_EQ(writtenBy([](OxOutput& o) { OxBRect().writeValue(o); }),
              bigEndian<std::uint64_t>({hi, hi, lo, lo}));
    EXPECT_EQ(writtenBy([](OxOutput& o) { OxBBoxf().writeValue(o, 1.0f); }),
              bigEndian<std::uint32_t>(
                  {0x7F7FFFFF, 0x7F7FFFFF, 0x7F7FFFFF, 0xFF7FFFFF, 0xFF7FFFFF, 0xFF7FFFFF}));
    EXPECT_EQ(writtenBy([](OxOutput& o) { OxBSphere().writeValue(o); }), std::string(32, '\0'));

    readFrom(kDoubles1To6 + kDoubles1To6, [](OxInput& in) {
        OxBBox box;
        OxBRect rect;
        EXPECT_EQ(box.readValue(in) + rect.readValue(in), 80);
        EXPECT_EQ(box.isEmpty() + rect.isEmpty(), 0);
        EXPECT_EQ(extents<double>(box), (Six{1, 2, 3, 4, 5, 6}));
        EXPECT_EQ(four<double>(rect), (Four{1, 2, 3, 4}));
    });
    readFrom(kFloats1To6 + kFloats1To6, [](OxInput& in) {
        OxBBoxf box;
        OxBSpheref sphere;
        EXPECT_EQ(box.readValue(in, 2.0f) + sphere.readValue(in, 0.5f), 40);
        EXPECT_EQ(box.isEmpty() + sphere.isEmpty(), 0);
        EXPECT_EQ(extents<float>(box), (Six{2, 4, 6, 8, 10, 12}));
        EXPECT_EQ(four<float>(sphere), (Four{0.5, 1, 1.5, 2}));
    });
}

TEST(OxBounds, TruncatedReadsAttemptEveryField) {
    oxtest::MessageLog log("2,I,0m2 %s\n18,I,0m18\n19,I,0m19\n20,I,0m20\n");
    auto failedReads = [&log] {
        std::vector<std::string> texts = log.take();
        return std::count_if(texts.begin(), texts.end(),
                             [](const std::string& t) { return t.rfind("m2 ", 0) == 0; });
    };
    const std::string doubles = kDoubles1To6.substr(0, 20); // half of the third is there
    const long long reference = plainReads<double>(doubles, 6);
    EXPECT_EQ(failedReads(), 4);
    readFrom(doubles, [&](OxInput& in) {
        OxBBox box;
        EXPECT_EQ(box.readValue(in), reference);
        EXPECT_EQ(box.isEmpty(), OxFalse);
        EXPECT_EQ(extents<double>(box),
                  (Six{1, 2, kDoubleMax, -kDoubleMax, -kDoubleMax, -kDoubleMax}));
    });
    EXPECT_EQ(failedReads(), 4); // every field after the first failure was tried

    // The float box scales every field after reading, the unread ones too.
    const std::string floats = kFloats1To6.substr(0, 10);
    const long long floatReference = plainReads<float>(floats, 6);
    readFrom(floats, [&](OxInput& in) {
        OxBBoxf box;
        EXPECT_EQ(box.readValue(in, 0.5f), floatReference);
        const float halfMarker = static_cast<float>(kFloatMax) * 0.5f;
        EXPECT_EQ(extents<float>(box),
                  (Six{0.5, 1, halfMarker, -halfMarker, -halfMarker, -halfMarker}));
    });
    EXPECT_EQ(failedReads(), 8);
    const long long sphereReference = plainReads<double>(doubles.substr(0, 12), 4);
    readFrom(doubles.substr(0, 12), [&](OxInput& in) {
        OxBSphere sphere;
        EXPECT_EQ(sphere.readValue(in), sphereReference);
        EXPECT_EQ(sphere.isEmpty(), OxFalse);
        EXPECT_EQ(four<double>(sphere), (Four{1, 0, 0, 0}));
    });
    EXPECT_EQ(failedReads(), 6);
}

TEST(OxBounds, WriteValueStopsAtTheFirstFailedWrite) {
#ifdef _WIN32
    GTEST_SKIP() << "no /dev/full device on Windows to fail writes";
#endif
    if (!std::filesystem::exists("/dev/full")) {
        GTEST_SKIP() << "no /dev/full to fail writes";
    }
    // The buffer takes single bytes until it has to be flushed; past that
    // the device refuses every write. With the buffer nearly full a write
    // fails at a known place: scan the last bytes before the capacity, and
    // the empty buffer, which takes every value.
    const int capacity = plainWrites(0, '\0', 1 << 22);
    ASSERT_LT(capacity, 1 << 22);
    bool thirdDoubleFailed = false;
    bool thirdFloatFailed = false;
    for (int prefill = std::max(0, capacity - 64); prefill <= capacity + 1; prefill++) {
        const int p = prefill > capacity ? 0 : prefill;
        const int doubles = plainWrites(p, 1.0, 6);
        const int floats = plainWrites(p, 1.0f, 6);
        thirdDoubleFailed = thirdDoubleFailed || doubles == 2;
        thirdFloatFailed = thirdFloatFailed || floats == 2;
        SCOPED_TRACE(p);
        EXPECT_EQ(OxBBox(1, 2, 3, 4, 5, 6).writeValue(*openFull(p)), 8 * doubles);
        EXPECT_EQ(OxBRect(1, 2, 3, 4).writeValue(*openFull(p)), 8 * std::min(doubles, 4));
        EXPECT_EQ(OxBSphere(1, 2, 3, 4).writeValue(*openFull(p)), 8 * std::min(doubles, 4));
        EXPECT_EQ(OxBBoxf(1, 2, 3, 4, 5, 6).writeValue(*openFull(p), 1.0f), 4 * floats);
        EXPECT_EQ(OxBSpheref(1, 2, 3, 4).writeValue(*openFull(p), 1.0f), 4 * std::min(floats, 4));
    }
    // Among them the third write failing: 16 bytes for OxBBox, 8 for OxBBoxf.
    EXPECT_TRUE(thirdDoubleFailed);
    EXPECT_TRUE(thirdFloatFailed);
    // A failed output stays failed.
    std::unique_ptr<OxOutput> full = openFull(capacity);
    EXPECT_EQ(OxBBox().writeValue(*full), 0);
    EXPECT_EQ(OxBBox().writeValue(*full), 0);
    EXPECT_EQ(full->isGood(), OxFalse);
}

TEST(OxBounds, DumpTexts) {
    EXPECT_EQ(oxtest::dumpText(OxBBox()), "Empty bounding box.\n");
    EXPECT_EQ(oxtest::dumpText(OxBBoxf()), "Empty bounding box.\n");
    EXPECT_EQ(oxtest::dumpText(OxBRect()), "Empty bounding rectangle.\n");
    EXPECT_EQ(oxtest::dumpText(OxBSphere()), "Empty bounding sphere.\n");
    EXPECT_EQ(oxtest::dumpText(OxBSpheref()), "Empty bounding sphere.\n");

    const char* labels[3] = {"X ", "Y ", "Z "};
    const float v[6] = {-1.5f, 0.1f, 2, 3.25f, 1e7f, 1.0f / 3.0f};
    std::string wide = pad(" ", 14) + "min" + pad("max", 17) + "\n";
    std::string narrow = pad(" ", 12) + "min" + pad("max", 13) + "\n";
    for (int i = 0; i < 3; i++) {
        wide += labels[i] + pad(num("%g", v[i]), 17) + pad(num("%g", v[i + 3]), 17) + "\n";
        narrow += labels[i] + pad(num("%g", v[i]), 13) + pad(num("%g", v[i + 3]), 13) + "\n";
    }
    EXPECT_EQ(oxtest::dumpText(OxBBox(v[0], v[1], v[2], v[3], v[4], v[5])), wide);
    EXPECT_EQ(oxtest::dumpText(OxBBoxf(v[0], v[1], v[2], v[3], v[4], v[5])), narrow);
    EXPECT_EQ(oxtest::dumpText(OxBRect(-1.5, 0.1, 3.25, 1e7)),
              pad(" ", 12) + "min " + pad("max", 13) + "\nU " + pad("-1.5", 13) + " " +
                  pad("3.25", 13) + "\nV " + pad("0.1", 13) + " " + pad("1e+07", 13) + "\n");

    // The double sphere sets precision 10, which stays for what follows.
    std::ostrstream stream;
    OxBSphere(1.0 / 3.0, -2, 1e-12, 4).dump(&stream);
    EXPECT_EQ(stream.precision(), 10);
    OxBSpheref(v[5], 0, 0, 1).dump(&stream);
    const char* names[4] = {"    x: ", "    y: ", "    z: ", "    r: "};
    const double first[4] = {1.0 / 3.0, -2, 1e-12, 4};
    const double second[4] = {v[5], 0, 0, 1};
    std::string expected;
    for (const double* values : {first, second}) {
        for (int i = 0; i < 4; i++) {
            expected += names[i] + num("%.10g", values[i]) + "\n";
        }
    }
    EXPECT_EQ(oxtest::streamText(stream), expected);
    EXPECT_EQ(oxtest::dumpText(OxBSpheref(v[5], 0, 0, 1)).substr(0, 16), "    x: 0.333333\n");
}

TEST(OxBSphere, ValuesAndConversions) {
    OxBSphere sphere;
    EXPECT_EQ(sphere.isEmpty(), OxTrue);
    EXPECT_EQ(four<double>(sphere), (Four{0, 0, 0, 0}));
    sphere.setValue(OxVec3d(1, 2, 3), 4.0);
    EXPECT_EQ(sphere.isEmpty(), OxFalse);
    EXPECT_EQ(four<double>(sphere), (Four{1, 2, 3, 4}));
    OxBSpheref f;
    f.setValue(OxVec3d(1, 2, 3), 4.0f);
    OxVec3d center;
    float radius = 0;
    f.getValue(center, radius);
    EXPECT_EQ(f.isEmpty(), OxFalse);
    EXPECT_EQ((Four{center.x, center.y, center.z, radius}), (Four{1, 2, 3, 4}));
    EXPECT_EQ(OxBSphere(OxBSpheref(1, 2, 3, 4)).isEmpty(), OxFalse);
    EXPECT_EQ(OxBSphere(OxBSpheref()).isEmpty(), OxTrue);
    f = OxBSphere();
    EXPECT_EQ(f.isEmpty(), OxTrue);
    f = OxBSphere(OxVec3d(0.1, 1e300, -1e300), -2.0); // the radius sign is not tested
    const double inf = std::numeric_limits<double>::infinity();
    EXPECT_EQ(four<float>(f), (Four{0.1f, inf, -inf, -2}));
    sphere = f;
    EXPECT_EQ(four<double>(sphere), (Four{0.1f, inf, -inf, -2}));
}
