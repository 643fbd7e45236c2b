package com.pelorin.photos.quenby.spark;

import java.io.IOException;
import org.apache.spark.TaskContext;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.RowFactory;
import org.apache.spark.sql.types.DataType;
import org.apache.spark.sql.types.DataTypes;
import org.apache.spark.sql.types.StructType;

/** A struct of what came of a photo and why nothing did. */
final class Outcome {
    /** What may fail for one photo and not for the next. */
    interface Work<T> {
        T run() throws IOException;
    }

    private Outcome() {}

    static StructType type(DataType result) {
        return new StructType().add("result", result).add("error", DataTypes.StringType);
    }

    /** Exhausted memory is no photo's failure: Spark tries the task elsewhere. */
    static Row of(Work<?> work) {
        try {
            return RowFactory.create(work.run(), null);
        } catch (IOException | RuntimeException error) {
            return RowFactory.create(null, reason(error));
        }
    }

    /** A clause for users. Throws what was thrown because the task is being killed. */
    static String reason(Exception error) {
        TaskContext task = TaskContext.get();
        if (task != null && task.isInterrupted()) {
            throw error instanceof RuntimeException ? (RuntimeException) error
                    : new IllegalStateException(error);
        }
        String message = error.getMessage();
        return message == null || message.isEmpty() ? error.getClass().getSimpleName() : message;
    }
}
