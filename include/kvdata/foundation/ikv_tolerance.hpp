#pragma once
// One named tolerance: identifier, name, description, four limits and a free text.
//
//   tol->TolName(u"dE max");  tol->MaxFail(1.5);
//   tol->TolName() == u"dE max";

#include "kvdata/automation/object.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata {

// Holds the TolID, Name, Description, Min, Max, and Misc values for a tolerance.
class IKVTolerance : public virtual Object {
 public:
  Long ID() const { return IKVTolerance_ID(); }
  void ID(Long value) { IKVTolerance_ID(value); }
  String TolName() const { return IKVTolerance_TolName(); }
  void TolName(const String& value) { IKVTolerance_TolName(value); }
  String Description() const { return IKVTolerance_Description(); }
  void Description(const String& value) { IKVTolerance_Description(value); }
  Double MinFail() const { return IKVTolerance_MinFail(); }
  void MinFail(Double value) { IKVTolerance_MinFail(value); }
  Double MinWarn() const { return IKVTolerance_MinWarn(); }
  void MinWarn(Double value) { IKVTolerance_MinWarn(value); }
  Double MaxWarn() const { return IKVTolerance_MaxWarn(); }
  void MaxWarn(Double value) { IKVTolerance_MaxWarn(value); }
  Double MaxFail() const { return IKVTolerance_MaxFail(); }
  void MaxFail(Double value) { IKVTolerance_MaxFail(value); }
  String Misc() const { return IKVTolerance_Misc(); }
  void Misc(const String& value) { IKVTolerance_Misc(value); }

 protected:
  virtual Long IKVTolerance_ID() const = 0;
  virtual void IKVTolerance_ID(Long value) = 0;
  virtual String IKVTolerance_TolName() const = 0;
  virtual void IKVTolerance_TolName(const String& value) = 0;
  virtual String IKVTolerance_Description() const = 0;
  virtual void IKVTolerance_Description(const String& value) = 0;
  virtual Double IKVTolerance_MinFail() const = 0;
  virtual void IKVTolerance_MinFail(Double value) = 0;
  virtual Double IKVTolerance_MinWarn() const = 0;
  virtual void IKVTolerance_MinWarn(Double value) = 0;
  virtual Double IKVTolerance_MaxWarn() const = 0;
  virtual void IKVTolerance_MaxWarn(Double value) = 0;
  virtual Double IKVTolerance_MaxFail() const = 0;
  virtual void IKVTolerance_MaxFail(Double value) = 0;
  virtual String IKVTolerance_Misc() const = 0;
  virtual void IKVTolerance_Misc(const String& value) = 0;
};

}  // namespace kvdata
