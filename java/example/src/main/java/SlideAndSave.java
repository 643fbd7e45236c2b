import android.graphics.Bitmap;
import com.pelorin.photos.quenby.autoenhance.EnhanceSession;
import com.pelorin.photos.quenby.autoenhance.Filter;
import com.pelorin.photos.quenby.desktop.BitmapImages;
import java.io.File;
import java.io.IOException;
import javax.imageio.ImageIO;

/** Opens a photo, moves the slider, tries a look and saves both. */
public class SlideAndSave {
    private SlideAndSave() {}

    /**
     * Runs the example.
     *
     * @param arguments the photo, the enhanced photo to write, the look to write
     * @throws IOException when a file cannot be read or written
     */
    public static void main(String[] arguments) throws IOException {
        Bitmap photo = BitmapImages.toBitmap(ImageIO.read(new File(arguments[0])));
        Bitmap output = Bitmap.createBitmap(
                photo.getWidth(), photo.getHeight(), Bitmap.Config.ARGB_8888);
        try (EnhanceSession session = EnhanceSession.open(photo)) {
            for (int step = 0; step <= 7; ++step) { // the first one analyses the photo
                session.enhance(step / 10f, output);
            }
            save(output, arguments[1]);
            session.apply(Filter.WINTER, "", output);
            save(output, arguments[2]);
        }
    }

    private static void save(Bitmap bitmap, String file) throws IOException {
        ImageIO.write(BitmapImages.toOpaqueImage(bitmap), "jpeg", new File(file));
    }
}
