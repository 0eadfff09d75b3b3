// KTSleep.cpp: the interruptible sleep.

#include "KTThread.h"

#include <boost/date_time/posix_time/posix_time_types.hpp>
#include <boost/thread/thread.hpp>

void KTSleepForDuration(unsigned long seconds, unsigned long milliseconds) {
    boost::this_thread::sleep(boost::posix_time::microsec_clock::universal_time() +
                              boost::posix_time::seconds(seconds) + boost::posix_time::milliseconds(milliseconds));
}
