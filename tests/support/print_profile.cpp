#include "tests/support/print_profile.h"

#include <lcms2.h>

#include <stdexcept>

namespace pelorin::test_support {

namespace {

struct Light {
  cmsHTRANSFORM toLab;
  double black;
};

}  // namespace

Bytes profileOfSwappedInks(double version, double black) {
  const cmsHPROFILE srgb = cmsCreate_sRGBProfile(), lab = cmsCreateLab4Profile(nullptr);
  const cmsHTRANSFORM toLab =
      cmsCreateTransform(srgb, TYPE_RGB_16, lab, TYPE_Lab_16, INTENT_RELATIVE_COLORIMETRIC, 0);
  const auto labOfInks = [](const cmsUInt16Number inks[], cmsUInt16Number out[], void* light) {
    const auto& [transform, least] = *static_cast<const Light*>(light);
    cmsUInt16Number rgb[3];
    for (int i = 0; i < 3; ++i) {
      const double through = (65535u - inks[2 - i]) * (65535u - inks[3]) / 65535u;
      rgb[i] = static_cast<cmsUInt16Number>(65535 * least + through * (1 - least));
    }
    cmsDoTransform(transform, rgb, out, 1);
    return cmsBool{TRUE};
  };
  Light light{toLab, black};
  cmsPipeline* pipeline = cmsPipelineAlloc(nullptr, 4, 3);
  cmsStage* grid = cmsStageAllocCLut16bit(nullptr, 9, 4, 3, nullptr);
  cmsStageSampleCLut16bit(grid, labOfInks, &light, 0);
  // The file format wants curves around the grid.
  cmsPipelineInsertStage(pipeline, cmsAT_END, cmsStageAllocToneCurves(nullptr, 4, nullptr));
  cmsPipelineInsertStage(pipeline, cmsAT_END, grid);
  cmsPipelineInsertStage(pipeline, cmsAT_END, cmsStageAllocToneCurves(nullptr, 3, nullptr));

  const cmsHPROFILE print = cmsCreateProfilePlaceholder(nullptr);
  cmsSetProfileVersion(print, version);
  cmsSetDeviceClass(print, cmsSigOutputClass);
  cmsSetColorSpace(print, cmsSigCmykData);
  cmsSetPCS(print, cmsSigLabData);
  cmsWriteTag(print, cmsSigAToB0Tag, pipeline);
  cmsUInt32Number size = 0;
  cmsSaveProfileToMem(print, nullptr, &size);
  Bytes bytes(size);
  if (size == 0 || !cmsSaveProfileToMem(print, bytes.data(), &size))
    throw std::logic_error("no profile");
  cmsPipelineFree(pipeline);
  cmsDeleteTransform(toLab);
  for (const cmsHPROFILE profile : {srgb, lab, print}) cmsCloseProfile(profile);
  return bytes;
}

}  // namespace pelorin::test_support
