#include "kvdata/streams/stream_observer.hpp"

namespace kvdata {
namespace {

thread_local StreamObserver* current = nullptr;

}  // namespace

ObservedStreams::ObservedStreams(StreamObserver& observer) noexcept : previous_(current) {
  current = &observer;
}

ObservedStreams::~ObservedStreams() {
  current = previous_;
}

StreamObserver* stream_observer() noexcept {
  return current;
}

}  // namespace kvdata
