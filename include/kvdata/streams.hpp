#pragma once
// Byte-stream serialization: the field codec, the record streams and the
// stream files.

#include "kvdata/streams/field_codec.hpp"
#include "kvdata/streams/stream_observer.hpp"
#include "kvdata/streams/streams.hpp"
