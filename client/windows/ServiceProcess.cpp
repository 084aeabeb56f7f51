#include "client/machine/ServiceProcess.h"

#include <windows.h>

#include <cstddef>
#include <span>
#include <system_error>

#include "client/terminal/ClientError.h"
#include "client/windows/SignalQueue.h"
#include "platform/windows/Handle.h"
#include "text/TextConversion.h"

namespace vexa::client {

using platform::Handle;

namespace {

std::string lastErrorText() {
    return std::system_category().message(static_cast<int>(GetLastError()));
}

/// A handle that a child can have.
Handle openForChild(const wchar_t* path, DWORD access, DWORD disposition) {
    SECURITY_ATTRIBUTES inheritable{sizeof inheritable, nullptr, TRUE};
    return Handle(CreateFileW(path, access, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                              &inheritable, disposition, FILE_ATTRIBUTE_NORMAL, nullptr));
}

Handle duplicateForChild(HANDLE handle) {
    Handle copy;
    const HANDLE self = GetCurrentProcess();
    DuplicateHandle(self, handle, self, copy.receive(), 0, TRUE, DUPLICATE_SAME_ACCESS);
    return copy;
}

/// Names the handles that a child inherits; all others stay here.
class InheritedHandles {
public:
    explicit InheritedHandles(std::span<HANDLE> handles) {
        SIZE_T size = 0;
        InitializeProcThreadAttributeList(nullptr, 1, 0, &size);
        m_storage.resize(size);
        InitializeProcThreadAttributeList(list(), 1, 0, &size);
        UpdateProcThreadAttribute(list(), 0, PROC_THREAD_ATTRIBUTE_HANDLE_LIST, handles.data(),
                                  handles.size_bytes(), nullptr, nullptr);
    }
    ~InheritedHandles() { DeleteProcThreadAttributeList(list()); }
    InheritedHandles(const InheritedHandles&) = delete;
    InheritedHandles& operator=(const InheritedHandles&) = delete;

    LPPROC_THREAD_ATTRIBUTE_LIST list() {
        return reinterpret_cast<LPPROC_THREAD_ATTRIBUTE_LIST>(m_storage.data());
    }

private:
    std::vector<std::byte> m_storage;
};

/// The program's name in quotes, then the arguments, which are numbers.
std::wstring commandLine(const ServiceProgram& program) {
    std::wstring line = L"\"" + program.executable.wstring() + L"\"";
    for (const std::string& argument : program.arguments)
        line.append(L" ").append(wideFromUtf8(argument));
    return line;
}

/// Starts the program with these streams; gives its handle, or none.
Handle launch(const ServiceProgram& program, const Handle& input, const Handle& output,
              const Handle& errors) {
    std::vector<HANDLE> inherited{input.get(), output.get()};
    if (errors) inherited.push_back(errors.get());
    InheritedHandles handles(inherited);
    STARTUPINFOEXW startup{};
    startup.StartupInfo.cb = sizeof startup;
    startup.StartupInfo.dwFlags = STARTF_USESTDHANDLES;
    startup.StartupInfo.hStdInput = input.get();
    startup.StartupInfo.hStdOutput = output.get();
    startup.StartupInfo.hStdError = errors.get();
    startup.lpAttributeList = handles.list();
    std::wstring line = commandLine(program);
    PROCESS_INFORMATION process{};
    if (CreateProcessW(program.executable.c_str(), line.data(), nullptr, nullptr, TRUE,
                       EXTENDED_STARTUPINFO_PRESENT | CREATE_NEW_PROCESS_GROUP, nullptr, nullptr,
                       &startup.StartupInfo, &process) == 0)
        return Handle();
    const Handle thread(process.hThread);
    return Handle(process.hProcess);
}

void CALLBACK onEnd(PVOID /*nothing*/, BOOLEAN /*timedOut*/) {
    raiseSignal(Signal::Child);
}

}  // namespace

struct ServiceProcess::State {
    Handle process;
    HANDLE wait = nullptr;
};

ServiceProcess::ServiceProcess(const ServiceProgram& program) : m_state(std::make_unique<State>()) {
    const Handle input = openForChild(L"NUL", GENERIC_READ, OPEN_EXISTING);
    const Handle output = openForChild(program.outputFile.c_str(), FILE_APPEND_DATA, CREATE_ALWAYS);
    const Handle errors = duplicateForChild(GetStdHandle(STD_ERROR_HANDLE));
    m_state->process = launch(program, input, output, errors);
    if (!m_state->process)
        throw ClientError(
            "the service " + program.executable.string() + " cannot be started: " + lastErrorText(),
            kExitNotStarted);
    RegisterWaitForSingleObject(&m_state->wait, m_state->process.get(), onEnd, nullptr, INFINITE,
                                WT_EXECUTEONLYONCE);
}

ServiceProcess::~ServiceProcess() {
    if (!exitCode()) kill();
    if (m_state->wait != nullptr) UnregisterWaitEx(m_state->wait, INVALID_HANDLE_VALUE);
}

std::optional<int> ServiceProcess::exitCode() {
    if (m_exitCode) return m_exitCode;
    if (WaitForSingleObject(m_state->process.get(), 0) != WAIT_OBJECT_0) return std::nullopt;
    DWORD code = 0;
    GetExitCodeProcess(m_state->process.get(), &code);
    m_exitCode = static_cast<int>(code);
    return m_exitCode;
}

void ServiceProcess::kill() {
    if (m_exitCode) return;
    constexpr UINT kKilled = 128 + 9;
    TerminateProcess(m_state->process.get(), kKilled);
    WaitForSingleObject(m_state->process.get(), INFINITE);
    exitCode();
}

}  // namespace vexa::client
