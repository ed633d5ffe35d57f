#include "app/display.h"

#include <algorithm>
#include <ctime>
#include <iostream>
#include <memory>
#include <mutex>

#include "app/Arrivals.h"
#include "app/Log.h"
#include "app/guarded.h"
#include "decoder/cursor.h"
#include "decoder/frame.h"
#include "decoder/lines.h"
#include "decoder/log_lines.h"
#include "decoder/time_lines.h"

namespace app {

vela::Queue event_queue(QueueCapacity);
vela::Mutex queueGuard;
vela::Semaphore sema(QueueCapacity, 0);
vela::Thread Process(&Process_L2_Trace, 0);
int trunkVariant = 0;

namespace {

using Record = vela::CCS::EvtL2Trace_t;

constexpr unsigned int FrameLabel = 2;
constexpr unsigned int Transmitted = 1;

// What the reports of foreign exceptions carry.
constexpr int CallbackPlace = 100;
constexpr int DisplayThreadPlace = 215;

static_assert(Arrivals::Most <= unsigned{QueueCapacity}, "a record that has a place finds room in the queue");

// Under queueGuard.
decoder::LocalTime localTime;

// The announced length; no more than the list holds unless it is too much anyway.
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

void displayForEver(vela::Thread::control& ctl) {
    decoder::swit = trunkVariant;
    vela::staticList<unsigned char> octets;  // reused for every record
    while (true) {
        while (!sema.tryWait(10, 10)) {
            flushLog();
            ctl.testCancel();
        }
        const std::lock_guard guard(queueGuard);
        ctl.testCancel();
        if (const std::unique_ptr<Record> rec = takeRecord(); rec != nullptr)
            showRecord(*rec, octets);
        if (event_queue.isempty())
            traceLog.flushIfDue();
    }
}

}  // namespace

void showRecord(Record& rec, vela::staticList<unsigned char>& octets) {
    if (rec.Label != FrameLabel) {
        std::cout << "ERROR - received unexpected rtc event" << std::endl;
        return;
    }
    octets = rec.List.value();
    decoder::msglen = frameLength(rec.Length, octets.length());
    // A refusal reaches the log before the screen, and so in two parts.
    traceLog.frameFollows(decoder::msglen > decoder::maximumFrame ? 2 : 1);
    decoder::timeLines(rec.Direction == Transmitted, rec.Timestamp, localTime.of(std::time(nullptr)));
    decoder::RingBuffer frame;
    if (decoder::getBlock(&frame, octets, decoder::msglen)) {
        decoder::parse_isdn_frame(frame);
        return;
    }
    decoder::output(decoder::flag);
    std::cout << decoder::frameError << std::endl;
    decoder::text(decoder::frameError, " \n");
    decoder::flushLines();
}

void HANDLE_L2Trace_events(vela::CCS*, unsigned int, Record* rec) {
    std::unique_ptr<Record> held(rec);
    guarded(CallbackPlace, [&] {
        const Turn turn(held.get());
        if (turn.isLate())
            return;
        const std::lock_guard guard(queueGuard);
        if (event_queue.enqueue(held.get())) {
            static_cast<void>(held.release());  // the queue's entry's now
            sema.post();
        } else {
            decoder::text(decoder::enqueueFailed);
            decoder::flushLines();
        }
    });
}

void* Process_L2_Trace(vela::Thread::control* ctl, void*) {
    // Once nobody takes records any more, none must wait for a place.
    struct NoMoreRoom {
        ~NoMoreRoom() { arrivals.close(); }
    } const whenItEnds;
    guarded(DisplayThreadPlace, [&] { displayForEver(*ctl); });
    return nullptr;
}

void discardQueued() {
    Record* rec = nullptr;
    while (event_queue.dequeue(&rec))
        const std::unique_ptr<Record> gone(rec);
}

}  // namespace app
