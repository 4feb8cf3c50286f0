#pragma once
// Access rights of the current user. In this library every right is refused
// and UserNumber is only stored (see InertSecurity).
//
//   sec->UserNumber(42);  sec->CanRead();   // False

#include "kvdata/automation/object.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata {

class IKVSecurity : public virtual Object {
 public:
  Long UserNumber() const { return IKVSecurity_UserNumber(); }
  void UserNumber(Long value) { IKVSecurity_UserNumber(value); }
  bool CanRead() const { return IKVSecurity_CanRead(); }
  bool CanAdd() const { return IKVSecurity_CanAdd(); }
  bool CanUpdate() const { return IKVSecurity_CanUpdate(); }
  bool CanDelete() const { return IKVSecurity_CanDelete(); }

 protected:
  virtual Long IKVSecurity_UserNumber() const = 0;
  virtual void IKVSecurity_UserNumber(Long value) = 0;
  virtual bool IKVSecurity_CanRead() const = 0;
  virtual bool IKVSecurity_CanAdd() const = 0;
  virtual bool IKVSecurity_CanUpdate() const = 0;
  virtual bool IKVSecurity_CanDelete() const = 0;
};

// Rights as this library has them: UserNumber is stored and returned (0 on
// a new object) and consulted by nothing; every Can... is False.
class InertSecurity : public IKVSecurity {
 protected:
  Long IKVSecurity_UserNumber() const override { return user_number_; }
  void IKVSecurity_UserNumber(Long value) override { user_number_ = value; }
  bool IKVSecurity_CanRead() const override { return false; }
  bool IKVSecurity_CanAdd() const override { return false; }
  bool IKVSecurity_CanUpdate() const override { return false; }
  bool IKVSecurity_CanDelete() const override { return false; }

 private:
  Long user_number_ = 0;
};

}  // namespace kvdata
