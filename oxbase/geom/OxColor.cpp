#include "oxbase/geom/OxColor.h"

#include "oxbase/geom/OxLimits.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxOutput.h"

#include <cmath>
#include <iomanip>

namespace {
double fromByte(unsigned int value) {
    return (value > 255u ? 255u : value) / 255.0;
}

double clampChannel(double value) {
    return value > 1.0 ? 1.0 : value;
}

/// Channel times 255, truncated toward zero. Values outside what 32 bits
/// hold (negative channels, NaN) give 0 rather than undefined behaviour.
unsigned int toByte(double value) {
    double scaled = value * 255.0;
    if (!(scaled > 0.0)) {
        return 0u;
    }
    return scaled >= 4294967295.0 ? 4294967295u : static_cast<unsigned int>(scaled);
}
} // namespace

OxColor::OxColor() : set(OxFalse), red(1.0), green(1.0), blue(1.0) {}

OxColor::OxColor(unsigned int rgb) : OxColor() {
    setColor(rgb);
}

OxColor::OxColor(unsigned int r, unsigned int g, unsigned int b) : OxColor() {
    setColor(r, g, b);
}

OxColor::OxColor(double r, double g, double b) : OxColor() {
    setColor(r, g, b);
}

const OxColor& OxColor::operator=(const OxColor& other) {
    set = other.set;
    red = other.red;
    green = other.green;
    blue = other.blue;
    return *this;
}

void OxColor::setColor(unsigned int rgb) {
    setColor((rgb >> 16) & 0xFFu, (rgb >> 8) & 0xFFu, rgb & 0xFFu);
}

void OxColor::setColor(unsigned int r, unsigned int g, unsigned int b) {
    red = fromByte(r);
    green = fromByte(g);
    blue = fromByte(b);
    set = OxTrue;
}

void OxColor::setColor(double r, double g, double b) {
    red = clampChannel(r);
    green = clampChannel(g);
    blue = clampChannel(b);
    set = OxTrue;
}

void OxColor::getColor(double& r, double& g, double& b) const {
    r = red;
    g = green;
    b = blue;
}

unsigned int OxColor::getRedAsInt() const {
    return toByte(red);
}
unsigned int OxColor::getGreenAsInt() const {
    return toByte(green);
}
unsigned int OxColor::getBlueAsInt() const {
    return toByte(blue);
}

void OxColor::getColor(unsigned int& r, unsigned int& g, unsigned int& b) const {
    r = getRedAsInt();
    g = getGreenAsInt();
    b = getBlueAsInt();
}

unsigned int OxColor::getColor() const {
    return ((getRedAsInt() * 256u) + getGreenAsInt()) * 256u + getBlueAsInt();
}

long long OxColor::readValue(OxInput& input) {
    long long total = input.read(red);
    total += input.read(green);
    total += input.read(blue);
    return total;
}

long long OxColor::writeValue(OxOutput& output) {
    const double channels[3] = {red, green, blue};
    long long written = 0;
    for (double channel : channels) {
        if (output.write(channel) == OxFalse) {
            break;
        }
        written += 8;
    }
    return written;
}

std::ostrstream* OxColor::dump(std::ostrstream* stream) const {
    if (set == OxTrue) {
        *stream << "    red: " << red << "\n";
        *stream << "    green: " << green << "\n";
        *stream << "    blue: " << blue << "\n";
    } else {
        *stream << "    Color is not set."
                << "\n";
    }
    return stream;
}

std::ostream& operator<<(std::ostream& stream, const OxColor& color) {
    if (color.isSet() == OxTrue) {
        stream << std::setprecision(10) << "(" << color.getRed() << "," << color.getGreen() << ","
               << color.getBlue() << ")";
    } else {
        stream << "    Color is not set."
               << "\n";
    }
    return stream;
}

int operator==(const OxColor& a, const OxColor& b) {
    double eps = OxLimits::OxEPSZero;
    return std::fabs(a.getRed() - b.getRed()) <= eps &&
                   std::fabs(a.getGreen() - b.getGreen()) <= eps &&
                   std::fabs(a.getBlue() - b.getBlue()) <= eps
               ? 1
               : 0;
}

int operator!=(const OxColor& a, const OxColor& b) {
    double eps = OxLimits::OxEPSZero;
    return std::fabs(a.getRed() - b.getRed()) > eps ||
                   std::fabs(a.getGreen() - b.getGreen()) > eps ||
                   std::fabs(a.getBlue() - b.getBlue()) > eps
               ? 1
               : 0;
}
