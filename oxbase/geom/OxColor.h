// OxColor.h: a red, green, blue colour held as three doubles.
//
// A colour remembers whether it was ever given (`isSet`); an unset colour is
// white underneath. It converts between doubles (1.0 full intensity), 8-bit
// channels and the packed form 0x00RRGGBB, and it has a file form of three
// big-endian doubles (the flag is not stored).
//
//   OxColor c(0xFF8001u);
//   unsigned int green = c.getGreenAsInt();   // 128
//   c.writeValue(output);                     // 24 bytes
#ifndef OXBASE_GEOM_OXCOLOR_H
#define OXBASE_GEOM_OXCOLOR_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxTypes.h"

#include <ostream>

class OxInput;
class OxOutput;

class OXBASE_API OxColor {
public:
    /// Not set; all channels 1.0.
    OxColor();
    /// Packed 0x00RRGGBB; the top byte is ignored.
    explicit OxColor(unsigned int rgb);
    /// 8-bit channels; a value above 255 counts as 255.
    OxColor(unsigned int r, unsigned int g, unsigned int b);
    /// Double channels; a value above 1.0 counts as 1.0, negatives are kept.
    OxColor(double r, double g, double b);
    OxColor(const OxColor& other) = default;
    const OxColor& operator=(const OxColor& other);
    virtual ~OxColor() = default;

    void setColor(unsigned int rgb);
    void setColor(unsigned int r, unsigned int g, unsigned int b);
    void setColor(double r, double g, double b);

    OxBool isSet() const { return set; }
    double getRed() const { return red; }
    double getGreen() const { return green; }
    double getBlue() const { return blue; }
    void getColor(double& r, double& g, double& b) const;
    /// A channel times 255, truncated toward zero (0.5 gives 127).
    unsigned int getRedAsInt() const;
    unsigned int getGreenAsInt() const;
    unsigned int getBlueAsInt() const;
    void getColor(unsigned int& r, unsigned int& g, unsigned int& b) const;
    /// The packed form 0x00RRGGBB of the integer channels.
    unsigned int getColor() const;

    /// Reads red, green, blue; returns the sum of the reads' results. `isSet`
    /// stays as it was.
    long long readValue(OxInput& input);
    /// Writes red, green, blue; returns the bytes written up to the first
    /// failure (24 in full).
    long long writeValue(OxOutput& output);

    /// "    red: ", "    green: ", "    blue: " lines, or "    Color is not set."
    std::ostrstream* dump(std::ostrstream* stream) const;

private:
    OxBool set;
    double red;
    double green;
    double blue;
};

/// "(r,g,b)" at precision 10, or "    Color is not set.\n" for an unset colour.
OXBASE_API std::ostream& operator<<(std::ostream& stream, const OxColor& color);
/// 1 when every channel differs by at most OxEPSZero; the set flag is not compared.
OXBASE_API int operator==(const OxColor& a, const OxColor& b);
/// 1 when any channel differs by more than OxEPSZero.
OXBASE_API int operator!=(const OxColor& a, const OxColor& b);

#endif
