// The natives of PhotoBytes beside the command: the same files, byte for byte.
#include <gtest/gtest.h>

#include "tests/bindings/java/photo_natives_fixture.h"
#include "tests/cli/quenby_process.h"
#include "tests/photo/metadata/xmp_texts.h"

namespace pelorin::test_support {
namespace {

using PhotoNativesBesideTheCommand = PhotoNatives;

TEST_F(PhotoNativesBesideTheCommand, GiveTheFileThatTheCommandWrites) {
  struct Case {
    std::vector<std::string> options;
    jint quality, rotation, scale;
    std::vector<float> faces;
    std::string filter, params;
  };
  for (const Case& one :
       {Case{{}, 90, 0, 1, {}, "AE0", "slider=0.4;"},
        Case{{"--rotate", "90", "--quality", "70", "--slider", "0.9"},
             70,
             90,
             1,
             {},
             "AE0",
             "slider=0.9;"},
        Case{{"--scale", "2", "--face", "0.2,0.1,0.6,0.7", "--face", "0.5,0.5,0.9,0.9"},
             90,
             0,
             2,
             {0.2f, 0.1f, 0.6f, 0.7f, 0.5f, 0.5f, 0.9f, 0.9f},
             "AE0",
             "slider=0.4;"},
        Case{{"--filter", "AE08bit", "--rotate", "-90"},
             90,
             -90,
             1,
             {},
             "AE08bit",
             "slider=0.4;"}}) {
    std::vector<std::string> arguments = {"enhance", "-", "-o", "-"};
    arguments.insert(arguments.end(), one.options.begin(), one.options.end());
    const Finished run = quenby(arguments, file.bytes);
    ASSERT_EQ(run.exitCode, 0) << run.errors;
    const Bytes expected(run.output.begin(), run.output.end());
    FakeString filter(one.filter), params(one.params);
    FakeFloats faces(one.faces);
    const jint size = static_cast<jint>(file.bytes.size());
    EXPECT_EQ(calls.filter(file, nullptr, 0, size, one.quality, one.rotation, faces, one.scale,
                           filter, params, 0),
              expected)
        << testing::PrintToString(one.options);
    // From the middle of a direct buffer.
    Bytes room(7);
    room.insert(room.end(), file.bytes.begin(), file.bytes.end());
    room.resize(room.size() + 9);
    FakeBuffer buffer(room);
    EXPECT_EQ(calls.filter(nullptr, buffer, 7, size, one.quality, one.rotation, faces, one.scale,
                           filter, params, 0),
              expected);
  }
}

TEST_F(PhotoNativesBesideTheCommand, CodeAndMarkTheFileAsTheyAreTold) {
  const Finished run =
      quenby({"enhance", "-", "-o", "-", "--quality", "auto", "--subsampling", "422", "--no-mark"},
             file.bytes);
  ASSERT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_EQ(calls.filter(file, nullptr, 0, static_cast<jint>(file.bytes.size()), -1, 0, nullptr, 1,
                         ae, slider, 0, 422, JNI_FALSE),
            Bytes(run.output.begin(), run.output.end()));
  calls.filter(file, nullptr, 0, static_cast<jint>(file.bytes.size()), 90, 0, nullptr, 1, ae,
               slider, 0, 411);
  EXPECT_NE(env.takeException().find("subsampling"), std::string::npos);
}

TEST_F(PhotoNativesBesideTheCommand, TakeCareOfFacesThatTheFileKnowsOf) {
  const std::string packet = xmpPacket(
      "<rdf:Description><mwg-rs:Regions rdf:parseType='Resource'><mwg-rs:AppliedToDimensions "
      "stDim:w='130' stDim:h='100' stDim:unit='pixel'/><mwg-rs:RegionList><rdf:Bag>"
      "<rdf:li mwg-rs:Type='Face'><mwg-rs:Area stArea:x='0.4' stArea:y='0.5' stArea:w='0.5' "
      "stArea:h='0.6' stArea:unit='normalized'/></rdf:li></rdf:Bag></mwg-rs:RegionList>"
      "</mwg-rs:Regions></rdf:Description>");
  Bytes payload;
  for (const char byte : std::string("http://ns.adobe.com/xap/1.0/") + '\0' + packet)
    payload.push_back(static_cast<std::uint8_t>(byte));
  FakeBytes known(jpegOf(photoLikePicture(130, 100, 3), {{0xE1, payload}}));
  const Finished with = quenby({"enhance", "-", "-o", "-"}, known.bytes);
  const Finished without = quenby({"enhance", "-", "-o", "-", "--faces", "none"}, known.bytes);
  ASSERT_EQ(with.exitCode, 0) << with.errors;
  EXPECT_NE(with.output, without.output);
  EXPECT_EQ(filtered(known), Bytes(with.output.begin(), with.output.end()));
}
}  // namespace
}  // namespace pelorin::test_support
