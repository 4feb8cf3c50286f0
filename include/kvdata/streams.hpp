#pragma once
// Byte-stream serialization: the field codec, the record streams and the
// stream files, and the policy by which every file is written.

#include "kvdata/streams/field_codec.hpp"
#include "kvdata/streams/file_output.hpp"
#include "kvdata/streams/stream_observer.hpp"
#include "kvdata/streams/streams.hpp"
