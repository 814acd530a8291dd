#include "apps/kelform/script_player.h"

#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

#include "apps/kelform/play.h"
#include "tests/kelform/test_box.h"

namespace kel::kelform {
namespace {

struct Outcome {
    std::string out, err;
    int status = 0;
};

Outcome run(const std::string& script) {
    static const std::vector<ClassInfo> classes = testing::test_classes();
    std::ostringstream out, err;
    Player player(classes, out);
    Outcome r;
    r.status = player.run_script(script, "t.kfs", err);
    r.out = out.str();
    r.err = err.str();
    return r;
}

struct ScriptCase {
    const char* what;
    std::string script;
    std::string out;
    std::string err = "";
    int status = 0;
};

// Each case: a script on the test control, and exactly what it prints. The golden scripts
// player_*.kfs cover echo, expect and the unknown command and unterminated string errors.
TEST(ScriptPlayer, Scripts) {
    const ScriptCase cases[] = {
        {"get and set in the library's spelling",
         "new TestBox b\nset B.number 5\nget b.NUMBER\nget b.text\nset b.Text 12.5\nget b.Text\n",
         "b.Number = i16 5\nb.Text = str \"\"\nevent b.Change\nb.Text = str \"12.5\"\n"},
        {"run-time errors are printed and the script goes on",
         "new TestBox b\nset b.Number -1\nset b.Number 40000\nset b.Number \"x\"\nget b.List(0)\n"
         "call b.AddItem \"a\"\nget b.List(0)\nset b.List(3) \"z\"\nget b.Number\n",
         "b.Number -> error 380\nb.Number -> error 6\nb.Number -> error 13\nb.List(0) -> error 381\n"
         "b.List(0) = str \"a\"\nb.List(3) -> error 381\nb.Number = i16 1\n"},
        {"keystrokes raise events with their arguments",
         "new TestBox b\nfocus b\nkey Shift+a\n",
         "event b.KeyDown KeyCode=65 Shift=1\nevent b.KeyPress KeyAscii=65\nevent b.Change\n"
         "event b.KeyUp KeyCode=65 Shift=1\n"},
        {"a handler's run-time error is printed",
         "new TestBox b\non b.Change set b.Number -5\ntrace events off\nset b.Text \"a\"\n",
         "b.Number -> error 380\n"},
        {"queued keystrokes are traced and delivered after the command",
         "new TestBox b\nfocus b\ntrace events off\ntype \"ab\"\nselect b 0 0\nkey !\npeek b.txtTest.SelStart\n"
         "trace sendkeys off\nkey !\n",
         "sendkeys b \"{END}\"\nb.txtTest.SelStart = i32 2\n"},
        {"property-changed notifications when traced",
         "new TestBox b\nset b.Number 2\ntrace changed on\nset b.Number 3\ntrace changed off\nset b.Number 4\n",
         "changed b.Number\n"},
        {"focus refused and focus moves",
         "new TestBox a\nnew TestBox b\nset b.Locked true\ntrace events off\nfocus b\nfocus a\nkey Tab\n"
         "type \"q\"\nget a.Text\nfocus none\n",
         "focus b refused\na.Text = str \"q\"\n"},
        {"peek and poke through the part",
         "new TestBox b 600 200\npeek b.surface.width\npeek b.TXTTEST.Font\ntrace events off\n"
         "poke b.txtTest.Text \"abc\"\npeek b.txtTest.Text\npoke b.txtTest.SelStart -1\nresize b 900 250\n"
         "peek b.surface.Height\n",
         "b.surface.Width = f32 600\nb.txtTest.Font = font \"Fixedsys\" 9\nb.txtTest.Text = str \"abc\"\n"
         "b.txtTest.SelStart -> error 380\nb.surface.Height = f32 250\n"},
        {"save prints what is stored, load reads it back",
         "new TestBox b\nsave b\nset b.Number 7\nset b.Text \"hi\"\nsave b\nload TestBox c number=3 TEXT=\"x y\"\n"
         "get c.Number\nget c.Text\nload TestBox d 700 100\nget d.Number\n",
         "event b.Change\nsaved b Number = i16 7\nsaved b Text = str \"hi\"\nevent c.Change\nc.Number = i16 3\nc.Text = str \"x y\"\nd.Number = i16 1\n"},
        {"clicks and notifications",
         "new TestBox b\nclick b.txtTest\nset b.Number 13\nclick b.txtTest\nnotify b.txtTest.Change\n",
         "event b.Click\nb.txtTest.Click -> error 13\nevent b.Change\n"},
        {"handlers that feed each other end with the host's error 28, and the script goes on",
         "new TestBox b\ntrace events off\non b.Change set b.Text \"x\"\non b.Change set b.Text \"y\"\nset b.Text \"z\"\n"
         "off b.Change\nset b.Text \"w\"\nget b.Text\n",
         "b.txtTest.Change -> error 28\nb.Text = str \"w\"\n"},
        {"a script error after a failed expect still ends with 2",
         "new TestBox b\nexpect b.Number 2\nbogus\n", "FAIL t.kfs:2: b.Number = i16 1, expected i16 2\n",
         "t.kfs:3: unknown command 'bogus'\n", 2},
        {"carriage returns and no final newline", "echo \"a\"\r\necho \"b\"", "a\nb\n"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        Outcome r = run(c.script);
        EXPECT_EQ(r.out, c.out);
        EXPECT_EQ(r.err, c.err);
        EXPECT_EQ(r.status, c.status);
    }
}

struct ErrorCase {
    std::string line;
    std::string message;
};

// Script errors name the file and line, stop the script and end with status 2.
TEST(ScriptPlayer, ScriptErrors) {
    const ErrorCase cases[] = {
        {"new Nothing x", "unknown class 'Nothing'"},
        {"new Ghost g", "class 'Ghost' cannot be created"},
        {"new TestBox b", "a control named 'b' already exists"},
        {"new TestBox b-2", "malformed name 'b-2'"},
        {"new TestBox z 100", "missing argument: height"},
        {"new TestBox z 100 x", "malformed value 'x'"},
        {"new TestBox z 1 2 3", "extra argument '3'"},
        {"load TestBox z Number", "expected Key=value, got 'Number'"},
        {"load TestBox z Number=", "malformed value ''"},
        {"get b.Nope", "unknown property 'b.Nope'"},
        {"get x.Text", "unknown control 'x'"},
        {"get b.List", "property 'b.List' needs an index"},
        {"get b.Text(1)", "property 'b.Text' takes no index"},
        {"get b.txtTest.Text", "expected NAME.Prop, got 'b.txtTest.Text'"},
        {"set b.hWnd 5", "property 'b.hWnd' is read-only"},
        {"set b.Text", "missing argument: value"},
        {"set b.Text \"a\" \"b\"", "extra argument '\"b\"'"},
        {"echo \"a\\q\"", "malformed string '\"a\\q\"': unknown escape '\\q'"},
        {"echo hello", "expected a quoted string, got 'hello'"},
        {"call b.Nope", "unknown method 'b.Nope'"},
        {"call b.AddItem", "missing argument: Item"},
        {"call b.AddItem 1 2 3", "extra argument '3'"},
        {"peek b.nope.Text", "unknown part 'b.nope'"},
        {"peek b.txtTest.Nope", "unknown member 'b.txtTest.Nope'"},
        {"notify b.txtTest.Explode", "unknown notification 'b.txtTest.Explode'"},
        {"key Hyper+x", "unknown key 'Hyper+x'"},
        {"key a", "no control has focus"},
        {"type \"a\"", "no control has focus"},
        {"keypress 65", "no control has focus"},
        {"paste \"a\"", "no control has focus"},
        {"keypress 70000", "expected a 16-bit whole number for character code"},
        {"on b.Nope echo \"x\"", "unknown event 'b.Nope'"},
        {"on b.KeyPress set Nope 1", "unknown argument 'Nope' of b.KeyPress"},
        {"on b.KeyPress fly", "unknown action 'fly'"},
        {"trace everything on", "expected events, sendkeys or changed, got 'everything'"},
        {"trace events maybe", "expected on or off, got 'maybe'"},
        {"mode fast", "expected design or run, got 'fast'"},
        {"expect b.Text", "missing argument: value"},
        {"apply b", "'b' is not a property page"},
        {"page pg b", "no property page class is known"},
        {"insert", "missing argument: on or off"},
        {"echo \"\x01\" \x02", "extra argument '\\x02'"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.line);
        Outcome r = run("new TestBox b\n" + c.line + "\necho \"not reached\"\n");
        EXPECT_EQ(r.out, "");
        EXPECT_EQ(r.err, "t.kfs:2: " + c.message + "\n");
        EXPECT_EQ(r.status, 2);
    }
}

TEST(ScriptPlayer, ExtraCommandsCanBeAdded) {
    static const std::vector<ClassInfo> classes = testing::test_classes();
    std::ostringstream out, err;
    Player player(classes, out);
    player.add_command("twice", [](Player& p, Args& a) {
        std::string text = a.text("text");
        a.finish();
        p.out() << text << text << '\n';
    });
    player.add_command("make", [](Player& p, Args& a) {
        const ClassInfo& cls = p.find_class(a.next("class"));
        std::string name(a.name("name"));
        a.finish();
        p.form().create(cls, name);
    });
    EXPECT_EQ(player.run_script("TWICE \"ab\"\nmake testbox q\nget q.Number\ntwice\n", "x.kfs", err), 2);
    EXPECT_EQ(out.str(), "abab\nq.Number = i16 1\n");
    EXPECT_EQ(err.str(), "x.kfs:4: missing argument: text\n");
}

TEST(Play, SeveralScriptsStdinAndUnreadableFiles) {
    static const std::vector<ClassInfo> classes = testing::test_classes();
    std::istringstream in("new TestBox b\nexpect b.Number 2\n");
    std::ostringstream out, err;
    std::vector<std::string_view> scripts = {"-", "/nonexistent/x.kfs", "-"};
    int status = play(scripts, classes, in, out, err);
    EXPECT_EQ(status, 2);
    // Each script runs on a form of its own: the second read of stdin finds it used up.
    EXPECT_EQ(out.str(), "FAIL <stdin>:2: b.Number = i16 1, expected i16 2\n");
    EXPECT_EQ(err.str(), "/nonexistent/x.kfs: cannot read the script\n");

    std::istringstream in2("expect b.Number 1\n");
    std::ostringstream out2, err2;
    std::vector<std::string_view> one = {"-"};
    EXPECT_EQ(play(one, classes, in2, out2, err2), 2);
    EXPECT_EQ(err2.str(), "<stdin>:1: unknown control 'b'\n");
}

}  // namespace
}  // namespace kel::kelform
