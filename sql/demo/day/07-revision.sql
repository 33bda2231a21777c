-- The estimator adds what the assessor asked for.
INSERT INTO QUOTE2 (QTNNO, Subquote, category, script, unitcost, PartNo, VENDOR, Tag, tosend, itemno) VALUES
    ('1029', 0, 'MIS', 'Four wheel alignment', 0, 'WHAL', 4, 1, 'A', '991');
