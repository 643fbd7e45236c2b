package android.graphics;

/** A rectangle of floats, as on Android; for faces, fractions of the photo's width and height. */
public class RectF {
    /** The left edge. */
    public float left;
    /** The upper edge; y grows downwards. */
    public float top;
    /** The right edge. */
    public float right;
    /** The lower edge. */
    public float bottom;

    /** Makes an empty rectangle at the origin. */
    public RectF() {}

    /**
     * Makes a rectangle; nothing is checked.
     *
     * @param left   its left edge
     * @param top    its upper edge
     * @param right  its right edge
     * @param bottom its lower edge
     */
    public RectF(float left, float top, float right, float bottom) {
        this.left = left;
        this.top = top;
        this.right = right;
        this.bottom = bottom;
    }

    @Override
    public String toString() {
        return "RectF(" + left + ", " + top + ", " + right + ", " + bottom + ")";
    }
}
