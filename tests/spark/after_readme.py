
# What the README's lines made is looked at here, by the test.
import os
import sys

from pyspark.sql import DataFrame

scratch, count = sys.argv[1], int(sys.argv[2])
assert better.count() == count + 1, better.count()  # binaryFile drops the empty file
assert better.where("photo.error IS NOT NULL").count() == 1
for row in better.where("photo.error IS NULL").limit(20).collect():
    name = row.path.split("/photos/", 1)[1]
    with open(os.path.join(scratch, "expected", name), "rb") as expected:
        assert expected.read() == bytes(row.photo.result), name

manifest = spark.read.parquet(os.path.join(scratch, "out", "_manifest"))
assert manifest.select("input").distinct().count() == count + 2
assert manifest.where("status = 'done'").count() == count  # each once, of two runs together
failed = {row.input.rsplit("/", 1)[1]: row.error for row in manifest.where("error IS NOT NULL").collect()}
assert failed.keys() == {"cut.jpg", "empty.jpg"}, failed

# Spark's own functions and those of Quenby in one query, and a search from Python.
spark.sql("SELECT quenby_score(NULL) AS none").collect()
sample = photos.where("path LIKE '%/b/%'")
found = spark._jvm.com.pelorin.photos.quenby.spark.NearDuplicates.of(sample._jdf, 1.5)
groups = DataFrame(found.groups(), spark)
assert groups.count() > 0 and groups.where("size(photos) < 2").count() == 0
found.close()
spark.stop()
