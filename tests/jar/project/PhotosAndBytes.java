import com.pelorin.photos.quenby.autoenhance.Filter;
import com.pelorin.photos.quenby.autoenhance.JpegException;
import com.pelorin.photos.quenby.autoenhance.JpegJob;
import com.pelorin.photos.quenby.autoenhance.PhotoBytes;
import com.pelorin.photos.quenby.autoenhance.PhotoException;
import java.io.ByteArrayOutputStream;
import java.io.IOException;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.Arrays;
import javax.imageio.ImageIO;

/** What the natives of whole photos make of a JPEG file, of a PNG file and of a damaged one. */
public class PhotosAndBytes {
    private PhotosAndBytes() {}

    /**
     * Writes job.jpg, bytes.jpg and facts.txt.
     *
     * @param arguments a photo's file, a folder for what is made
     */
    public static void main(String[] arguments) throws IOException, PhotoException {
        Path photo = Path.of(arguments[0]);
        Path made = Path.of(arguments[1]);
        JpegJob.of(photo, made.resolve("job.jpg")).run();

        ByteArrayOutputStream png = new ByteArrayOutputStream();
        ImageIO.write(ImageIO.read(photo.toFile()), "png", png);
        PhotoBytes bytes = PhotoBytes.of(png.toByteArray());
        Files.write(made.resolve("bytes.jpg"), bytes.filter(Filter.WINTER, ""));
        String facts = bytes.facts().width() + " x " + bytes.facts().height()
                + ", quality " + bytes.niqe() + "\n";

        byte[] file = Files.readAllBytes(photo);
        byte[] half = Arrays.copyOf(file, file.length / 2);
        try {
            PhotoBytes.of(half).niqe();
        } catch (PhotoException error) {
            facts += error + "\n";
        }
        Path damaged = Files.write(made.resolve("half.jpg"), half);
        try {
            JpegJob.of(damaged, made.resolve("none.jpg")).run();
        } catch (JpegException error) {
            facts += error.kind() + "\n";
        }
        Files.writeString(made.resolve("facts.txt"), facts);
    }
}
