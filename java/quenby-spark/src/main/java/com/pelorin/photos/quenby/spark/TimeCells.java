package com.pelorin.photos.quenby.spark;

import static org.apache.spark.sql.functions.broadcast;

import java.util.ArrayList;
import java.util.List;
import org.apache.spark.sql.Dataset;
import org.apache.spark.sql.Row;

/**
 * Photos laid out so that every two that may be near-duplicates meet in exactly one cell, which one
 * task holds. Time is cut into stretches of which each is longer than near-duplicates can be apart;
 * the photos near a stretch's end are guests of the next one. A stretch that is crowded is parted
 * further: each of its photos has one of n lots, and every two lots meet in a cell of their own.
 *
 * <p>There are two clocks: photos of which both have a zone meet by UTC, others by the clock on the
 * wall.
 */
final class TimeCells {
    static final int UTC = 0;
    static final int WALL_CLOCK = 1;
    /** In the longest times apart: few photos are guests, and few cells are crowded. */
    private static final int STRETCH = 32;
    /** Photos of a lot; a cell has at most two lots. */
    static final int LOT = 4096;

    private TimeCells() {}

    /**
     * Lays photos out.
     *
     * @param shots   path, wall_clock, utc, orientation, green_cdf; every one has a wall_clock
     * @param longest seconds apart at which two photos are compared, not negative
     * @param utc     whether photos are to meet by UTC, since there are two with it
     * @param wall    whether they are to meet by the clock on the wall, since there is one without
     * @return the shots with moment, clock, stretch, low, high, lot, guest: those of lots low and
     *         high of a stretch share a cell (clock, stretch, low, high)
     */
    static Dataset<Row> of(Dataset<Row> shots, double longest, boolean utc, boolean wall) {
        return of(shots, longest, utc, wall, LOT);
    }

    static Dataset<Row> of(Dataset<Row> shots, double longest, boolean utc, boolean wall, int lot) {
        List<String> clocks = new ArrayList<>();
        if (utc) {
            clocks.add("named_struct('clock', " + UTC + ", 'moment', utc)");
        }
        if (wall) {
            clocks.add("named_struct('clock', " + WALL_CLOCK + ", 'moment', wall_clock)");
        }
        // Seconds since 1970 are doubles of 2e-7: a millisecond is far above what rounding hides.
        double width = Math.max(1, STRETCH * longest);
        boolean isCut = width < 1e15;
        String own = isCut ? "CAST(floor(moment / " + width + "D) AS BIGINT)" : "0L";
        String next = isCut
                ? "CAST(floor((moment + " + (longest + 1e-3) + "D) / " + width + "D) AS BIGINT)"
                : "0L";
        Dataset<Row> members = shots
                .selectExpr("*", "explode(array(" + String.join(", ", clocks) + ")) AS time")
                .selectExpr("path", "wall_clock", "utc", "orientation", "green_cdf",
                        "time.clock AS clock", "time.moment AS moment")
                .where("moment IS NOT NULL")
                .selectExpr("*", "explode(sequence(" + own + ", " + next + ")) AS stretch")
                .selectExpr("*", "stretch > " + own + " AS guest");
        Dataset<Row> crowded = members.groupBy("clock", "stretch").count()
                .where("count > " + lot)
                .selectExpr("clock", "stretch", "CAST(ceil(count / " + lot + ") AS INT) AS lots");
        return members.join(broadcast(crowded), new String[] {"clock", "stretch"}, "left")
                .selectExpr("*",
                        "CAST(pmod(xxhash64(path), coalesce(lots, 1)) AS INT) AS lot",
                        "explode(sequence(0, coalesce(lots, 1) - 1)) AS other")
                .selectExpr("*", "least(lot, other) AS low", "greatest(lot, other) AS high")
                .drop("lots", "other");
    }
}
