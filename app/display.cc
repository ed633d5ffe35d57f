#include "app/display.h"

#include <algorithm>
#include <atomic>
#include <ctime>
#include <iostream>
#include <memory>
#include <mutex>

#include "app/Arrivals.h"
#include "app/Log.h"
#include "app/guarded.h"
#include "app/operator.h"
#include "decoder/cursor.h"
#include "decoder/frame.h"
#include "decoder/lines.h"
#include "decoder/log_lines.h"
#include "decoder/time_lines.h"

namespace app {

vela::Queue event_queue(queueCapacity);
vela::Mutex queueGuard;
vela::Semaphore sema(queueCapacity, 0);
vela::Thread Process(&Process_L2_Trace, 0);
int trunkVariant = 0;

namespace {

using Record = vela::CCS::EvtL2Trace_t;

constexpr unsigned int frameLabel = 2;
constexpr unsigned int transmitted = 1;

// The numbers in the reports of foreign exceptions.
constexpr int callbackPlace = 100;
constexpr int displayThreadPlace = 215;

constexpr unsigned int pollMs = 10;
constexpr int enoughToShow = queueCapacity / 2;

// True while the display thread waits for records to gather. The callback that makes them enough sets it to
// false and posts `enough`, once for each such wait.
std::atomic<bool> gathering = false;
vela::Semaphore enough(1, 0);

// Guarded by queueGuard.
decoder::LocalTime localTime;

// The length of the frame: the announced one, but not more than the list holds. A length that makes the frame
// oversized is kept as it is.
int frameLength(unsigned int announced, unsigned int held) {
    const int length = std::max(static_cast<int>(announced), 0);
    return length > decoder::maximumFrame ? length : std::min(length, static_cast<int>(held));
}

std::unique_ptr<Record> takeRecord() {
    if (event_queue.isempty())
        return nullptr;
    Record* taken = nullptr;
    if (!event_queue.dequeue(&taken)) {
        decoder::text(decoder::getFailed);
        decoder::flushLines();
    }
    return std::unique_ptr<Record>(taken);
}

void flushLog() {
    const std::lock_guard guard(queueGuard);
    traceLog.flush();
}

// Ends the display thread if it is cancelled, but not while records that have arrived must still be written.
void testCancel(vela::Thread::control& ctl) {
    if (!arrivals->isClosed() || arrivals->unwritten() == 0 || shutdownHurried())
        ctl.testCancel();
}

// Waits for a record. Records that follow one another are written together, because waking this thread for
// each of them costs more than writing it. The first record after a pause wakes it at once.
void awaitRecord(vela::Thread::control& ctl) {
    if (sema.tryWait())
        return;
    gathering = true;
    enough.tryWait(pollMs, pollMs);
    gathering = false;
    if (sema.tryWait())
        return;
    do {
        flushLog();
        testCancel(ctl);
    } while (!sema.tryWait(pollMs, pollMs));
}

// Writes the next record. Returns false when the queue is empty.
bool showNext(vela::Thread::control& ctl, vela::staticList<unsigned char>& octets) {
    const std::lock_guard guard(queueGuard);
    testCancel(ctl);
    const std::unique_ptr<Record> rec = takeRecord();
    if (rec != nullptr)
        showRecord(*rec, octets);
    if (event_queue.isempty())
        traceLog.flushIfDue();
    return rec != nullptr;
}

void displayForEver(vela::Thread::control& ctl) {
    decoder::swit = trunkVariant;
    vela::staticList<unsigned char> octets;  // working memory for all records
    while (true) {
        awaitRecord(ctl);
        if (showNext(ctl, octets))
            arrivals->gone();
    }
}

// Puts rec into the queue, in its turn. Called under queueGuard.
void queueRecord(std::unique_ptr<Record> rec) {
    if (!event_queue.enqueue(rec.get())) {
        arrivals->refused(*rec);
        decoder::text(decoder::enqueueFailed);
        decoder::flushLines();
        return;
    }
    static_cast<void>(rec.release());  // now the thread that dequeues it owns it
    sema.post();
    if (event_queue.queuecount() >= enoughToShow && gathering.exchange(false))
        enough.post();
}

}  // namespace

void showRecord(Record& rec, vela::staticList<unsigned char>& octets) {
    if (rec.arrival().missing != 0)
        traceLog.framesMissing(rec.arrival().missing);
    if (rec.Label != frameLabel) {
        std::cout << "ERROR - received unexpected rtc event" << std::endl;
        return;
    }
    octets = rec.List.value();
    decoder::msglen = frameLength(rec.Length, octets.length());
    decoder::timeLines(rec.Direction == transmitted, rec.Timestamp, localTime.of(std::time(nullptr)));
    decoder::RingBuffer frame;
    if (decoder::getBlock(&frame, octets, decoder::msglen)) {
        decoder::parse_isdn_frame(frame);
    } else {
        decoder::output(decoder::flag);
        std::cout << decoder::frameError << std::endl;
        decoder::text(decoder::frameError, " \n");
    }
    traceLog.frameFollows();
    decoder::flushLines();
}

void HANDLE_L2Trace_events(vela::CCS*, unsigned int, Record* rec) {
    std::unique_ptr<Record> held(rec);
    guarded(callbackPlace, [&] {
        const std::lock_guard guard(queueGuard);
        arrivals->takeInTurn(std::move(held), queueRecord);
    });
}

void* Process_L2_Trace(vela::Thread::control* ctl, void*) {
    guarded(displayThreadPlace, [&] { displayForEver(*ctl); });
    return nullptr;
}

Discarded discardQueued() {
    Discarded discarded;
    const auto discard = [&](const std::unique_ptr<Record>& rec) {
        ++discarded.records;
        discarded.missing += rec->arrival().missing;
        arrivals->gone();
    };
    Record* rec = nullptr;
    while (event_queue.dequeue(&rec))
        discard(std::unique_ptr<Record>(rec));
    arrivals->releaseEarly(discard);
    return discarded;
}

}  // namespace app
