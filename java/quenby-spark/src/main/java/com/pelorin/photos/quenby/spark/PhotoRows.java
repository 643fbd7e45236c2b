package com.pelorin.photos.quenby.spark;

import com.pelorin.photos.quenby.autoenhance.PhotoBytes;
import com.pelorin.photos.quenby.autoenhance.PhotoException;
import com.pelorin.photos.quenby.autoenhance.PhotoFacts;
import java.util.OptionalDouble;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.RowFactory;
import org.apache.spark.sql.types.DataTypes;
import org.apache.spark.sql.types.StructType;

/** What a photo says of itself, as rows. */
final class PhotoRows {
    /** Size as stored, EXIF orientation, capture time in seconds since 1970 by both clocks. */
    static final StructType INFO = new StructType()
            .add("width", DataTypes.IntegerType)
            .add("height", DataTypes.IntegerType)
            .add("orientation", DataTypes.IntegerType)
            .add("wall_clock", DataTypes.DoubleType)
            .add("utc", DataTypes.DoubleType);
    static final StructType FINGERPRINT = INFO.add("green_cdf", DataTypes.BinaryType);

    private PhotoRows() {}

    static Row info(PhotoFacts facts) {
        return RowFactory.create(facts.width(), facts.height(), facts.orientation(),
                known(facts.wallClockSeconds()), known(facts.utcSeconds()));
    }

    static Row fingerprint(PhotoBytes photo) throws PhotoException {
        return RowFactory.create(fingerprintValues(photo));
    }

    static Object[] fingerprintValues(PhotoBytes photo) throws PhotoException {
        PhotoFacts facts = photo.facts();
        return new Object[] {facts.width(), facts.height(), facts.orientation(),
            known(facts.wallClockSeconds()), known(facts.utcSeconds()),
            photo.greenCdf().toBytes()};
    }

    private static Double known(OptionalDouble seconds) {
        return seconds.isPresent() ? seconds.getAsDouble() : null;
    }
}
