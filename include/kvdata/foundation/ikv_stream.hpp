#pragma once
// Byte-stream encoding of a domain object at a running Position.
//
//   kvdata::ByteArray bytes;  kvdata::Long pos = 0;
//   obj->StreamOut(bytes, pos);  other->StreamIn(bytes);   // omitted Position starts at 0

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/object.hpp"

namespace kvdata {

// Position is an index into the array itself, not an offset from its lower
// bound. A passed Position comes back just past the last byte written or
// read, so successive calls lay objects one after another; an omitted
// Position starts at 0. Failure is reported through the False result (each
// class says what it does beyond that); bytes already written or consumed
// stay so and Position is not rewound.
class IKVStream : public virtual Object {
 public:
  // Decodes an encoding starting at Position and replaces the object's state.
  bool StreamIn(const ByteArray& bytStream, Long& Position) {
    return IKVStream_StreamIn(bytStream, Position);
  }
  bool StreamIn(const ByteArray& bytStream) {
    Long position = 0;
    return IKVStream_StreamIn(bytStream, position);
  }
  // Encodes the object starting at Position; resizes the array by the class's own rule.
  bool StreamOut(ByteArray& bytStream, Long& Position) {
    return IKVStream_StreamOut(bytStream, Position);
  }
  bool StreamOut(ByteArray& bytStream) {
    Long position = 0;
    return IKVStream_StreamOut(bytStream, position);
  }
  // The byte count the class reports for its encoding.
  Long StreamLen() const { return IKVStream_StreamLen(); }

 protected:
  virtual bool IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) = 0;
  virtual bool IKVStream_StreamOut(ByteArray& bytStream, Long& Position) = 0;
  virtual Long IKVStream_StreamLen() const = 0;
};

}  // namespace kvdata
