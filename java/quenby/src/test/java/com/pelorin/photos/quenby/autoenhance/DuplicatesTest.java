package com.pelorin.photos.quenby.autoenhance;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import android.graphics.Bitmap;
import org.junit.jupiter.api.BeforeAll;
import org.junit.jupiter.api.Test;

class DuplicatesTest {
    private final Bitmap one = Pictures.photo(64, 64, 1);
    private final Bitmap other = Pictures.photo(40, 50, 9);

    @BeforeAll
    static void load() {
        NativeLibrary.load();
    }

    @Test
    void thePhotoItselfIsADuplicate() {
        Duplicates.Photo photo = new Duplicates.Photo(one, 1.7e9, 1);
        assertEquals(3.65f, Duplicates.score(photo, photo), 0.1f);
        assertTrue(Duplicates.likely(photo, photo));
    }

    @Test
    void aPhotoOfAnotherDayIsNot() {
        assertFalse(Duplicates.likely(
                new Duplicates.Photo(one, 0, 1), new Duplicates.Photo(other, 86400, 6)));
    }

    @Test
    void theNativeGivesTheErrorValueForWhatItCannotRead() {
        assertEquals(ImageDupeDetector.SIMILARITY_ERROR,
                ImageDupeDetector.similarityScore(null, 0, 0, other, 0, 0));
        assertEquals(ImageDupeDetector.SIMILARITY_ERROR,
                ImageDupeDetector.similarityScore(one, 0, 0, null, 0, 0));
        other.recycle();
        assertEquals(ImageDupeDetector.SIMILARITY_ERROR,
                ImageDupeDetector.similarityScore(one, 0, 0, other, 0, 0));
        assertEquals(0, one.getLockCount());
    }

    @Test
    void paddedRowsMakeNoDifference() {
        Bitmap padded = Bitmap.createBitmap(64, 64, Bitmap.Config.ARGB_8888, 300);
        Pictures.fill(padded, 1);
        assertEquals(ImageDupeDetector.similarityScore(one, 0, 0, other, 2, 0),
                ImageDupeDetector.similarityScore(padded, 0, 0, other, 2, 0));
    }

    @Test
    void refusesWhatCannotBeScored() {
        Duplicates.Photo good = new Duplicates.Photo(one, 0, 0);
        assertThrows(IllegalArgumentException.class,
                () -> new Duplicates.Photo(one, Double.NaN, 0));
        assertThrows(UnsuitableBitmapException.class,
                () -> Duplicates.score(good, new Duplicates.Photo(null, 0, 0)));
        other.recycle();
        assertThrows(UnsuitableBitmapException.class,
                () -> Duplicates.score(new Duplicates.Photo(other, 0, 0), good));
    }
}
