#include "oxbase/geom/OxLimits.h"

double OxLimits::OxEPSZero = 0.0;
double OxLimits::OxEPSZeroSqr = 0.0;
double OxLimits::OxEPSWeight = 0.0;
double OxLimits::OxEPSKnot = 0.0;
double OxLimits::OxEPSPtPt = 0.0;
double OxLimits::OxEPSPtPtSqr = 0.0;
double OxLimits::OxEPSUVPtPt = 0.0;
double OxLimits::OxEPSUVPtPtSqr = 0.0;
double OxLimits::OxDimMod = 0.0;
double OxLimits::OxEPSCvCv = 0.0;
double OxLimits::OxEPSLinear = 0.0;

void OxLimits::initTolerances() {
    setEPSZero(1e-7);
    setWeightTol(1e-10);
    setKnotTol(1e-10);
    setPtPtTol(1e-5);
    setUVPtPtTol(1e-10);
    setDimMod(100000.0);
    setCvCvTol(0.001);
    setPNurbsLinearTol(0.001);
}

void OxLimits::setEPSZero(double value) {
    OxEPSZero = value;
    OxEPSZeroSqr = value * value;
}

void OxLimits::setPtPtTol(double value) {
    OxEPSPtPt = value;
    OxEPSPtPtSqr = value * value;
}

void OxLimits::setUVPtPtTol(double value) {
    OxEPSUVPtPt = value;
    OxEPSUVPtPtSqr = value * value;
}

void OxLimits::setWeightTol(double value) {
    OxEPSWeight = value;
}
void OxLimits::setKnotTol(double value) {
    OxEPSKnot = value;
}
void OxLimits::setCvCvTol(double value) {
    OxEPSCvCv = value;
}
void OxLimits::setDimMod(double value) {
    OxDimMod = value;
}
void OxLimits::setPNurbsLinearTol(double value) {
    OxEPSLinear = value;
}

std::ostrstream* OxLimits::dumpTolerances(std::ostrstream* stream) {
    std::ostrstream& s = *stream;
    s << "\n"
      << "-------- Tolerances used during data translation --------"
      << "\n";
    s << "                                   Zero tolerance = " << OxEPSZero << "\n";
    s << "       Weight tolerance for NURBS curves/surfaces = " << OxEPSWeight << "\n";
    s << "Knot interval tolerance for NURBS curves/surfaces = " << OxEPSKnot << "\n";
    s << "                      Point coincidence tolerance = " << OxEPSPtPt << "\n";
    s << "    Surface Parameter Point coincidence tolerance = " << OxEPSUVPtPt << "\n";
    s << "                        Identical curve tolerance = " << OxEPSCvCv << "\n";
    s << "                          Maximum model dimension = " << OxDimMod << "\n";
    s << "---- End of Tolerances used during data translation -----"
      << "\n"
      << "\n";
    return stream;
}
