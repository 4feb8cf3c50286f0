#pragma once
// The enumerations of the type library. Values are signed 32-bit.
//
//   pair.Spectrum(kvdata::eSC::SCI).Data(40);
//   kvdata::eLens::Large != ... // eLens and eAperture share member names

#include "kvdata/automation/types.hpp"

namespace kvdata {

// Component index of CIE XYZ.
enum class eXYZ : Long { Xaxis = 0, Yaxis = 1, Zaxis = 2 };
// Component index of CIELAB.
enum class eLAB : Long { Lcomponent = 0, Acomponent = 1, Bcomponent = 2 };
// Specular component excluded or included: the first index of every pair of spectra.
enum class eSC : Long { SCE = 0, SCI = 1 };
// Measuring mode of an instrument.
enum class eMode : Long { Transmission = 0, Reflection = 1 };
// Ultraviolet content of the illumination.
enum class eUV : Long { Included = 0, Excluded = 1, Partial = 2 };
enum class eLens : Long { Large = 0, Medium = 1, Small = 2, VerySmall = 3 };
enum class eAperture : Long { Large = 0, Medium = 1, Small = 2, VerySmall = 3 };
// Database provider named when a database is opened.
enum class eDBProviders : Long { SQLOLEDB = 0, JET40 = 1, ORACLE = 2, ODBC = 3 };
// Kind of access in rights checks; there is no member 0.
enum class eAccessTypes : Long {
  accessRead = 1,
  accessAdd = 2,
  accessUpdate = 3,
  accessDelete = 4
};
// Outcome of a test.
enum class eTestResult : Long { Certified = 0, Pass = 1, Fail = 2, NA = 3 };
// Direction argument of the record streams.
enum class eStreamDirection : Long { ToStream = 0, FromStream = 1 };

}  // namespace kvdata
