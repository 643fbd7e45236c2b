#include <gmock/gmock.h>

#include "tests/cli/parsed_json.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"

namespace pelorin::test_support {
namespace {

using testing::HasSubstr;

// Standard input: objects, an array of them or lines, all of the definition called so.
constexpr const char* validate = R"python(
import json, re, sys
try:
    import jsonschema
except ImportError:
    sys.exit(77)
schema = json.load(open(sys.argv[1]))
page = open(sys.argv[2]).read()
for chunk in sys.stdin.read().split("\0"):
    if not chunk:
        continue
    name, _, text = chunk.partition("\n")
    try:
        document = json.loads(text)
    except json.JSONDecodeError:
        document = [json.loads(line) for line in text.splitlines()]
    objects = document if isinstance(document, list) else [document]
    assert objects, name + " printed nothing"
    validator = jsonschema.Draft202012Validator({"$ref": "#/$defs/" + name, **schema})
    for one in objects:
        assert list(one)[0] == "schema", one
        for error in validator.iter_errors(one):
            print(name, json.dumps(one)[:300], error.message)
def members(node):
    if isinstance(node, dict):
        yield from node.get("properties", {})
    for child in node.values() if isinstance(node, dict) else node if isinstance(node, list) else []:
        yield from members(child)
for member in sorted(set(members(schema))):
    if "`" + member + "`" not in page:
        print("json.md says nothing of", member)
)python";

TEST(JsonDocuments, AreWhatTheSchemaAndThePageSay) {
  const TemporaryFolder folder;
  const std::string a = folder.write("a.jpg", jpegOf(photoLikePicture(120, 100, 1)));
  const std::string b = folder.write("b.jpg", folder.read("a.jpg"));
  const std::string odd = folder.write("\xE9.jpg", folder.read("a.jpg"));
  const std::string bad = folder.write("bad.jpg", std::string("x"));
  const std::string small = folder.write("small.jpg", smallJpeg());
  const std::string out = folder / "out/";
  const std::vector<std::vector<std::string>> commands = {
      {"enhance", a, bad, odd, "-o", out, "--jsonl"},
      {"enhance", a, bad, "-o", out, "--json"},
      {"enhance", a, bad, "-o", out, "--json", "-n"},
      {"look", "winter", a, "-o", folder / "w.png", "--json"},
      {"looks", "--json"},
      {"info", a, bad, odd, "--json", "--face", "0.1,0.1,0.5,0.5"},
      {"info", "--raw", "5x5", folder.write("raw", Bytes(100)), "--json"},
      {"score", a, bad, small, "--json", "--features"},
      {"score", a, "--json", "--map", folder / "map.png", "-n"},
      {"curve", a, "--json"},
      {"curve", a, "--json", "-o", folder / "c.png", "-n"},
      {"masks", a, "--json", "-o", folder / "masks"},
      {"masks", a, "--json", "-o", folder / "masks"},
      {"keypoints", a, "--json", "--brief"},
      {"sheet", a, bad, "--json", "-o", folder / "s.png", "--cell", "32"},
      {"compare", a, b, "--json", "--dt", "1"},
      {"dupes", a, b, bad, odd, "--json", "--assume-mtime", "--keep", "best", "--pairs"},
      {"dupes", a, b, bad, "--jsonl", "--unknown-times"},
      {"dupes", a, b, "--json", "--assume-mtime", "--move-to", folder / "moved"},
      {"enhance", b, "--json", "--in-place", "--backup", folder / "kept"},
      {"undo", folder / "kept", "--json", "-n"},
      {"undo", folder / "kept", "--jsonl"},
  };
  Bytes input;
  for (const std::vector<std::string>& command : commands) {
    const std::string text = command[0] + "\n" + quenby(command).output;
    input.insert(input.end(), text.begin(), text.end());
    input.push_back(0);
  }
  const std::string progress =
      "progress\n" + quenby({"info", "-q", a, b, "--progress", "json"}).errors;
  EXPECT_EQ(std::count(progress.begin(), progress.end(), '\n'), 4) << progress;
  input.insert(input.end(), progress.begin(), progress.end());
  folder.write("input", input);
  folder.write("validate.py", std::string(validate));
  const Finished run = shell("python3 " + folder / "validate.py" +
                             " " DOCS "/json.schema.json " DOCS "/json.md < " + folder / "input");
  if (run.exitCode == 77) GTEST_SKIP() << "there is no jsonschema for Python here";
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_EQ(run.output, "");
}

}  // namespace
}  // namespace pelorin::test_support
