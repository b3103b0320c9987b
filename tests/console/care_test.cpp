#include <support/child_process.h>

#include <gtest/gtest.h>

#include <algorithm>

namespace {

/// What a shell's commands print on a virtual console, both streams being one, and their exit status.
ChildOutcome OnConsole(std::string const& commands, std::string const& options = {})
{
    // The sanitizers would take faults for their own.
    setenv("COMMANDS",
        ("export ASAN_OPTIONS=$ASAN_OPTIONS:handle_segv=0 TSAN_OPTIONS=handle_segv=0; exec 2>&1; " + commands)
            .c_str(),
        1);
    std::string const all = TESSELLA_CONSOLE " " + options + " -- sh -c \"$COMMANDS\"";
    auto outcome = RunChild([&] { return execl("/bin/sh", "sh", "-c", all.c_str(), nullptr); });
    outcome.status = WEXITSTATUS(outcome.status);
    return outcome;
}

/// A program that takes the console, and then does something.
std::string Taking(std::string const& then)
{
    return "sh -c '(until " CONSOLE_STATE " | grep -q \"screen 1\"; do :; done; " + then +
        ") & exec " INPUT_PROBE " >/dev/null'";
}

std::string const kGuard = TESSELLA_RUN " -- ", kState = "; " CONSOLE_STATE;

TEST(Guardian, PutsTheConsoleBackWhateverEndsTheProgram)
{
    std::string const before = OnConsole("true" + kState).out;
    std::string const fresh = OnConsole("stty iutf8 </dev/tty0" + kState).out;  // as the kernel has it
    for (auto const& [signal, status] :
        {std::pair("KILL", "137"), {"SEGV", "139"}, {"ABRT", "134"}, {"USR1", "138"}}) {
        std::string const dying = Taking("kill -" + std::string(signal) + " $$");
        std::string const after = OnConsole(kGuard + dying + "; echo $?" + kState).out;
        EXPECT_NE(after.find("tessella-run: sh was ended by signal"), after.npos);
        EXPECT_TRUE(after.ends_with(status + std::string("\n") + before)) << after;
        EXPECT_FALSE(OnConsole(dying + kState).out.ends_with(before));
        EXPECT_TRUE(OnConsole(dying + "; " TESSELLA_RUN " --restore" + kState).out.ends_with(fresh));
    }
    EXPECT_EQ(
        OnConsole(kGuard + "sh -c 'stty raw </dev/tty0; exit 3'; echo $?" + kState).out, "3\n" + before);
}

TEST(Guardian, PassesOnSignalsAndKeepsTheLastWords)
{
    EXPECT_EQ(OnConsole("w=$(mktemp); " + kGuard +
                  "sh -c 'trap \"echo bye; exit 7\" TERM; echo up; while :; do sleep 0.01; done' >$w &"
                  " until grep -q up $w; do :; done; kill $!; wait $!; echo $?; cat $w; rm $w")
                  .out,
        "7\nup\nbye\n");
    // Held back from a terminal only, and then from the middle of a long text on.
    EXPECT_EQ(OnConsole(kGuard + "sh -c 'echo at once >&2; cat'</dev/null").out, "at once\n");
    std::string const held = OnConsole("script -qec \"" + kGuard +
        "sh -c 'head -c 100000 /dev/zero | tr \\\\\\\\0 x >&2; echo first; echo last >&2'\" /dev/null")
                                 .out;
    EXPECT_TRUE(held.starts_with("first\r\nx") && held.ends_with("xlast\r\n")) << held.substr(0, 99);
    EXPECT_EQ(std::ranges::count(held, 'x'), 65536 - 5);
}

TEST(Guardian, SaysWhatItCannotDo)
{
    struct {
        char const *words, *text;
        int status;
    } const cases[] = {{"", "no program is given", 2}, {"--any", "unknown option '--any'", 2},
        {"--tty", "needs a device", 2}, {"--restore true", "runs no program", 2},
        {"--tty /dev/tty0 true", "for --restore", 2}, {"./none", "cannot run ./none: No such file", 127},
        {"--restore --tty /dev/null", "/dev/null: Inappropriate ioctl", 1}};
    for (auto const& [words, text, status] : cases) {
        auto const outcome = OnConsole(TESSELLA_RUN " " + std::string(words));
        EXPECT_EQ(outcome.status, status) << words;
        EXPECT_NE(outcome.out.find(text), std::string::npos) << outcome.out;
    }
    EXPECT_NE(OnConsole(kGuard + "echo ran", "--fault OPEN_TTY=EACCES")
                  .out.find("(Permission denied); the program runs all the same\nran\n"),
        std::string::npos);
}

TEST(Shot, ShowsWhatTheScreenShows)
{
    std::string const folder = testing::TempDir();
    for (char const* const mode : {"8x9x8", "8x9x24", "8x9x32"})
        EXPECT_EQ(OnConsole("cat /dev/urandom | head -c 216 >/dev/fb0; " TESSELLA_SHOT " " + folder + "a.png",
                      std::string("--mode ") + mode + " --screenshot " + folder + "b.png; cmp " + folder +
                          "a.png " + folder + "b.png; true")
                      .out,
            "");
}

/// A shell's commands that put a library in front of the real one whose archive has been through some of
/// Python's: there it is the bytes `zip`, and `of` tells where the data of a file begin.
std::string WithArchive(std::string const& edit)
{
    return "d=$(mktemp -d); trap 'rm -r $d' EXIT; export LD_LIBRARY_PATH=$d; " OBJCOPY
           " --dump-section .zip=$d/zip " LIBRARY " $d/libtessella.so.1; "
           "python3 -c 'import sys, zipfile; path = sys.argv[1]; zip = bytearray(open(path, \"rb\").read()); "
           "of = lambda name: zipfile.ZipFile(path).getinfo(name).header_offset + 30 + len(name); " +
        edit +
        "; open(path, \"wb\").write(zip)' $d/zip; " OBJCOPY " --update-section .zip=$d/zip " LIBRARY
        " $d/libtessella.so.1; ";
}

TEST(Doctor, NamesEveryFaultAndWhatHelps)
{
    struct {
        int status;
        std::string options, before, text, mend;
    } const cases[] = {
        {0, "", "", "32 bits a pixel", ""},
        {0, "--mode 8x8x15", "", "16 bits a pixel", ""},
        {2, "--fault OPEN_FB=ENOENT", "", "/dev/fb0 can't be opened: No such file",
            "Load the kernel's driver"},
        {2, "--fault OPEN_FB=EACCES", "", "/dev/fb0 can't be opened: Permission", "as root"},
        {2, "--fault FBIOGET_VSCREENINFO=EIO", "", "doesn't tell its mode: Input/output error", ""},
        {2, "--fault MMAP=ENOMEM", "", "can't be mapped: Cannot allocate", ""},
        {2, "--report 32:10,10,10", "", "32 bits with 30 bits of colour aren't supported", "vga="},
        {1, "--report 16:6,5,5", "", "lie in another order", "vga="},
        {1, "--fault OPEN_TTY=EACCES", "", "no keyboard: /dev/tty0 can't be opened: Permission", "as root"},
        {1, "--fault KDSKBMODE=EPERM", "", "can't be read key by key", "login on this console"},
        {1, "--fault KDGETMODE=EIO", "", "doesn't tell all of its state", "tessella-run --restore"},
        {2, "", Taking("sleep 9") + " & until " CONSOLE_STATE " | grep -q 'screen 1'; do :; done; ",
            "another program draws", "tessella-run --restore"},
        {1, "--fault OPEN_MOUSE=ENOENT", "", "/dev/input/mice can't be opened", "modprobe mousedev"},
        {2, "--mode 640x480x4 --fault IOPERM=EPERM", "", "ports of the VGA can't be used: Operation not",
            "CAP_SYS_RAWIO"},
        {2, "", WithArchive("zip = zip[:-9]"), "or a damaged one", ""},
        {2, "", WithArchive("0") + OBJCOPY " --remove-section .zip $d/libtessella.so.1; ",
            "has no archive of resources, or a damaged one", "Install the library again"},
        {2, "", WithArchive("zip[of(\"glyphset.cgf\") + 9999] ^= 1"),
            "resources  unusable  glyphset.cgf is missing", "without the built-in font"},
        {1, "", WithArchive("zip = zip.replace(b\"fonts.xml\", b\"f0nts.xml\")"),
            "resources  limits    fonts.xml is missing", "without the table of fonts"},
        {1, "", WithArchive("zip[of(\"Nimbus_Sans.afm\") + 999] ^= 1"), "Nimbus_Sans.afm is", "a scalable"},
        {1, "", WithArchive("zip[of(\"Nimbus_Sans_Bold.afm\") + 999] ^= 1"), "Bold.afm is", "a scalable"},
        {1, "", WithArchive("zip[of(\"keyboard.kbd\") + 99] ^= 1"), "keyboard.kbd is", "the key layouts"},
        {1, "", WithArchive("zip[of(\"de/keyboard.kbd\") + 99] ^= 1") + "export LC_ALL=de_DE; ",
            "keyboard.kbd is", "the key layouts"},
    };
    for (auto const& [status, options, before, text, mend] : cases) {
        auto const outcome =
            OnConsole(before + "timeout 9 " TESSELLA_DOCTOR "; s=$?; kill $! 2>/dev/null; exit $s", options);
        EXPECT_EQ(outcome.status, status) << text;
        EXPECT_NE(outcome.out.find(text), std::string::npos) << outcome.out;
        EXPECT_NE(outcome.out.find(mend), std::string::npos) << outcome.out;
    }
    EXPECT_EQ(OnConsole(TESSELLA_DOCTOR " --json | python3 -c 'import json, sys; "
                                        "print(*(f[\"state\"] for f in json.load(sys.stdin)))'")
                  .out,
        "fine fine fine fine\n");
}

}
