package com.pelorin.photos.quenby.spark;

import com.pelorin.photos.quenby.autoenhance.PhotoBytes;
import java.io.IOException;
import java.io.Serializable;
import org.apache.spark.sql.types.StructType;

/** What a job does with each photo. */
interface PhotoWork extends Serializable {
    /** Told in the manifest; a photo that is done with other parameters is not done. */
    String parameters();

    /** Whether there is a file for each photo. */
    default boolean writesFiles() {
        return false;
    }

    /** The columns that the manifest has beside those of every job. */
    StructType columns();

    /** Where the file that is made of a photo goes. */
    interface Output {
        void write(byte[] file) throws IOException;
    }

    /**
     * Does it.
     *
     * @param photo within the limits of the job
     * @return values of the columns
     */
    Object[] run(PhotoBytes photo, Output output) throws IOException;
}
