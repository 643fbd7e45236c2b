import android.graphics.Bitmap;
import com.pelorin.photos.quenby.autoenhance.EnhanceSession;

/** Filters a grey picture with the packages' jars and natives. */
class UsesQuenby {
    public static void main(String[] arguments) {
        Bitmap photo = Bitmap.createBitmap(64, 48, Bitmap.Config.ARGB_8888);
        photo.eraseColor(0xff606060);
        Bitmap output = Bitmap.createBitmap(64, 48, Bitmap.Config.ARGB_8888);
        try (EnhanceSession session = EnhanceSession.open(photo)) {
            session.enhance(0.4f, output);
        }
        System.out.println("from Java: " + Integer.toHexString(output.getPixel(0, 0)));
    }
}
