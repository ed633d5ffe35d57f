// What the sanitizers, where they are built in, are told by every test program.
extern "C" {

const char* __asan_default_options();
const char* __tsan_default_options();

// Tests ask for more memory than there is.
const char* __asan_default_options() { return "allocator_may_return_null=1"; }

// Mutexes that one thread takes and another releases are signals by design.
const char* __tsan_default_options() { return "report_mutex_bugs=0 allocator_may_return_null=1"; }
}
