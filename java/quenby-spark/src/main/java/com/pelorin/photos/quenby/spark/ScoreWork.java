package com.pelorin.photos.quenby.spark;

import com.pelorin.photos.quenby.autoenhance.PhotoBytes;
import java.io.IOException;
import org.apache.spark.sql.types.DataTypes;
import org.apache.spark.sql.types.StructType;

/** How natural a photo looks. */
final class ScoreWork implements PhotoWork {
    private static final long serialVersionUID = 1;

    @Override
    public String parameters() {
        return "niqe";
    }

    @Override
    public StructType columns() {
        return new StructType().add("niqe", DataTypes.FloatType);
    }

    @Override
    public Object[] run(PhotoBytes photo, Output output) throws IOException {
        return new Object[] {photo.niqe()};
    }
}
