package com.pelorin.photos.quenby.autoenhance;

import android.graphics.RectF;
import java.util.List;

/** What the natives take on trust of faces. */
final class Faces {
    private Faces() {}

    static RectF[] check(List<RectF> faces) {
        for (RectF face : faces) {
            if (face == null) {
                throw new IllegalArgumentException("a face is null");
            }
            float sum = face.left + face.top + face.right + face.bottom;
            if (!Float.isFinite(sum)) {
                throw new IllegalArgumentException("a face is not finite: " + face);
            }
        }
        return faces.toArray(new RectF[0]);
    }
}
