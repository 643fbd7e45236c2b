package com.pelorin.photos.quenby.spark;

import com.pelorin.photos.quenby.autoenhance.Duplicates;
import com.pelorin.photos.quenby.autoenhance.GreenCdf;
import java.util.ArrayDeque;
import java.util.Iterator;
import java.util.NoSuchElementException;
import org.apache.spark.api.java.function.MapPartitionsFunction;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.RowFactory;
import org.apache.spark.sql.types.DataTypes;
import org.apache.spark.sql.types.StructType;

/**
 * The pairs of near-duplicates in the cells of {@link TimeCells}. Goes over each cell in the order
 * of time and keeps the photos that are not yet too long ago, so that memory is that of a moment.
 */
final class PairSweep implements MapPartitionsFunction<Row, Row> {
    private static final long serialVersionUID = 1;

    static final StructType PAIR = new StructType()
            .add("first", DataTypes.StringType, false)
            .add("second", DataTypes.StringType, false)
            .add("score", DataTypes.FloatType, false)
            .add("distance", DataTypes.FloatType, false)
            .add("seconds", DataTypes.DoubleType, false)
            .add("same_orientation", DataTypes.BooleanType, false);
    /** What a row has to have, in this order. */
    static final String[] COLUMNS = {"clock", "stretch", "low", "high", "moment", "lot", "guest",
        "path", "wall_clock", "utc", "orientation", "green_cdf"};

    private final float threshold;
    private final double longestSame;
    private final double longestDifferent;

    PairSweep(float threshold, double longestSame, double longestDifferent) {
        this.threshold = threshold;
        this.longestSame = longestSame;
        this.longestDifferent = longestDifferent;
    }

    @Override
    public Iterator<Row> call(Iterator<Row> members) {
        return new Pairs(members);
    }

    private static final class Member {
        final int clock;
        final long stretch;
        final int low;
        final int high;
        final double moment;
        final int lot;
        final boolean guest;
        final Shot shot;

        Member(Row row) {
            clock = row.getInt(0);
            stretch = row.getLong(1);
            low = row.getInt(2);
            high = row.getInt(3);
            moment = row.getDouble(4);
            lot = row.getInt(5);
            guest = row.getBoolean(6);
            shot = new Shot(row.getString(7), row.getDouble(8),
                    row.isNullAt(9) ? Double.NaN : row.getDouble(9), row.getInt(10),
                    GreenCdf.fromBytes((byte[]) row.get(11)));
        }

        boolean sharesCell(Member other) {
            return clock == other.clock && stretch == other.stretch && low == other.low
                    && high == other.high;
        }

        /** Whether this is where the two are compared, and not another cell or clock. */
        boolean meets(Member other) {
            return !(guest && other.guest)
                    && (low == high || lot != other.lot)
                    && (clock == TimeCells.UTC || !(shot.hasUtc() && other.shot.hasUtc()));
        }
    }

    private final class Pairs implements Iterator<Row> {
        private final Iterator<Row> members;
        private final ArrayDeque<Member> before = new ArrayDeque<>();
        private final ArrayDeque<Row> found = new ArrayDeque<>();
        private final double longest = Math.max(longestSame, longestDifferent);

        Pairs(Iterator<Row> members) {
            this.members = members;
        }

        @Override
        public boolean hasNext() {
            while (found.isEmpty() && members.hasNext()) {
                compare(new Member(members.next()));
            }
            return !found.isEmpty();
        }

        @Override
        public Row next() {
            if (!hasNext()) {
                throw new NoSuchElementException();
            }
            return found.remove();
        }

        private void compare(Member member) {
            if (!before.isEmpty() && !before.getLast().sharesCell(member)) {
                before.clear();
            }
            while (!before.isEmpty() && member.moment - before.getFirst().moment > longest) {
                before.removeFirst();
            }
            for (Member other : before) {
                if (member.meets(other)) {
                    compare(other.shot, member.shot);
                }
            }
            before.addLast(member);
        }

        private void compare(Shot a, Shot b) {
            boolean same = a.orientation == b.orientation;
            double seconds = a.secondsTo(b);
            if (!(seconds <= (same ? longestSame : longestDifferent))) {
                return;
            }
            boolean inOrder = a.compareTo(b) < 0; // the distance may tell one from the other
            Shot first = inOrder ? a : b;
            Shot second = inOrder ? b : a;
            float distance = first.cdf.distanceTo(second.cdf);
            float score = Duplicates.score(distance, seconds, same);
            if (score >= threshold) {
                found.add(RowFactory.create(
                        first.path, second.path, score, distance, seconds, same));
            }
        }
    }
}
