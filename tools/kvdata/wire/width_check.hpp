#pragma once
// Refuses a text that the library would cut. Installed while a document's
// record or object is handed to the library (properties set, StreamOut
// called), it sees every fixed-width text the library is about to store,
// with the whole text given, and notes the first one longer than its field;
// verify() then raises InputError naming the field's path. The widths are
// the library's own. (An observer never throws into the library, whose
// operations turn any exception into a failure of their own.)
//
//   WidthCheck check;
//   kvdata::ObservedStreams watch(check);
//   user->v1User(record);  user->StreamOut(bytes, pos);
//   check.verify();   // InputError "v1User.USERID: 31 characters, but the field holds 30; ..."
//
// A caller that hands the library a member of a larger document (a
// tolerance of a set) enters the member first, so that the path names it:
// check.enter("Tolerances", 2); ...; check.leave();

#include <optional>
#include <string>
#include <string_view>

#include "kvdata/streams/stream_observer.hpp"
#include "wire/field_path.hpp"

namespace kvdata::cli {

class WidthCheck : public StreamObserver {
 public:
  void enter(std::string_view name, std::optional<Long> index) override;
  void leave() override;
  void field(const StreamField& f) override;

  // InputError for the first text that was longer than its field.
  void verify() const;

 private:
  FieldPath path_;
  std::optional<std::string> problem_;
};

}  // namespace kvdata::cli
