// SystemWindowsPrograms: other programs, the console and the arguments on Windows.
#include <fcntl.h>
#include <io.h>

#include "SystemWindows.h"
// after it
#include <shellapi.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <system_error>
#include <utility>

#include "System.h"

namespace morvik::base::system {

namespace {

/// Replaces what is no UTF-16.
std::string narrow(const wchar_t* text)
{
    const int size = WideCharToMultiByte(CP_UTF8, 0, text, -1, nullptr, 0, nullptr, nullptr);
    std::string utf8(static_cast<std::size_t>(std::max(size, 1)), '\0');
    WideCharToMultiByte(CP_UTF8, 0, text, -1, utf8.data(), size, nullptr, nullptr);
    utf8.pop_back();  // the null at the end
    return utf8;
}

[[noreturn]] void fail()
{
    setErrno();
    throw std::system_error(errno, std::generic_category());
}

/// A word of a command line as programs take it apart: in quotation marks, each of its own behind a backslash, and
/// twice as many backslashes in front of one.
std::wstring quoted(const std::wstring& word)
{
    std::wstring text = L"\"";
    std::size_t backslashes = 0;
    for (const wchar_t character : word) {
        if (character == L'"') {
            text.append(backslashes + 1, L'\\');
        }
        backslashes = character == L'\\' ? backslashes + 1 : 0;
        text += character;
    }
    return text.append(backslashes, L'\\') + L'"';
}

/// The program's file in the folders of PATH: CreateProcess() alone would look in the current folder, too.
std::wstring programFile(const std::string& name)
{
    const wchar_t* const path = _wgetenv(L"PATH");
    std::wstring file(MAX_PATH, L'\0');
    for (;;) {
        const DWORD length = SearchPathW(path == nullptr ? L"" : path,
                                         wide(name).c_str(),
                                         L".exe",
                                         static_cast<DWORD>(file.size()),
                                         file.data(),
                                         nullptr);
        if (length == 0) {
            fail();
        }
        const bool fits = length < file.size();
        file.resize(length);
        if (fits) {
            return file;
        }
    }
}

/// Handles that a child inherits, and the list of them, so that it inherits no others.
class Inheritance {
public:
    explicit Inheritance(const std::array<int, 3>& descriptors)
    {
        for (std::size_t i = 0; i < itsHandles.size(); ++i) {
            if (DuplicateHandle(GetCurrentProcess(),
                                handleOf(descriptors[i]),
                                GetCurrentProcess(),
                                &itsHandles[i],
                                0,
                                TRUE,
                                DUPLICATE_SAME_ACCESS) == FALSE) {
                fail();
            }
        }
        SIZE_T size = 0;
        InitializeProcThreadAttributeList(nullptr, 1, 0, &size);
        itsList.resize(size);
        if (InitializeProcThreadAttributeList(list(), 1, 0, &size) == FALSE ||
            UpdateProcThreadAttribute(
                list(), 0, PROC_THREAD_ATTRIBUTE_HANDLE_LIST, itsHandles.data(), sizeof itsHandles, nullptr, nullptr) ==
                FALSE) {
            fail();
        }
    }

    Inheritance(const Inheritance&) = delete;
    Inheritance& operator=(const Inheritance&) = delete;

    ~Inheritance()
    {
        DeleteProcThreadAttributeList(list());
        for (const HANDLE handle : itsHandles) {
            CloseHandle(handle);
        }
    }

    STARTUPINFOEXW startup()
    {
        STARTUPINFOEXW info = {};
        info.StartupInfo.cb = sizeof info;
        info.StartupInfo.dwFlags = STARTF_USESTDHANDLES;
        info.StartupInfo.hStdInput = itsHandles[0];
        info.StartupInfo.hStdOutput = itsHandles[1];
        info.StartupInfo.hStdError = itsHandles[2];
        info.lpAttributeList = list();
        return info;
    }

private:
    LPPROC_THREAD_ATTRIBUTE_LIST list()
    {
        return reinterpret_cast<LPPROC_THREAD_ATTRIBUTE_LIST>(itsList.data());
    }

    std::array<HANDLE, 3> itsHandles{};
    std::vector<char> itsList;
};

std::atomic<void (*)(int)> itsNote{nullptr};
std::atomic<unsigned> itsRequests{0};  // a bit for each kind that has come

/// Runs in a thread of its own.
BOOL WINAPI takeEndRequest(DWORD kind)
{
    const unsigned request = 1U << kind;
    const auto note = itsNote.load();
    if (note == nullptr || (itsRequests.fetch_or(request) & request) != 0) {
        return FALSE;  // which ends the process
    }
    const bool isOfUser = kind == CTRL_C_EVENT || kind == CTRL_BREAK_EVENT;
    note(isOfUser ? SIGINT : SIGTERM);
    if (!isOfUser) {
        Sleep(INFINITE);  // the process would end with the return; Windows waits for some seconds
    }
    return TRUE;
}

UINT itsEarlierCodePage = 0;

/// Lets a console show UTF-8 and take the sequences that erase a line.
void prepareConsole()
{
    const HANDLE console = GetStdHandle(STD_OUTPUT_HANDLE);
    DWORD mode = 0;
    if (GetConsoleMode(console, &mode) != FALSE) {
        SetConsoleMode(console, mode | ENABLE_VIRTUAL_TERMINAL_PROCESSING);
    }
    itsEarlierCodePage = GetConsoleOutputCP();
    if (itsEarlierCodePage != 0 && itsEarlierCodePage != CP_UTF8) {
        SetConsoleOutputCP(CP_UTF8);
        std::atexit([] { SetConsoleOutputCP(itsEarlierCodePage); });
    }
}

/// Replaces the arguments by their UTF-8 form.
void makeArgumentsUtf8(int& argc, char**& argv)
{
    static std::vector<std::string> words;
    static std::vector<char*> pointers;
    int count = 0;
    wchar_t** const wideWords = CommandLineToArgvW(GetCommandLineW(), &count);
    if (wideWords == nullptr) {
        return;
    }
    for (int i = 0; i < count; ++i) {
        words.push_back(narrow(wideWords[i]));
    }
    LocalFree(wideWords);
    for (std::string& word : words) {
        pointers.push_back(word.data());
    }
    pointers.push_back(nullptr);
    argc = count;
    argv = pointers.data();
}

}  // namespace

Process::Process(const std::vector<std::string>& commandLine, const std::array<int, 3>& streams)
{
    std::wstring line;
    for (const std::string& word : commandLine) {
        line += (line.empty() ? L"" : L" ") + quoted(std::filesystem::u8path(word).wstring());
    }
    Inheritance inheritance(streams);
    STARTUPINFOEXW startup = inheritance.startup();
    PROCESS_INFORMATION process = {};
    if (CreateProcessW(programFile(commandLine.front()).c_str(),
                       line.data(),
                       nullptr,
                       nullptr,
                       TRUE,
                       EXTENDED_STARTUPINFO_PRESENT | CREATE_NO_WINDOW,
                       nullptr,
                       nullptr,
                       &startup.StartupInfo,
                       &process) == FALSE) {
        fail();
    }
    CloseHandle(process.hThread);
    itsNumber = reinterpret_cast<std::intptr_t>(process.hProcess);
}

Process::~Process()
{
    if (itsNumber != 0) {
        TerminateProcess(reinterpret_cast<HANDLE>(itsNumber), 1);
        wait();
    }
}

bool Process::wait()
{
    const HANDLE process = reinterpret_cast<HANDLE>(std::exchange(itsNumber, 0));
    WaitForSingleObject(process, INFINITE);
    DWORD status = 1;
    GetExitCodeProcess(process, &status);
    CloseHandle(process);
    return status == 0;
}

std::optional<std::size_t> terminalWidth()
{
    CONSOLE_SCREEN_BUFFER_INFO info = {};
    if (GetConsoleScreenBufferInfo(GetStdHandle(STD_OUTPUT_HANDLE), &info) == FALSE) {
        return std::nullopt;
    }
    return static_cast<std::size_t>(std::max(info.srWindow.Right - info.srWindow.Left + 1, 1));
}

void watchEndRequests(void (*note)(int signal))
{
    itsRequests = 0;
    itsNote = note;
    SetConsoleCtrlHandler(takeEndRequest, TRUE);
}

void unwatchEndRequests(void (* /*note*/)(int signal))
{
    SetConsoleCtrlHandler(takeEndRequest, FALSE);
    itsNote = nullptr;
}

void prepareProgram(int& argc, char**& argv)
{
    for (const int stream : {standardInput, standardOutput, standardError}) {
        _setmode(stream, _O_BINARY);
    }
    SetErrorMode(SEM_FAILCRITICALERRORS | SEM_NOGPFAULTERRORBOX);  // no windows
    prepareConsole();
    makeArgumentsUtf8(argc, argv);
}

}  // namespace morvik::base::system
