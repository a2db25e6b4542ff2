-- What the consumer fills. A reading is known by vehicle, spool and number, and never by its time: whatever comes a second
-- time is the same row.
CREATE TABLE reading (
    vehicle text NOT NULL,
    spool   text NOT NULL,
    seq     bigint NOT NULL,
    time    timestamptz NOT NULL,
    clock   boolean NOT NULL, -- false: the car's clock was wrong
    module  text NOT NULL,
    sensor  text NOT NULL,
    value   double precision,
    text    text,
    unit    text NOT NULL,
    PRIMARY KEY (vehicle, spool, seq)
);
CREATE INDEX ON reading (vehicle, sensor, time);

CREATE TABLE event (
    vehicle text NOT NULL,
    spool   text NOT NULL,
    seq     bigint NOT NULL,
    content jsonb NOT NULL,
    PRIMARY KEY (vehicle, spool, seq)
);

-- Up to which number all is stored, of each car and each of its spools.
CREATE TABLE mark (
    vehicle text NOT NULL,
    spool   text NOT NULL,
    seq     bigint NOT NULL,
    PRIMARY KEY (vehicle, spool)
);
