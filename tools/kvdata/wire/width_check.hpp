#pragma once
// Refuses a text that the library's writer would cut: installed while a
// record or object is written, it hears each fixed-width text the writer
// stores (with the whole text given and the field's width in UTF-16 code
// units) and raises InputError for a longer one, naming the field by its
// path as the document does ("v1User.USERID", "v1Calibration.TSN").
//
//   WidthCheck check;
//   kvdata::ObservedStreams watch(check);
//   object->StreamOut(bytes, pos);      // InputError on a text too long

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "kvdata/streams/stream_observer.hpp"

namespace kvdata::cli {

class WidthCheck : public StreamObserver {
 public:
  void enter(std::string_view name, std::optional<Long> index) override;
  void leave() override;
  void field(const StreamField& f) override;

 private:
  std::vector<std::string> path_;
};

}  // namespace kvdata::cli
