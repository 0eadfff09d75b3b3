// KTHttpDate.h: a point in time as HTTP writes it (RFC 2616, section 3.3.1, the fixed-length form).

#pragma once

#include <cstdint>
#include <string>

/// "Sun, 06 Nov 1994 08:49:37 GMT" for 784111777 seconds since 1970-01-01 00:00 UTC. Any thread.
std::string KTHttpDate(std::int64_t secondsSince1970);
