import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertTrue;

import java.awt.image.BufferedImage;
import java.io.IOException;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.Arrays;
import javax.imageio.ImageIO;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

class SlideAndSaveTest {
    @TempDir Path folder;

    @Test
    void savesTheEnhancedPhotoAndTheLook() throws IOException {
        BufferedImage photo = new BufferedImage(120, 80, BufferedImage.TYPE_INT_RGB);
        for (int i = 0; i < 120 * 80; ++i) {
            int grey = 60 + i % 120 / 2;
            photo.setRGB(i % 120, i / 120, grey << 16 | grey << 8 | i / 120);
        }
        Path input = folder.resolve("photo.jpg");
        ImageIO.write(photo, "jpeg", input.toFile());
        Path enhanced = folder.resolve("enhanced.jpg");
        Path winter = folder.resolve("winter.jpg");
        SlideAndSave.main(new String[] {
            input.toString(), enhanced.toString(), winter.toString()});
        assertEquals(120, ImageIO.read(enhanced.toFile()).getWidth());
        assertEquals(80, ImageIO.read(winter.toFile()).getHeight());
        assertTrue(!Arrays.equals(Files.readAllBytes(enhanced), Files.readAllBytes(winter)));
    }

    @Test
    void isWhatTheReadmeShows() throws IOException {
        Path root = Path.of(System.getProperty("quenby.root"));
        String source =
                Files.readString(root.resolve("java/example/src/main/java/SlideAndSave.java"));
        String body = source.substring(source.indexOf("        Bitmap photo"),
                source.indexOf("    private static void save"));
        assertTrue(Files.readString(root.resolve("README.md")).contains(body.stripTrailing()
                .replaceAll("\n    }$", "").replaceAll("(?m)^        ", "")),
                "README.md shows another example");
    }
}
