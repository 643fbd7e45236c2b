// What quenby.d.ts and client.d.ts promise, used as a program would; only compiled.
import { bestBuild, load, parameterText, Quenby, QuenbyError, type Face, type SavedFile } from "quenby";
import { QuenbyWorker } from "quenby/client";

export async function enhance(file: Uint8Array): Promise<SavedFile> {
  const quenby: Quenby = await load({ build: bestBuild() });
  const faces: Face[] = [{ left: 0.1, top: 0.1, right: 0.3, bottom: 0.4 }];
  const photo = quenby.open(file, { scale: 2, maxPixels: 1e8, timeout: 5000 });
  const session = photo.session(faces);
  const pixels: Uint8ClampedArray = session.setSlider(0.4, { timeout: 100 });
  session.look("WinterRGB", { applyMask: true });
  session.apply("AE0", parameterText({ slider: 0.4 }));
  const score: number | null = quenby.score({ data: pixels, width: session.width, height: session.height });
  const groups: number[] = quenby.duplicates([quenby.shot(file)], 1.5);
  const saved = photo.save({ quality: 90, format: "PNG" });
  session.close();
  photo.close();
  // @ts-expect-error a scale that there is not
  quenby.open(file, { scale: 3 });
  // @ts-expect-error the slider is a number
  session.setSlider("0.4");
  if (score === null || groups.length === 0) throw new QuenbyError("failed", "nothing to tell");
  return saved;
}

export function worker(): Promise<unknown> {
  return new QuenbyWorker().call("start", [], { topic: "start" });
}
