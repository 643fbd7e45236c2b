package com.pelorin.photos.quenby.spark;

import java.util.ArrayList;
import java.util.Arrays;
import java.util.Collections;
import java.util.Comparator;
import java.util.HashMap;
import java.util.Iterator;
import java.util.List;
import java.util.Map;
import java.util.NoSuchElementException;
import org.apache.spark.api.java.function.MapPartitionsFunction;
import org.apache.spark.sql.Row;
import org.apache.spark.sql.RowFactory;
import org.apache.spark.sql.types.DataTypes;
import org.apache.spark.sql.types.StructType;

/**
 * The groups of photos of which every two are a pair, by the command's rule: the pairs with the
 * highest scores come together first, and two groups are joined only whole. Takes pairs sorted by
 * what hangs together.
 */
final class WholeGroups implements MapPartitionsFunction<Row, Row> {
    private static final long serialVersionUID = 1;

    static final StructType GROUP = new StructType()
            .add("photos", DataTypes.createArrayType(DataTypes.StringType, false), false)
            .add("lowest_score", DataTypes.FloatType, false)
            .add("highest_score", DataTypes.FloatType, false)
            .add("seconds", DataTypes.DoubleType, false);
    /** What a row has to have, in this order. */
    static final String[] COLUMNS = {"root", "first", "second", "score", "seconds"};

    /** A pair of photos, by their places among those that hang together. */
    static final class Pair {
        final int first;
        final int second;
        final float score;
        final double seconds;

        Pair(int first, int second, float score, double seconds) {
            this.first = first;
            this.second = second;
            this.score = score;
            this.seconds = seconds;
        }
    }

    @Override
    public Iterator<Row> call(Iterator<Row> pairs) {
        return new Groups(pairs);
    }

    private static final class Groups implements Iterator<Row> {
        private final Iterator<Row> pairs;
        private Row ahead;
        private Iterator<Row> groups = Collections.emptyIterator();

        Groups(Iterator<Row> pairs) {
            this.pairs = pairs;
            ahead = pairs.hasNext() ? pairs.next() : null;
        }

        @Override
        public boolean hasNext() {
            while (!groups.hasNext() && ahead != null) {
                List<Row> linked = new ArrayList<>();
                long root = ahead.getLong(0);
                while (ahead != null && ahead.getLong(0) == root) {
                    linked.add(ahead);
                    ahead = pairs.hasNext() ? pairs.next() : null;
                }
                groups = groupsOf(linked).iterator();
            }
            return groups.hasNext();
        }

        @Override
        public Row next() {
            if (!hasNext()) {
                throw new NoSuchElementException();
            }
            return groups.next();
        }
    }

    private static List<Row> groupsOf(List<Row> rows) {
        String[] paths = rows.stream().flatMap(row -> List.of(row.getString(1), row.getString(2))
                .stream()).distinct().sorted(PathOrder::compare).toArray(String[]::new);
        Map<String, Integer> places = new HashMap<>();
        for (String path : paths) {
            places.put(path, places.size());
        }
        List<Pair> pairs = new ArrayList<>(rows.size());
        for (Row row : rows) {
            pairs.add(new Pair(places.get(row.getString(1)), places.get(row.getString(2)),
                    row.getFloat(3), row.getDouble(4)));
        }
        int[] groupOf = group(paths.length, pairs);
        Map<Integer, List<String>> members = new HashMap<>();
        for (int photo = 0; photo < paths.length; ++photo) {
            members.computeIfAbsent(groupOf[photo], first -> new ArrayList<>()).add(paths[photo]);
        }
        Map<Integer, Object[]> groups = new HashMap<>();
        for (Pair pair : pairs) {
            int group = groupOf[pair.first];
            if (group != groupOf[pair.second]) {
                continue;
            }
            Object[] row = groups.computeIfAbsent(group, first -> new Object[] {
                members.get(first).toArray(new String[0]), pair.score, pair.score, pair.seconds});
            row[1] = Math.min((Float) row[1], pair.score);
            row[2] = Math.max((Float) row[2], pair.score);
            row[3] = Math.max((Double) row[3], pair.seconds);
        }
        List<Row> made = new ArrayList<>(groups.size());
        groups.values().forEach(row -> made.add(RowFactory.create(row)));
        return made;
    }

    /** The first photo of the group that each of the photos is in. */
    static int[] group(int photos, List<Pair> pairs) {
        int[][] partners = partners(photos, pairs);
        List<Pair> byScore = new ArrayList<>(pairs);
        byScore.sort(Comparator.<Pair>comparingDouble(pair -> -pair.score)
                .thenComparingInt(pair -> pair.first).thenComparingInt(pair -> pair.second));
        int[] groupOf = new int[photos];
        int[][] members = new int[photos][];
        for (int photo = 0; photo < photos; ++photo) {
            groupOf[photo] = photo;
            members[photo] = new int[] {photo};
        }
        for (Pair pair : byScore) {
            int first = Math.min(groupOf[pair.first], groupOf[pair.second]);
            int second = Math.max(groupOf[pair.first], groupOf[pair.second]);
            if (first == second || !isWhole(partners, members[first], members[second])) {
                continue;
            }
            for (int photo : members[second]) {
                groupOf[photo] = first;
            }
            int[] joined = Arrays.copyOf(members[first],
                    members[first].length + members[second].length);
            System.arraycopy(members[second], 0, joined, members[first].length,
                    members[second].length);
            Arrays.sort(joined);
            members[first] = joined;
            members[second] = null;
        }
        return groupOf;
    }

    /** Of each photo, ascending. */
    private static int[][] partners(int photos, List<Pair> pairs) {
        int[] counts = new int[photos];
        for (Pair pair : pairs) {
            ++counts[pair.first];
            ++counts[pair.second];
        }
        int[][] partners = new int[photos][];
        for (int photo = 0; photo < photos; ++photo) {
            partners[photo] = new int[counts[photo]];
        }
        for (Pair pair : pairs) {
            partners[pair.first][--counts[pair.first]] = pair.second;
            partners[pair.second][--counts[pair.second]] = pair.first;
        }
        for (int[] each : partners) {
            Arrays.sort(each);
        }
        return partners;
    }

    private static boolean isWhole(int[][] partners, int[] a, int[] b) {
        for (int photo : a) {
            if (!includes(partners[photo], b)) {
                return false;
            }
        }
        return true;
    }

    /** Both ascending. */
    private static boolean includes(int[] all, int[] some) {
        int place = 0;
        for (int each : some) {
            while (place < all.length && all[place] < each) {
                ++place;
            }
            if (place == all.length || all[place] != each) {
                return false;
            }
        }
        return true;
    }
}
