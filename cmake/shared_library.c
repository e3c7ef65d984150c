/* The shared library is made of the archive of all rooms; a target of its own wants one source. */
typedef int ingester_shared_library;
