#include "kvdata/objects/kv_test_run_tiles_de.hpp"

namespace kvdata {

std::shared_ptr<KVTestRunTilesDE> KVTestRunTilesDE::create() {
  return std::shared_ptr<KVTestRunTilesDE>(new KVTestRunTilesDE());
}

bool KVTestRunTilesDE::FetchAndCalculateDEs(const String&, const Date&) {
  return false;
}

String KVTestRunTilesDE::IKVObj_ObjType() const {
  return u"TestRunTileDEs";
}

String KVTestRunTilesDE::IKVObj_Description() const {
  return u"Test Run Tiles Average DEs";
}

Variant KVTestRunTilesDE::IKVObj_ID() const {
  return Variant(id_);
}

Variant KVTestRunTilesDE::IKVObj_DateCreated() const {
  return Variant();
}

}  // namespace kvdata
