package com.pelorin.photos.quenby.spark;

import com.pelorin.photos.quenby.autoenhance.Filter;
import com.pelorin.photos.quenby.autoenhance.GreenCdf;
import com.pelorin.photos.quenby.autoenhance.PhotoBytes;
import java.util.Map;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.SparkSession;
import org.apache.spark.sql.UDFRegistration;
import org.apache.spark.sql.api.java.UDF1;
import org.apache.spark.sql.api.java.UDF2;
import org.apache.spark.sql.api.java.UDF3;
import org.apache.spark.sql.types.DataTypes;

/**
 * Functions on columns that hold photos' files. One call registers them, for Java, Scala, SQL and
 * Python alike:
 *
 * <ul>
 *   <li>{@code quenby_enhance(content, params)}: the automatically enhanced JPEG file;
 *   <li>{@code quenby_look(content, look, params)}: the file with a look, such as "winter";
 *   <li>{@code quenby_score(content)}: how natural the upright picture looks (NIQE);
 *   <li>{@code quenby_info(content)}: width, height, orientation, wall_clock, utc;
 *   <li>{@code quenby_green_cdf(content)}: how its green is distributed, 1 KiB;
 *   <li>{@code quenby_cdf_distance(a, b)}: how far apart two of those are, 0 to 1;
 *   <li>{@code quenby_fingerprint(content)}: what {@link NearDuplicates} needs of a photo.
 * </ul>
 *
 * <p>{@code params} are the filter's, "slider=0.4;"; {@code quality=85;} among them, or
 * {@code quality=auto;} for the photo's own, is the JPEG file's. Every function gives a struct of
 * {@code result} and {@code error}, one of which is null: a photo that fails is a row that says
 * why. Null stays null.
 */
public final class Quenby {
    private Quenby() {}

    /**
     * Registers the functions in a session, with the limits that the command has unless given.
     *
     * @param spark the session
     */
    public static void register(SparkSession spark) {
        register(spark, Map.of());
    }

    /**
     * Registers the functions in a session.
     *
     * @param spark  the session
     * @param limits what a photo may cost at most, as the job's options say it: of "--max-bytes",
     *               "--max-pixels", "--max-scans", "--max-segments" and "--timeout" those that are
     *               not the usual ones
     * @throws IllegalArgumentException when there is another option, or one is no number
     */
    public static void register(SparkSession spark, Map<String, String> limits) {
        for (String option : limits.keySet()) {
            if (!PhotoLimits.OPTIONS.contains(option)) {
                throw new IllegalArgumentException("there is no limit " + option);
            }
        }
        PhotoLimits most = PhotoLimits.of(limits);
        UDFRegistration functions = spark.udf();
        functions.register("quenby_enhance", (UDF2<byte[], String, Row>) (content, params) ->
                of(most, content, it -> FilterCall.of(Filter.AUTO, params).apply(it)),
                Outcome.type(DataTypes.BinaryType));
        functions.register("quenby_look", (UDF3<byte[], String, String, Row>)
                (content, look, params) -> of(most, content,
                        it -> FilterCall.of(FilterCall.look(look), params).apply(it)),
                Outcome.type(DataTypes.BinaryType));
        functions.register("quenby_score", (UDF1<byte[], Row>) content ->
                of(most, content, PhotoBytes::niqe), Outcome.type(DataTypes.FloatType));
        functions.register("quenby_info", (UDF1<byte[], Row>) content ->
                of(most, content, it -> PhotoRows.info(it.facts())),
                Outcome.type(PhotoRows.INFO));
        functions.register("quenby_green_cdf", (UDF1<byte[], Row>) content ->
                of(most, content, it -> it.greenCdf().toBytes()),
                Outcome.type(DataTypes.BinaryType));
        functions.register("quenby_cdf_distance", (UDF2<byte[], byte[], Row>) Quenby::distance,
                Outcome.type(DataTypes.FloatType));
        functions.register("quenby_fingerprint", (UDF1<byte[], Row>) content ->
                of(most, content, PhotoRows::fingerprint),
                Outcome.type(PhotoRows.FINGERPRINT));
    }

    private static Row of(PhotoLimits limits, byte[] content, PhotoLimits.Work<Object> work) {
        return content == null ? null : Outcome.of(() -> limits.apply(content, work));
    }

    private static Row distance(byte[] a, byte[] b) {
        return a == null || b == null ? null
                : Outcome.of(() -> GreenCdf.fromBytes(a).distanceTo(GreenCdf.fromBytes(b)));
    }
}
