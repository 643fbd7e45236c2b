"""The features of the NIQE score as they are defined, in NumPy alone: Mittal, Soundararajan and Bovik,
"Making a Completely Blind Image Quality Analyzer" (2013). Fits are solved, not looked up, so features
differ a little from those of tables.

    python niqe_definition.py     # how long this takes beside quenby.niqe
"""

import math

import numpy as np

WINDOW = np.exp(-((np.arange(-3, 4) / (7 / 6)) ** 2) / 2)
WINDOW = (WINDOW / WINDOW.sum()).astype(np.float32)
SHAPES = np.arange(0.1, 11, 0.001)
GAMMA = np.vectorize(math.lgamma)
LOG1, LOG2, LOG3 = (GAMMA(n / SHAPES) for n in (1, 2, 3))
RATIOS = np.exp(2 * LOG2 - LOG1 - LOG3)


def smoothed(image):
    """Through the window along columns, then along rows; a border's pixel counts beyond it."""
    for axis in (0, 1):
        widths = [(3, 3) if axis == a else (0, 0) for a in (0, 1)]
        padded, length = np.pad(image, widths, mode="edge"), image.shape[axis]
        image = sum(
            weight * padded.take(range(tap, tap + length), axis)
            for tap, weight in enumerate(WINDOW)
        )
    return image


def structure(grey):
    mean = smoothed(grey)
    deviation = np.sqrt(np.abs(smoothed(grey * grey) - mean * mean))
    return (grey - mean) / (deviation + 1)


def fit(block):
    """Shape, left and right scale of an asymmetric generalised Gaussian, and its mean."""
    left, right = block[block < 0], block[block > 0]
    if left.size == 0 or right.size == 0:
        return (math.nan,) * 4
    left, right = math.sqrt(np.mean(left**2)), math.sqrt(np.mean(right**2))
    g = left / right
    ratio = np.mean(np.abs(block)) ** 2 / np.mean(block**2)
    ratio *= (g**3 + 1) * (g + 1) / (g**2 + 1) ** 2
    if not RATIOS[0] <= ratio <= RATIOS[-1]:
        return (math.nan,) * 4
    at = min(int(np.searchsorted(RATIOS, ratio)), len(SHAPES) - 1)
    factor = math.exp((LOG1[at] - LOG3[at]) / 2)
    left, right = left * factor, right * factor
    mean = (right - left) * math.exp(LOG2[at] - LOG1[at])
    return SHAPES[at], left, right, mean if abs(mean) <= 0.3 else math.nan


def block_features(block):
    shape, left, right, _ = fit(block)
    features = [shape, (left + right) / 2]
    for shift in ((0, 1), (1, 0), (1, 1), (1, -1)):
        shape, left, right, mean = fit(block * np.roll(block, shift, (0, 1)))
        features += [shape, mean, left, right]
    return features


def niqe_features(pixels):
    """The 36 mean features of a picture of (height, width, 3) bytes."""
    grey = pixels[..., :3].astype(np.float32) @ np.array([0.3, 0.6, 0.1], np.float32)
    rows, columns = grey.shape[0] // 96, grey.shape[1] // 96
    features = []
    for side in (96, 48):
        coefficients = structure(grey)
        blocks = [
            block_features(coefficients[y * side : (y + 1) * side, x * side : (x + 1) * side])
            for y in range(rows)
            for x in range(columns)
        ]
        features += list(np.nanmean(np.array(blocks), axis=0))
        height, width = grey.shape[0] // 2 * 2, grey.shape[1] // 2 * 2
        grey = grey[:height, :width].reshape(height // 2, 2, width // 2, 2).mean((1, 3))
    return np.array(features)


def main():
    import time

    from conftest import picture

    import quenby

    photo = picture(1600, 1200)
    times = {niqe_features: [], quenby.niqe: []}
    for function in [*times] * 5:
        begin = time.process_time()
        function(photo)
        times[function].append(time.process_time() - begin)
    numpy, native = (min(taken) for taken in times.values())
    print(f"1600 x 1200, processor time, least of 5: NumPy {numpy * 1e3:.0f} ms, "
          f"quenby.niqe {native * 1e3:.1f} ms: {numpy / native:.0f} times")


if __name__ == "__main__":
    main()
