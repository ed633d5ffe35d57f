// Measures, on the software board, how bodies are written into messages and read back, and how long a request
// takes until its reply is there.
#include <benchmark/benchmark.h>

#include <algorithm>

#include "vela/Board.h"
#include "vela/CCS.h"
#include "vela/vela.h"

namespace {

using Record = vela::CCS::EvtL2Trace_t;

void initOnce() {
    static const bool done = (vela::velaInit(), true);
    benchmark::DoNotOptimize(done);
}

Record recordOf(unsigned int octets) {
    Record record;
    record.Label = 2;
    record.Direction = 1;
    record.Timestamp = 3001;
    record.Length = octets;
    record.List->realloc(octets);
    std::fill(record.List->begin(), record.List->end(), static_cast<unsigned char>(0x2A));
    return record;
}

template <typename Body>
void writing(benchmark::State& state, Body body) {
    initOnce();
    vela::Msg msg(body.GetByteSize());
    for (auto _ : state)
        benchmark::DoNotOptimize(msg.write(&body, 0));
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * body.GetByteSize());
}

template <typename Body>
void reading(benchmark::State& state, Body body) {
    initOnce();
    vela::Msg msg(body.GetByteSize());
    msg.write(&body, 0);
    for (auto _ : state)
        benchmark::DoNotOptimize(msg.read(&body, 0));
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * body.GetByteSize());
}

vela::CCS::MsgSetParm_t setParm() {
    vela::CCS::MsgSetParm_t body;
    body.Parm = 10;
    body.Val = 1;
    return body;
}

void aCommandWritten(benchmark::State& state) { writing(state, setParm()); }
BENCHMARK(aCommandWritten);
void aCommandRead(benchmark::State& state) { reading(state, setParm()); }
BENCHMARK(aCommandRead);
// The benchmark's argument is the number of octets in the frame.
void aTraceRecordWritten(benchmark::State& state) {
    writing(state, recordOf(static_cast<unsigned int>(state.range(0))));
}
BENCHMARK(aTraceRecordWritten)->Arg(4)->Arg(40)->Arg(257);
void aTraceRecordRead(benchmark::State& state) {
    reading(state, recordOf(static_cast<unsigned int>(state.range(0))));
}
BENCHMARK(aTraceRecordRead)->Arg(4)->Arg(40)->Arg(257);

void aRequestAnswered(benchmark::State& state) {
    initOnce();
    vela::Board board(1, nullptr);
    vela::CCS ccs(board.findInst(0x15, 0xFF, 1).getTgtDesc(), board.getMsgQueue());
    vela::CCS::MsgGetParmCmplt_t reply;
    for (auto _ : state)
        ccs.GetParm(7, &reply);
    if (reply.Val != 7)
        state.SkipWithError("another answer than expected");
}
BENCHMARK(aRequestAnswered)->UseRealTime();

}  // namespace
