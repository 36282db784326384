// jemalloc's start-up options for orv-cimhost (read once, before the first allocation).
//
// One arena for every thread: a request's objects are freed on the thread that made them,
// but successive requests run on different HTTP workers, and with an arena per worker each
// one keeps its own freed pages, so a 1,024-port enumeration served five times left about
// 110 MB resident instead of 70 MB. The threads' caches still take the small allocations
// without the arena's lock, and throughput with one arena was the same or higher in
// bench/cimhost/compare_sfcb.sh.
extern "C" {
// The name jemalloc looks up; an environment MALLOC_CONF still overrides it.
extern __attribute__((visibility("default"))) const char* malloc_conf;
__attribute__((visibility("default"))) const char* malloc_conf = "narenas:1";
}
