#pragma once
// The per-tile average colour differences of one test run. In this library
// the object is identity-only: it answers the identity and persistence
// interfaces, and FetchAndCalculateDEs computes nothing.
//
//   auto des = kvdata::KVTestRunTilesDE::create();
//   des->FetchAndCalculateDEs(isn, test_date);   // False
//
// Identity: ObjType "TestRunTileDEs", Description "Test Run Tiles Average
// DEs", ID a Long Variant holding the identifier (always 0), DateCreated
// Empty. The persistence verbs return False and ErrMsg is empty.

#include <memory>

#include "kvdata/automation/types.hpp"
#include "kvdata/automation/variant.hpp"
#include "kvdata/foundation/ikv_db_object.hpp"
#include "kvdata/foundation/ikv_obj.hpp"

namespace kvdata {

class KVTestRunTilesDE : public InertDBObject, public IKVObj {
 public:
  static std::shared_ptr<KVTestRunTilesDE> create();

  // Returns False; reads and changes neither argument and nothing in the object.
  bool FetchAndCalculateDEs(const String& ISN, const Date& TestDate);

 protected:
  String IKVObj_ObjType() const override;
  String IKVObj_Description() const override;
  Variant IKVObj_ID() const override;
  Variant IKVObj_DateCreated() const override;

 private:
  KVTestRunTilesDE() = default;

  Long id_ = 0;  // no operation sets it
};

}  // namespace kvdata
