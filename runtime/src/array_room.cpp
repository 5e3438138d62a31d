// runtime/src/array_room.cpp: where host arrays stand.
//
// A call makes arrays and sees others go. Each thread keeps the rooms of some that went for the
// next ones, so that most cost neither the heap nor a lock.
#include "array_storage.hpp"
#include "large_room.hpp"
#include "tessel/runtime/module.hpp"

#include <pthread.h>

#include <atomic>
#include <cstddef>
#include <new>
#include <utility>

namespace tessel {
namespace {

/// None where a sanitizer is to find out who uses an array that is no more.
constexpr std::size_t most = TESSEL_KEEPS_MEMORY != 0 ? 32 : 0;

/// A thread's rooms, each with the next one's address in it. Plain data, because arrays may go
/// after everything else of the thread has gone.
struct SpareRooms {
    void *first;
    std::size_t count;
    bool endKnown; ///< the thread gives them back when it ends
};
[[gnu::tls_model("initial-exec")]] constinit thread_local SpareRooms spare = {};

/// Gives the calling thread's rooms back; from then on it keeps none.
void giveBackRooms(void * /*unused*/) {
    while (spare.first != nullptr) {
        ::operator delete(std::exchange(spare.first, *static_cast<void **>(spare.first)));
    }
    spare.count = most;
}

/// How the end of a thread is learned: by a key of the system's, which can say that there is no
/// memory. An object that is destroyed with the thread would end the process instead. Threads may
/// outlive what makes and deletes the key, and ask for it.
pthread_key_t threadEnd = 0;
std::atomic<bool> threadEndIsThere = false;

class ThreadEnd {
  public:
    ThreadEnd() noexcept { threadEndIsThere = pthread_key_create(&threadEnd, giveBackRooms) == 0; }
    ~ThreadEnd() {
        if (threadEndIsThere.exchange(false)) {
            pthread_key_delete(threadEnd);
        }
        giveBackRooms(nullptr); // of the thread that unloads this library
    }
    ThreadEnd(const ThreadEnd &) = delete;
    ThreadEnd &operator=(const ThreadEnd &) = delete;
};
const ThreadEnd makesAndDeletesTheKey;

/// Has the calling thread give its rooms back when it ends; false if it will not.
bool endIsKnown() noexcept {
    return threadEndIsThere && pthread_setspecific(threadEnd, &spare) == 0;
}

/// Whether a room may be kept. Known once for a thread.
bool mayKeep() noexcept {
    if (spare.count >= most || isChecked()) {
        return false;
    }
    spare.endKnown = spare.endKnown || endIsKnown();
    return spare.endKnown;
}

} // namespace
} // namespace tessel

void *tsArray::operator new(std::size_t size) {
    using tessel::spare;
    if (spare.first == nullptr || tessel::isChecked()) {
        void *const room =
            tessel::orWithoutSpares([size] { return ::operator new(size, std::nothrow); });
        if (room == nullptr) {
            throw std::bad_alloc();
        }
        return room;
    }
    --spare.count;
    return std::exchange(spare.first, *static_cast<void **>(spare.first));
}

void tsArray::operator delete(void *room) noexcept {
    using tessel::spare;
    if (!tessel::mayKeep()) {
        ::operator delete(room);
        return;
    }
    ++spare.count;
    *static_cast<void **>(room) = std::exchange(spare.first, room);
}
