// SPDX-License-Identifier: MIT
#pragma once

/**
 * Catches the signals that concern the daemon.
 *
 * SIGINT and SIGTERM run `callback` (null: nothing) on a thread of this module, not inside the
 * handler: a handler may interrupt a thread that holds the heap's or a log's lock, and a callback
 * that needs it would then wait for ever. SIGSEGV, SIGBUS, SIGFPE and SIGQUIT print a back-trace
 * and abort. SIGALRM, SIGPIPE, SIGPWR, SIGUSR1 and SIGUSR2 are caught and ignored.
 *
 * Every call replaces callback and name; the first one installs the handlers. Call it while the
 * process has one thread.
 */
void registerSystemSignalHandler(void (*callback)(), const char* processName);
