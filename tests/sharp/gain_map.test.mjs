// Gain maps as a reader sees them that shares no code with Quenby.
import assert from 'node:assert/strict'
import { execFileSync } from 'node:child_process'
import { mkdtempSync, readFileSync, writeFileSync } from 'node:fs'
import { tmpdir } from 'node:os'
import { join } from 'node:path'
import { test } from 'node:test'
import sharp from 'sharp'
import { hdrgmOf, ultraHdr } from './ultra_hdr.mjs'

const quenby = process.env.QUENBY
const folder = mkdtempSync(join(tmpdir(), 'quenby-sharp-'))

async function enhanced(orientation, ...options) {
  const made = await ultraHdr(orientation)
  const photo = join(folder, `${orientation}.jpg`), result = join(folder, 'result.jpg')
  writeFileSync(photo, made.file)
  execFileSync(quenby, ['enhance', photo, '-o', result, '--overwrite', '-q', ...options])
  return { map: made.map, seen: await sharp(readFileSync(result)).metadata() } // by name it would be remembered
}

test('sharp sees the map of the photo itself', async () => {
  const { file, map } = await ultraHdr(1)
  const seen = await sharp(file).metadata()
  assert.ok(seen.gainMap?.image.equals(map))
  assert.equal(hdrgmOf(map).length, 9)
})

test('an upright photo keeps its map byte for byte', async () => {
  const { map, seen } = await enhanced(1)
  assert.ok(seen.gainMap?.image.equals(map))
})

for (const orientation of [2, 3, 4, 5, 6, 7, 8]) {
  test(`orientation ${orientation}: the map is turned, its numbers stay`, async () => {
    const { map, seen } = await enhanced(orientation)
    assert.deepEqual(hdrgmOf(seen.gainMap.image), hdrgmOf(map))
    const turned = await sharp(seen.gainMap.image).metadata()
    const sides = orientation < 5 ? [640, 384, 160, 96] : [384, 640, 96, 160]
    assert.deepEqual([seen.width, seen.height, turned.width, turned.height], sides)
  })
}

test('a smaller photo has a smaller map with the same numbers', async () => {
  const { map, seen } = await enhanced(1, '--scale', '2')
  assert.deepEqual(hdrgmOf(seen.gainMap.image), hdrgmOf(map))
  const smaller = await sharp(seen.gainMap.image).metadata()
  assert.deepEqual([seen.width, smaller.width], [320, 80])
})

test('a map that is dropped is gone for readers', async () => {
  const { seen } = await enhanced(6, '--gain-map', 'drop')
  assert.equal(seen.gainMap, undefined)
})
