import com.tavir.slideshow.SlideShow;
import com.tavir.slideshow.SlideShowImages;
import java.awt.image.BufferedImage;
import java.io.File;
import javax.imageio.ImageIO;

/** Opens a show, prints its settings, draws every slide and writes the first one as PNG. */
public final class DrawShow {
    public static void main(String[] arguments) throws Exception {
        if (arguments.length != 2) {
            System.err.println("usage: DrawShow SHOW PICTURE.png");
            System.exit(2);
        }
        try (SlideShow show = SlideShow.open(arguments[0])) {
            System.out.println(show.path() + ": " + show.size() + " pictures, " + show.musicSize() + " bytes of music");
            System.out.println("interval " + show.interval() + ", effect " + show.effect() + ", " + show.order()
                    + ", " + show.ending() + ", " + show.screenDirection());
            for (int i = 0; i < show.size(); ++i) {
                BufferedImage slide = SlideShowImages.draw(show, i);
                System.out.printf("%d: %dx%d, %s, centre %08x%n", i, slide.getWidth(), slide.getHeight(), show.state(i),
                        slide.getRGB(slide.getWidth() / 2, slide.getHeight() / 2));
                if (i == 0) ImageIO.write(slide, "png", new File(arguments[1]));
            }
        }
        System.out.println("wrote " + arguments[1]);
    }
}
