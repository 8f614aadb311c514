// OxLimits.h: the process-wide numeric tolerances of a data translation.
//
// Eleven public doubles that any code reads directly. They are all 0.0 until
// the caller stores them: the library never initialises them by itself.
// Vectors, lines, planes and colours read OxEPSZero and OxEPSPtPt; the others
// are carried for the caller.
//
//   OxLimits::initTolerances();
//   OxLimits::setPtPtTol(1e-4);               // also stores OxEPSPtPtSqr
//   if (v.length() <= OxLimits::OxEPSPtPt) ...
#ifndef OXBASE_GEOM_OXLIMITS_H
#define OXBASE_GEOM_OXLIMITS_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxTypes.h"

class OXBASE_API OxLimits {
public:
    static double OxEPSZero;      ///< "Zero tolerance"
    static double OxEPSZeroSqr;   ///< OxEPSZero squared, stored by setEPSZero
    static double OxEPSWeight;    ///< weight tolerance for NURBS curves/surfaces
    static double OxEPSKnot;      ///< knot interval tolerance for NURBS curves/surfaces
    static double OxEPSPtPt;      ///< point coincidence tolerance
    static double OxEPSPtPtSqr;   ///< OxEPSPtPt squared, stored by setPtPtTol
    static double OxEPSUVPtPt;    ///< surface parameter point coincidence tolerance
    static double OxEPSUVPtPtSqr; ///< OxEPSUVPtPt squared, stored by setUVPtPtTol
    static double OxDimMod;       ///< maximum model dimension
    static double OxEPSCvCv;      ///< identical curve tolerance
    static double OxEPSLinear;    ///< tolerance of setPNurbsLinearTol

    /// Stores the standard values: 1e-7, 1e-10, 1e-10, 1e-5, 1e-10, 100000.0,
    /// 0.001, 0.001 and the three squares.
    static void initTolerances();
    /// The setters store their value unchecked; the three with a square store
    /// the product of the value with itself beside it.
    static void setEPSZero(double value);
    static void setPtPtTol(double value);
    static void setUVPtPtTol(double value);
    static void setWeightTol(double value);
    static void setKnotTol(double value);
    static void setCvCvTol(double value);
    static void setDimMod(double value);
    static void setPNurbsLinearTol(double value);
    /// Writes the report of the seven reported tolerances to `stream`.
    static std::ostrstream* dumpTolerances(std::ostrstream* stream);
};

#endif
