#pragma once
// Reference-counted automation objects, interface query and outgoing events.
//
//   std::shared_ptr<kvdata::Object> obj = kvdata::CreateObject(u"KVData.KVUser");
//   auto stream = kvdata::query<kvdata::IKVStream>(obj);   // null if not implemented

#include <cstddef>
#include <functional>
#include <memory>
#include <utility>
#include <vector>

namespace kvdata {

// Base of every class and interface of the library. Objects live in
// std::shared_ptr (the reference count); interfaces derive from Object
// virtually so that any interface pointer can be queried for another.
//
// Threads: an object is used by one thread at a time. Different objects may
// be used on different threads at once; one object shared by threads (and
// likewise an Array, a record or a Variant) needs the caller's lock around
// every call, reads included. Copying and releasing the shared_ptr is safe.
class Object : public std::enable_shared_from_this<Object> {
 public:
  virtual ~Object() = default;
  Object(const Object&) = delete;
  Object& operator=(const Object&) = delete;

 protected:
  Object() = default;
};

// Interface query: the object as interface I, or null when it does not implement I.
template <class I, class U>
std::shared_ptr<I> query(const std::shared_ptr<U>& object) {
  return std::dynamic_pointer_cast<I>(object);
}

// An outgoing event. Callers connect callbacks; the source raises it.
template <class... Args>
class Event {
 public:
  using Handler = std::function<void(Args...)>;
  using Token = std::size_t;

  Token connect(Handler handler) {
    handlers_.emplace_back(++last_token_, std::move(handler));
    return last_token_;
  }
  void disconnect(Token token) {
    std::erase_if(handlers_, [token](const auto& h) { return h.first == token; });
  }
  std::size_t connection_count() const { return handlers_.size(); }

  void raise(Args... args) const {
    const auto snapshot = handlers_;  // a handler may disconnect itself
    for (const auto& h : snapshot) h.second(args...);
  }

 private:
  std::vector<std::pair<Token, Handler>> handlers_;
  Token last_token_ = 0;
};

}  // namespace kvdata
