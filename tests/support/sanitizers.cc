// The options that every test program gives to the sanitizers, if they are built in.
extern "C" {

const char* __asan_default_options();
const char* __tsan_default_options();

// Some tests ask for more memory than there is.
const char* __asan_default_options() { return "allocator_may_return_null=1"; }

// The system uses some mutexes as signals: one thread locks and another unlocks.
const char* __tsan_default_options() { return "report_mutex_bugs=0 allocator_may_return_null=1"; }
}
