// WCrash.h: the library's crash handling at work: a worker faults while it saves the course.

#pragma once

#include "CourseFiles.h"
#include "WConsole.h"

/// Saves the course's texts as a project in the folder "ktdemo-project" of the system's temporary folder, saves it again
/// on a worker thread, and has that fault half-way. The host's crash handling then keeps the texts as
/// "course.ktbak" beside the saved project, shows the message to the user (and answers it), and ends the process with
/// status 1. Returns only if that went wrong.
void CrashWhileSaving(Console const &console, CourseFolder const &folder);
