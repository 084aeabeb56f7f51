/*
 * How a parent starts the wireless service, keeps it running and stops it.
 *
 *     start_service PATH-OF-VEXA-SERVICE SECONDS SA-PORT HS20-PORT
 *
 * The order matters. The service runs as long as somebody else owns the stop mutex, so the parent creates and
 * owns it first and starts the process then. To stop the service it releases the mutex; if the parent dies, the
 * mutex is abandoned and the service stops as well. Ownership is a thread's: the thread that takes the mutex has
 * to be the one that releases it, and has to live as long as the service is wanted.
 */
#include <stdio.h>
#include <stdlib.h>
#include <wchar.h>
#include <windows.h>

static const wchar_t stop_mutex_name[] = L"{39EAA3ED-1A26-46B7-90A7-AAFFECE80392}";
static const DWORD stop_limit_ms = 30000;

/* The stop mutex, owned by this thread; NULL if another parent has it. */
static HANDLE take_stop_mutex(void)
{
    HANDLE mutex = CreateMutexW(NULL, TRUE, stop_mutex_name);
    DWORD outcome;
    if (mutex == NULL || GetLastError() != ERROR_ALREADY_EXISTS)
        return mutex;
    outcome = WaitForSingleObject(mutex, 0);
    if (outcome == WAIT_OBJECT_0 || outcome == WAIT_ABANDONED)
        return mutex;
    CloseHandle(mutex);
    return NULL;
}

/* The two ports, separated by exactly one blank, behind the program's name in quotes. */
static HANDLE start_process(const wchar_t *program, const wchar_t *sa_port, const wchar_t *hs20_port)
{
    wchar_t line[1024];
    STARTUPINFOW startup;
    PROCESS_INFORMATION process;
    ZeroMemory(&startup, sizeof startup);
    startup.cb = sizeof startup;
    if (swprintf(line, sizeof line / sizeof line[0], L"\"%ls\" %ls %ls", program, sa_port, hs20_port) < 0)
        return NULL;
    if (!CreateProcessW(program, line, NULL, NULL, FALSE, 0, NULL, NULL, &startup, &process))
        return NULL;
    CloseHandle(process.hThread);
    return process.hProcess;
}

int wmain(int argc, wchar_t **argv)
{
    DWORD seconds;
    DWORD exit_code = 1;
    HANDLE process;
    HANDLE mutex;

    if (argc != 5) {
        fprintf(stderr, "usage: start_service PATH-OF-VEXA-SERVICE SECONDS SA-PORT HS20-PORT\n");
        return 2;
    }
    seconds = (DWORD)wcstoul(argv[2], NULL, 10);
    mutex = take_stop_mutex();
    if (mutex == NULL) {
        fprintf(stderr, "another parent has a service already\n");
        return 1;
    }
    process = start_process(argv[1], argv[3], argv[4]);
    if (process == NULL) {
        fprintf(stderr, "the service cannot be started: error %lu\n", GetLastError());
        return 1;
    }
    printf("the service runs on the ports %ls and %ls\n", argv[3], argv[4]);
    fflush(stdout);

    /* A service that ends by itself has found a port busy, or another service running. */
    if (WaitForSingleObject(process, seconds * 1000) == WAIT_TIMEOUT) {
        ReleaseMutex(mutex);
        if (WaitForSingleObject(process, stop_limit_ms) == WAIT_TIMEOUT)
            TerminateProcess(process, 1);
        WaitForSingleObject(process, INFINITE);
    }
    GetExitCodeProcess(process, &exit_code);
    printf("the service has ended with exit code %lu\n", exit_code);
    CloseHandle(process);
    CloseHandle(mutex);
    return (int)exit_code;
}
